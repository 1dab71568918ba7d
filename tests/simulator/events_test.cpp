// Event delivery: on the simulator's own thread, only while a client is
// registered, and stopped cleanly.
#include "tests/simulator/SimTestSupport.h"

#include <atomic>
#include <mutex>
#include <thread>
#include <vector>

using namespace simtest;

namespace {

std::mutex gMu;
std::vector<std::string> gTexts;
std::vector<std::thread::id> gThreads;

void collect(const char* text) {
    std::lock_guard<std::mutex> lock(gMu);
    gTexts.push_back(text);
    gThreads.push_back(std::this_thread::get_id());
}

std::vector<std::string> texts() {
    std::lock_guard<std::mutex> lock(gMu);
    return gTexts;
}

class Events : public SimTest {
protected:
    void SetUp() override {
        SimTest::SetUp();
        std::lock_guard<std::mutex> lock(gMu);
        gTexts.clear();
        gThreads.clear();
    }
    void TearDown() override {
        registerEventProcessingCb(nullptr);
        unregister_for_events(J("{}"));
    }
    static void subscribe() {
        ASSERT_FALSE(isError(register_for_events(J(R"({"dropOldEvents": true})"))));
        registerEventProcessingCb(collect);
    }
};

TEST_F(Events, DeliveredOnTheLibrarysThreadWhileRegistered) {
    EXPECT_EQ(0,
              tvrn_sim_emit_event(R"({"eventCategory": 2, "eventId": 1})"));  // nobody registered
    subscribe();
    EXPECT_EQ(1, tvrn_sim_emit_event(R"({"eventId": 1, "portIndexString": "100000051e0a0b0c"})"));
    EXPECT_EQ(1, tvrn_sim_emit_event("not json at all"));
    EXPECT_EQ(-1, tvrn_sim_emit_event(nullptr));
    ASSERT_EQ(0, tvrn_sim_wait_events(5000));
    EXPECT_EQ((std::vector<std::string>{R"({"eventId": 1, "portIndexString": "100000051e0a0b0c"})",
                                        "not json at all"}),
              texts());
    {
        std::lock_guard<std::mutex> lock(gMu);
        EXPECT_NE(std::this_thread::get_id(), gThreads[0]);
        EXPECT_EQ(gThreads[0], gThreads[1]);
    }
    // After unregistering nothing more arrives.
    registerEventProcessingCb(nullptr);
    unregister_for_events(J("{}"));
    EXPECT_EQ(0, tvrn_sim_emit_event("late"));
}

TEST_F(Events, QueuedUntilACallbackIsSetAndDroppedOnRequest) {
    ASSERT_FALSE(isError(register_for_events(J(R"({"dropOldEvents": false})"))));
    tvrn_sim_emit_event("first");
    EXPECT_EQ(-1, tvrn_sim_wait_events(50));  // no callback yet
    registerEventProcessingCb(collect);
    ASSERT_EQ(0, tvrn_sim_wait_events(5000));
    EXPECT_EQ(std::vector<std::string>{"first"}, texts());
    // With the callback cleared events wait; a new registration that drops old
    // events discards them.
    registerEventProcessingCb(nullptr);
    tvrn_sim_emit_event("stale");
    register_for_events(J(R"({"dropOldEvents": true})"));
    registerEventProcessingCb(collect);
    tvrn_sim_emit_event("fresh");
    ASSERT_EQ(0, tvrn_sim_wait_events(5000));
    EXPECT_EQ((std::vector<std::string>{"first", "fresh"}), texts());
}

// Comments of the fixture stay out of the event texts.
TEST_F(Events, FixtureEventsFollowRegistration) {
    ASSERT_EQ(0, tvrn_sim_load_fixture_text(R"({"events": [
                     // an Ethernet event
                     {"eventId": 3, "portIndexString": "00051e8a4b01"}, "raw text"]})"));
    registerEventProcessingCb(collect);
    const unsigned long long before = tvrn_sim_events_delivered();
    subscribe();
    ASSERT_EQ(0, tvrn_sim_wait_events(5000));
    EXPECT_EQ(
        (std::vector<std::string>{R"({"eventId":3,"portIndexString":"00051e8a4b01"})", "raw text"}),
        texts());
    EXPECT_EQ(before + 2, tvrn_sim_events_delivered());
}

// Once registerEventProcessingCb(nullptr) returns no callback is running, so
// the client may tear down what its callback uses.
std::atomic<bool> gInCallback{false};
std::atomic<bool> gTornDown{false};
std::atomic<int> gLate{0};

void slowCallback(const char*) {
    gInCallback = true;
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    if (gTornDown)
        ++gLate;
    gInCallback = false;
}

TEST_F(Events, ClearingTheCallbackWaitsForADeliveryInProgress) {
    gTornDown = false;
    gLate = 0;
    register_for_events(J("{}"));
    registerEventProcessingCb(slowCallback);
    tvrn_sim_emit_event("one");
    while (!gInCallback)
        std::this_thread::yield();
    registerEventProcessingCb(nullptr);
    gTornDown = true;
    EXPECT_FALSE(gInCallback);
    unregister_for_events(J("{}"));
    EXPECT_EQ(0, gLate.load());
}

// A callback may call back into the library, even to unregister.
void reentrantCallback(const char* text) {
    collect(text);
    getNumberOfAdapters();
    if (std::string(text) == "stop")
        unregister_for_events(J("{}"));
}

TEST_F(Events, CallbackMayCallTheLibrary) {
    register_for_events(J("{}"));
    registerEventProcessingCb(reentrantCallback);
    tvrn_sim_emit_event("go");
    tvrn_sim_emit_event("stop");
    tvrn_sim_wait_events(5000);
    EXPECT_EQ((std::vector<std::string>{"go", "stop"}), texts());
    EXPECT_EQ(0, tvrn_sim_emit_event("after"));
    subscribe();  // again, after unregistering from inside
    tvrn_sim_emit_event("again");
    ASSERT_EQ(0, tvrn_sim_wait_events(5000));
    EXPECT_EQ("again", texts().back());
}

// Requests on many threads while events flow and registrations change.
TEST_F(Events, ConcurrentUse) {
    std::atomic<bool> stop{false};
    std::vector<std::thread> workers;
    for (int t = 0; t < 4; ++t)
        workers.emplace_back([t, &stop] {
            const Json::Value port =
                J(std::string("{\"indexStr\": \"") + kFcPort0 + "\", \"port\": {\"beaconState\": " +
                  (t % 2 ? "true" : "false") + "}, \"propArray\": [\"beaconState\"]}");
            while (!stop) {
                getAllAdaptersIndexString(Json::Value());
                setPortByWwn(port);
                getDynamicPortStatistics(J(std::string("{\"indexStr\": \"") + kFcPort0 + "\"}"));
                tvrn_sim_emit_event("event");
            }
        });
    for (int round = 0; round < 20; ++round) {
        subscribe();
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
        registerEventProcessingCb(nullptr);
        unregister_for_events(J("{}"));
    }
    stop = true;
    for (auto& w : workers)
        w.join();
    subscribe();
    tvrn_sim_emit_event("final");
    ASSERT_EQ(0, tvrn_sim_wait_events(5000));
    EXPECT_EQ("final", texts().back());
}

}  // namespace
