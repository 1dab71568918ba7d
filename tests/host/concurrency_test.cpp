// Several threads issuing requests at once, including re-entrant up-calls
// and instance creation; run under ThreadSanitizer with -DTVRN_TSAN=ON.
#include <atomic>
#include <thread>

#include "tests/host/host_fixture.h"

namespace hosttest {
namespace {

using Concurrency = HostFixture;

TEST_F(Concurrency, ParallelRequestsAllSucceed) {
    constexpr int kThreads = 4, kRounds = 40;
    std::atomic<int> failures{0};
    auto check = [&](const Status& st) {
        if (!st.ok()) {
            ++failures;
            ADD_FAILURE() << st.toString();
        }
    };
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t) {
        threads.emplace_back([&, t] {
            const ObjectPath w1 = path("Test_Widget.Id=\"w1\"");
            for (int i = 0; i < kRounds; ++i) {
                auto e = host->enumerateInstances(kNs, "Test_Widget");
                check(e);
                check(host->getInstance(w1));
                auto a = host->associators(w1);  // re-enters the gadget provider
                check(a);
                if (a.items.size() != 2)
                    ++failures;
                auto m = host->invokeMethod(w1, "CountGadgets");
                check(m);
                if (m.returnValue != Value::uint32(2))
                    ++failures;
                check(host->invokeMethod(w1, "ReadManager"));
                Instance w(path("Test_Widget.Id=\"t" + std::to_string(t) + "\""));
                w.set("Count", Value::uint32(static_cast<std::uint32_t>(i)));
                check(host->createInstance(w));
                check(host->deleteInstance(w.path()));
            }
        });
    }
    for (auto& th : threads)
        th.join();
    EXPECT_EQ(failures.load(), 0);
    auto left = host->enumerateInstanceNames(kNs, "Test_Widget");
    EXPECT_EQ(left.items.size(), 3u);
}

}  // namespace
}  // namespace hosttest
