// Event translation, the indication queue and the delivery thread, against
// the adapter-library simulator (which calls back on a thread of its own).
// What every known event becomes is in tests/golden/alerts.golden.
#include <gtest/gtest.h>

#include <pthread.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "alerts/EventTables.h"
#include "alerts/IndicationManager.h"
#include "framework/Log.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/ProviderInit.h"
#include "gateway/ProviderUtil.h"
#include "simulator/SimControl.h"
#include "tests/gateway/BoundSimulator.h"

using namespace CPTA;

namespace {

using Clock = std::chrono::steady_clock;

const char kPortEvent[] = R"({"eventCategory": 2, "eventId": 1, "eventSeverity": 4,)"
                          R"( "portIndexString": "100000051e0a0b0c", "eventMsg": "logged in"})";

// A handler as the CMPI binding makes it, recording what reaches the server.
class Receiver {
public:
    IndicationDelivery::Handler* handler() { return new IndicationDelivery::Handler(proc, this); }

    struct Delivered {
        long long sequence;
        std::string message, messageId;
    };

    std::vector<Delivered> delivered() {
        std::lock_guard<std::mutex> lock(_mutex);
        return _delivered;
    }
    bool waitFor(size_t count) {
        std::unique_lock<std::mutex> lock(_mutex);
        return _arrived.wait_for(lock, std::chrono::seconds(10),
                                 [&] { return _delivered.size() >= count; });
    }
    int ends() {
        std::lock_guard<std::mutex> lock(_mutex);
        return _ends;
    }
    // The next delivery waits until release().
    void hold() {
        std::lock_guard<std::mutex> lock(_mutex);
        _held = true;
    }
    void release() {
        std::lock_guard<std::mutex> lock(_mutex);
        _held = false;
        _arrived.notify_all();
    }

private:
    static bool proc(Instance* instance, void* data) {
        Receiver* self = static_cast<Receiver*>(data);
        std::unique_lock<std::mutex> lock(self->_mutex);
        if (!instance) {
            self->_ends++;
            return false;
        }
        const TAVRIN_AlertIndication* i = static_cast<TAVRIN_AlertIndication*>(instance);
        self->_delivered.push_back(
            {i->SequenceNumber.value, i->Message.value.c_str(), i->MessageID.value.c_str()});
        destroy(instance);
        self->_arrived.notify_all();
        self->_arrived.wait(lock, [self] { return !self->_held; });
        return true;
    }

    std::mutex _mutex;
    std::condition_variable _arrived;
    std::vector<Delivered> _delivered;
    int _ends = 0;
    bool _held = false;
};

std::string portEvent(const std::string& message) {
    return R"({"eventCategory": 2, "eventId": 1, "eventSeverity": 4, "eventMsg": ")" + message +
           R"("})";
}

class Alerts : public ::testing::Test {
protected:
    void SetUp() override {
        gwtest::boundSimulator();
        ProviderInit::driverStatus = 0;
        IndicationHelper::getIndicationHelperInstance()->queue().discard();
        gwtest::LogCapture::get().mark();
    }
    void TearDown() override {
        EXPECT_FALSE(delivery.running());
        EXPECT_EQ(IndicationHelper::getIndicationHelperInstance()->queue().size(), 0u);
    }

    static int logged(const char* level, const std::string& text) {
        return gwtest::LogCapture::get().count(level, text);
    }

    IndicationDelivery delivery;
};

// Every identifier a category translates has its texts in the event table.
TEST(EventTables, EveryTranslatedEventIsKnown) {
    size_t count = 0;
    const Event_Category* categories = eventCategories(count);
    for (size_t c = 0; c < count; c++)
        for (int id = 0; id < 32; id++)
            if ((categories[c].accepted >> id) & 1) {
                EXPECT_NE(eventDetails((categories[c].category << 16) | id), nullptr)
                    << categories[c].name << " " << id;
            }
    const Event_Details* events = allEventDetails(count);
    EXPECT_EQ(count, 52u);
    for (size_t e = 0; e < count; e++)
        EXPECT_EQ(eventDetails(events[e].code), &events[e]) << std::hex << events[e].code;
}

TEST(IndicationQueue, AFullQueueDropsTheOldestAndCountsThem) {
    IndicationQueue queue(3);
    for (int n = 0; n < 5; n++) {
        TAVRIN_AlertIndication* one = create<TAVRIN_AlertIndication>(true);
        queue.push(&one, 1);
    }
    std::vector<TAVRIN_AlertIndication*> taken;
    uint64 dropped = 0;
    const std::atomic<bool> open(true);
    ASSERT_TRUE(queue.takeAll(taken, std::chrono::milliseconds(0), open, dropped));
    EXPECT_EQ(dropped, 2u);
    ASSERT_EQ(taken.size(), 3u);
    for (size_t n = 0; n < taken.size(); n++) {
        EXPECT_EQ(taken[n]->SequenceNumber.value, sint64(n + 3));
        destroy(taken[n]);
    }
    EXPECT_EQ(queue.size(), 0u);
}

TEST_F(Alerts, MalformedTextsAreDroppedWithALogLine) {
    const char* const texts[] = {
        nullptr,
        "",
        "{\"eventCategory\": 2,",
        "[{\"eventCategory\": 2, \"eventId\": 1}]",
        "null",
        "\"text\"",
        "{\"eventId\": 1}",
        "{\"eventCategory\": 2}",
        "{\"eventCategory\": \"2\", \"eventId\": 1}",
        "{\"eventCategory\": 2, \"eventId\": 1.5}",
        "{\"eventCategory\": 2, \"eventId\": 4294967296}",
        "{\"eventCategory\": 2, \"eventId\": 1, \"eventSeverity\": \"4\"}",
        "{\"eventCategory\": 2, \"eventId\": 1, \"portIndexString\": 5}",
        "{\"eventCategory\": 2, \"eventId\": 1, \"eventMsg\": {}}",
    };
    IndicationHelper* helper = IndicationHelper::getIndicationHelperInstance();
    for (const char* text : texts) {
        SCOPED_TRACE(text ? text : "(null)");
        gwtest::LogCapture::get().mark();
        EXPECT_EQ(helper->processEvent(text), 0);
        EXPECT_EQ(logged("WARN", ""), 1) << gwtest::LogCapture::get().text();
    }
    EXPECT_EQ(helper->queue().size(), 0u);
    // A category with a huge identifier is refused, not shifted into a code.
    EXPECT_EQ(helper->processEvent("{\"eventCategory\": 2, \"eventId\": 2147483647}"), 0);
    EXPECT_EQ(helper->processEvent("{\"eventCategory\": 70000, \"eventId\": -1}"), 1);
    helper->queue().discard();
}

// Both forms read the event's severity; one outside 1 to 4 is unknown (0).
TEST_F(Alerts, ASeverityOutOfRangeIsWarnedAbout) {
    IndicationHelper* helper = IndicationHelper::getIndicationHelperInstance();
    EXPECT_EQ(helper->processEvent(R"({"eventCategory": 2, "eventId": 1, "eventSeverity": 7})"), 1);
    EXPECT_EQ(logged("WARN", "Received a un-expected severity value: 7"), 2);
    EXPECT_EQ(helper->queue().discard(), 2u);
}

TEST_F(Alerts, DeliveredInOrderWithConsecutiveSequenceNumbers) {
    Receiver receiver;
    ASSERT_EQ(delivery.enable(receiver.handler()), ENABLE_INDICATIONS_OK);
    EXPECT_EQ(tvrn_sim_emit_event(portEvent("first").c_str()), 1);
    EXPECT_EQ(tvrn_sim_emit_event(portEvent("second").c_str()), 1);
    ASSERT_TRUE(receiver.waitFor(4));
    const auto got = receiver.delivered();
    ASSERT_EQ(got.size(), 4u);
    for (size_t n = 0; n < got.size(); n++) {
        EXPECT_EQ(got[n].message, n < 2 ? "first" : "second");
        EXPECT_EQ(got[n].messageId, n % 2 == 0 ? "TVRN131073" : "PROPTVRN131073");
        EXPECT_EQ(got[n].sequence, got[0].sequence + static_cast<long long>(n));
    }
    EXPECT_EQ(delivery.disable(), DISABLE_INDICATIONS_OK);
    EXPECT_EQ(receiver.ends(), 1);
    // Withdrawn: the library has no one to call.
    EXPECT_EQ(tvrn_sim_emit_event(kPortEvent), 0);
}

TEST_F(Alerts, ASecondEnableKeepsTheRunningDelivery) {
    Receiver first, second;
    tvrn_sim_reset_counters();
    ASSERT_EQ(delivery.enable(first.handler()), ENABLE_INDICATIONS_OK);
    ASSERT_EQ(delivery.enable(second.handler()), ENABLE_INDICATIONS_OK);
    EXPECT_EQ(tvrn_sim_call_count("register_for_events"), 1u);
    tvrn_sim_emit_event(kPortEvent);
    ASSERT_TRUE(first.waitFor(2));
    EXPECT_EQ(delivery.disable(), DISABLE_INDICATIONS_OK);
    EXPECT_TRUE(second.delivered().empty());
    EXPECT_EQ(first.ends(), 1);
    EXPECT_EQ(second.ends(), 0);
}

TEST_F(Alerts, DisableWithoutEnableAsksTheLibraryNothing) {
    tvrn_sim_reset_counters();
    EXPECT_EQ(delivery.disable(), DISABLE_INDICATIONS_OK);
    EXPECT_EQ(tvrn_sim_total_calls(), 0u);
    EXPECT_EQ(logged("INFO", "No subscription for event notifications happened or successful"), 1);
}

TEST_F(Alerts, AMissingDriverRefusesWithoutAskingTheLibrary) {
    for (int status : {2, 3}) {
        ProviderInit::driverStatus = status;
        tvrn_sim_reset_counters();
        Receiver receiver;
        IndicationDelivery::Handler* handler = receiver.handler();
        EXPECT_EQ(delivery.enable(handler), ENABLE_INDICATIONS_FAILED);
        delete handler;  // still the caller's
        EXPECT_FALSE(delivery.running());
        EXPECT_EQ(tvrn_sim_total_calls(), 0u);
    }
    EXPECT_EQ(logged("ERR",
                     "Driver is not installed or there is a tfal mismatch. Will not invoke "
                     "subscription. "),
              2);
}

TEST_F(Alerts, AFailedThreadStartUnsubscribes) {
    // The library's event thread runs already (another client registered).
    Json::Value drop(Json::objectValue);
    drop["dropOldEvents"] = true;
    ASSERT_TRUE(ProviderUtil::isValidJsonResponse(libRegisterForEvents(drop)));
    // Threads that ask for more stack than the address space holds cannot start.
    pthread_attr_t defaults, huge;
    ASSERT_EQ(pthread_getattr_default_np(&defaults), 0);
    pthread_attr_init(&huge);
    pthread_attr_setstacksize(&huge, size_t(1) << 46);
    ASSERT_EQ(pthread_setattr_default_np(&huge), 0);
    tvrn_sim_reset_counters();
    Receiver receiver;
    IndicationDelivery::Handler* handler = receiver.handler();
    const Enable_Indications_Status status = delivery.enable(handler);
    pthread_setattr_default_np(&defaults);
    pthread_attr_destroy(&huge);
    pthread_attr_destroy(&defaults);

    EXPECT_EQ(status, ENABLE_INDICATIONS_FAILED);
    delete handler;
    EXPECT_EQ(tvrn_sim_call_count("register_for_events"), 1u);
    EXPECT_EQ(tvrn_sim_call_count("unregister_for_events"), 1u);
    EXPECT_EQ(tvrn_sim_emit_event(kPortEvent), 0);
    EXPECT_EQ(logged("ERR", "Unable to start the indication thread"), 1);
}

// While the server does not take indications, the oldest make room; the
// delivery thread logs how many.
TEST_F(Alerts, DropsBeyondTheBoundAreLogged) {
    Receiver receiver;
    ASSERT_EQ(delivery.enable(receiver.handler()), ENABLE_INDICATIONS_OK);
    receiver.hold();
    IndicationQueue& queue = IndicationHelper::getIndicationHelperInstance()->queue();
    std::vector<TAVRIN_AlertIndication*> burst(queue.bound() + 6);
    for (TAVRIN_AlertIndication*& indication : burst)
        indication = create<TAVRIN_AlertIndication>(true);
    queue.push(burst.data(), 1);
    ASSERT_TRUE(receiver.waitFor(1));  // the thread waits in the handler
    queue.push(burst.data() + 1, burst.size() - 1);
    receiver.release();
    // Within the wait only when each pass hands over everything queued (at
    // one indication per 20 ms pass the burst would take over 3 minutes).
    const bool delivered = receiver.waitFor(queue.bound() + 1);
    EXPECT_EQ(delivery.disable(), DISABLE_INDICATIONS_OK);  // before the receiver goes
    ASSERT_TRUE(delivered);
    EXPECT_EQ(logged("WARN", "5 indications dropped: more than 10000 were waiting"), 1);
    const auto got = receiver.delivered();
    EXPECT_EQ(got[1].sequence, got[0].sequence + 6);
}

// What was queued and not delivered when delivery stopped is not handed to
// the next subscriber.
TEST_F(Alerts, QueuedIndicationsDoNotOutliveADisable) {
    Receiver first;
    ASSERT_EQ(delivery.enable(first.handler()), ENABLE_INDICATIONS_OK);
    first.hold();
    tvrn_sim_emit_event(portEvent("old").c_str());
    ASSERT_TRUE(first.waitFor(1));  // the thread waits in the handler
    tvrn_sim_emit_event(portEvent("stale").c_str());
    tvrn_sim_wait_events(10000);
    std::thread disabling([&] { delivery.disable(); });
    while (delivery.running())  // until told to stop
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    first.release();
    disabling.join();
    EXPECT_EQ(first.delivered().size(), 2u);

    Receiver second;
    ASSERT_EQ(delivery.enable(second.handler()), ENABLE_INDICATIONS_OK);
    tvrn_sim_emit_event(portEvent("new").c_str());
    ASSERT_TRUE(second.waitFor(2));
    for (const auto& d : second.delivered())
        EXPECT_EQ(d.message, "new");
    EXPECT_EQ(delivery.disable(), DISABLE_INDICATIONS_OK);
}

// Run under ThreadSanitizer too: the library's thread translates and queues
// while delivery starts and stops, and while a second enable comes in.
TEST_F(Alerts, EventsWhileEnablingAndDisabling) {
    log_set_level("ERR");  // thousands of events
    std::atomic<bool> stop(false);
    std::thread library([&] {
        while (!stop)
            if (tvrn_sim_emit_event(kPortEvent) != 1)
                std::this_thread::yield();
    });
    std::thread other([&] {  // a second library thread calling back at the same time
        while (!stop)
            providerHandleEvent(kPortEvent);
    });
    for (int round = 0; round < 20; round++) {
        Receiver receiver, extra;
        ASSERT_EQ(delivery.enable(receiver.handler()), ENABLE_INDICATIONS_OK);
        ASSERT_EQ(delivery.enable(extra.handler()), ENABLE_INDICATIONS_OK);
        EXPECT_TRUE(receiver.waitFor(1));
        EXPECT_EQ(delivery.disable(), DISABLE_INDICATIONS_OK);
        EXPECT_EQ(receiver.ends(), 1);
        EXPECT_TRUE(extra.delivered().empty());
    }
    stop = true;
    library.join();
    other.join();
    IndicationHelper::getIndicationHelperInstance()->queue().discard();
    log_set_level("DBG");
}

}  // namespace
