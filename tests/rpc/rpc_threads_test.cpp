// Eight threads sending management requests at once to a tunnel that has
// served none yet: every request must find its method (no "Procedure not
// found" while the table is being built) and get its answer. Run under
// ThreadSanitizer (-DTVRN_TSAN=ON) this also shows that the first requests do
// not race with the building of the table. A program of its own, so that
// nothing before it has used either tunnel: the dispatcher linked in here,
// which the threads reach directly, and the module's, which they reach
// through the embedded host (where the provider's lock orders them).
#include <gtest/gtest.h>
#include <json/json.h>

#include <atomic>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "gateway/CIMProviderTfaj.h"
#include "rpc/JsonRpcManager.h"
#include "tests/rpc/Agent_Service.h"

using namespace tvrne2e;

namespace {

const char* const kRequests[] = {
    R"({"id": 1, "method": "discovery.getHbaByWwn", "params": ["20:00:00:05:1e:0a:0b:0c"]})",
    R"({"id": 2, "method": "discovery.getPortStatistics", "params": ["10:00:00:05:1e:0a:0b:0c"]})",
    R"({"id": 3, "method": "discovery.getAllHbasByHost", "params": []})",
    R"({"id": 4, "method": "diagnostics.getRequestID"})",
};

// Runs `send` (a request text to its response text) on eight threads that
// start together; the first response that is not a result, or "".
std::string sendFromEightThreads(const std::function<std::string(const std::string&)>& send) {
    const int kThreads = 8, kRounds = 25;
    std::atomic<int> ready{0}, failures{0};
    std::vector<std::string> failed(kThreads);
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t) {
        threads.emplace_back([&, t] {
            ++ready;
            while (ready.load() < kThreads) {
            }
            for (int i = 0; i < kRounds; ++i) {
                const std::string request = kRequests[(t + i) % 4], response = send(request);
                Json::Value answer;
                const bool good = Json::Reader().parse(response, answer) &&
                                  answer.isMember("result") && !answer.isMember("error");
                if (!good && failures++ == 0)
                    failed[t] = request + " -> " + response;
            }
        });
    }
    std::string first;
    for (int t = 0; t < kThreads; ++t) {
        threads[t].join();
        first += failed[t];
    }
    return first;
}

TEST(ExecuteMethodThreads, TheDispatcherFromCold) {
    Module_Session::open("default", "ERR");  // the simulator, for this dispatcher too
    CPTA::setupDLLEntryPoints();
    EXPECT_EQ("", sendFromEightThreads([](const std::string& request) {
                  CPTA::JsonRpcManager::response r;
                  CPTA::JsonRpcManager::instance()->process(request, r);
                  return r.body;
              }));
}

TEST(ExecuteMethodThreads, TheModuleFromCold) {
    Module_Session& s = Module_Session::open("default", "ERR");
    ASSERT_TRUE(s.loaded());
    const tvrnhost::ObjectPath agent = agentService(s);
    EXPECT_EQ("", sendFromEightThreads([&](const std::string& request) {
                  return responseOf(executeMethod(s, agent, &request));
              }));
}

}  // namespace
