// Eight threads sending a bounded number of mixed requests at once to the
// real module through the embedded host (tests/e2e/Request_Mix.h), in rounds;
// between rounds the server drops every provider (terminating cleanup, the
// module stays loaded) or unloads the whole module, and the next round loads
// them again. Every answer must be sound. A round that does not end in time
// (a deadlock, or a request that never returns) ends the program with what
// each thread was doing. Run under ThreadSanitizer (-DTVRN_TSAN=ON) it shows
// no race and no lock-order inversion, under -DTVRN_SANITIZE=ON no leak.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "tests/e2e/Module_Session.h"
#include "tests/e2e/Request_Mix.h"

using namespace tvrne2e;

namespace {

constexpr int kThreads = 8;
constexpr int kRounds = 4;
constexpr std::size_t kRequestsPerRound = 240;
// Generous: a round takes well under a second in a normal build and a few
// seconds under ThreadSanitizer.
constexpr auto kRoundLimit = std::chrono::minutes(3);

// One round: the threads take request numbers [first, first + count) in turn.
class Round {
public:
    Round(Request_Mix& mix, std::size_t first, std::size_t count)
        : _mix(mix), _next(first), _end(first + count) {}

    // The problems found, or ends the program when the round does not end
    // within kRoundLimit.
    std::vector<std::string> run(int round) {
        std::vector<std::thread> threads;
        for (int t = 0; t < kThreads; t++)
            threads.emplace_back([this, t] { work(t); });
        {
            std::unique_lock<std::mutex> lock(_mutex);
            if (!_done.wait_for(lock, kRoundLimit, [this] { return _finished == kThreads; }))
                hung(round);
        }
        for (std::thread& t : threads)
            t.join();
        return _problems;
    }

private:
    void work(int t) {
        for (std::size_t n = _next++; n < _end; n = _next++) {
            _current[t] = long(n);
            std::string problem = _mix.run(n);
            if (!problem.empty()) {
                std::lock_guard<std::mutex> lock(_mutex);
                _problems.push_back(std::string(_mix.kindName(n)) + ": " + problem);
            }
        }
        _current[t] = -1;
        std::lock_guard<std::mutex> lock(_mutex);
        _finished++;
        _done.notify_all();
    }

    [[noreturn]] void hung(int round) {
        std::fprintf(stderr, "Stress: round %d has not ended within %d s (a deadlock?)\n", round,
                     int(std::chrono::seconds(kRoundLimit).count()));
        for (int t = 0; t < kThreads; t++) {
            const long n = _current[t];
            if (n >= 0)
                std::fprintf(stderr, "  thread %d is still in request %ld (%s)\n", t, n,
                             _mix.kindName(std::size_t(n)));
        }
        std::fflush(stderr);
        std::_Exit(3);
    }

    Request_Mix& _mix;
    std::atomic<std::size_t> _next;
    const std::size_t _end;
    std::atomic<long> _current[kThreads] = {};
    std::mutex _mutex;
    std::condition_variable _done;
    int _finished = 0;
    std::vector<std::string> _problems;
};

TEST(Stress, EightThreadsOfMixedRequestsWithUnloadsBetweenRounds) {
    Module_Session* session = &Module_Session::open("default", "WARN");
    ASSERT_TRUE(session->loaded());
    Request_Mix mix(*session);
    for (int round = 0; round < kRounds; round++) {
        SCOPED_TRACE("round " + std::to_string(round));
        const auto started = std::chrono::steady_clock::now();
        const std::vector<std::string> problems =
            Round(mix, round * kRequestsPerRound, kRequestsPerRound).run(round);
        EXPECT_EQ(problems.size(), 0u) << "first: " << problems.front();
        EXPECT_EQ(mix.takeIndications(), "");
        std::printf(
            "round %d: %zu requests in %.2f s\n", round, kRequestsPerRound,
            std::chrono::duration<double>(std::chrono::steady_clock::now() - started).count());
        // Unload: the providers only, or the module too; the next round loads
        // what it needs again.
        if (round % 2 == 0) {
            for (const tvrnhost::CleanupReport& c : session->host().cleanup(true))
                EXPECT_EQ(c.rc, 0) << c.provider << " " << c.kind;
        } else {
            Module_Session::close();
            session = &Module_Session::open("default", "WARN");
            ASSERT_TRUE(session->loaded());
        }
    }
}

}  // namespace
