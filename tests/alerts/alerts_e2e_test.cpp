// The alert indication provider of the real module, through the embedded
// host: a client's subscription, an event the simulator's library sends, and
// the indications the host receives.
#include <gtest/gtest.h>

#include <dirent.h>

#include <chrono>
#include <string>

#include "tests/e2e/Module_Session.h"

using tvrne2e::Module_Session;

namespace {

const char kClass[] = "TAVRIN_AlertIndication";
const char kPortEvent[] = R"({"eventCategory": 2, "eventId": 1, "eventSeverity": 4,)"
                          R"( "portIndexString": "100000051e0a0b0c", "eventMsg": "logged in"})";

// Threads of this process.
int threads() {
    int count = 0;
    if (DIR* dir = opendir("/proc/self/task")) {
        while (dirent* entry = readdir(dir))
            count += entry->d_name[0] != '.';
        closedir(dir);
    }
    return count;
}

class AlertProvider : public ::testing::Test {
protected:
    void SetUp() override {
        session = &Module_Session::open("default");
        ASSERT_TRUE(session->loaded());
        session->host().clearIndications();
    }

    Module_Session* session = nullptr;
};

// What an event becomes, in both forms, is in tests/golden/alerts.golden.
TEST_F(AlertProvider, AnUnsubscribeWithdrawsFromTheLibrary) {
    tvrnhost::Host& host = session->host();
    ASSERT_TRUE(host.subscribe(tvrne2e::kNameSpace, kClass).ok());
    ASSERT_EQ(tvrn_sim_emit_event(kPortEvent), 1);
    ASSERT_TRUE(host.waitForIndications(2, std::chrono::seconds(10)));
    EXPECT_EQ(host.indications()[0].nameSpace, tvrne2e::kNameSpace);

    ASSERT_TRUE(host.unsubscribe(tvrne2e::kNameSpace, kClass).ok());
    EXPECT_EQ(session->calls("unregister_for_events"), 1u);
    EXPECT_EQ(tvrn_sim_emit_event(kPortEvent), 0);  // nobody registered
}

TEST_F(AlertProvider, ARefusedSubscriptionStartsNoThread) {
    ASSERT_TRUE(session->fault("register_for_events", "", TVRN_SIM_FAULT_ERROR_OBJECT, "busy"));
    const int before = threads();
    const tvrnhost::Status st = session->host().subscribe(tvrne2e::kNameSpace, kClass);
    EXPECT_EQ(st.rc, 1);  // CMPI_RC_ERR_FAILED
    EXPECT_EQ(threads(), before);
    EXPECT_EQ(session->calls("registerEventProcessingCb"), 0u);
    EXPECT_EQ(session->logCount("Subscribtion for event notifications FAILED."), 1u);
    session->host().unsubscribe(tvrne2e::kNameSpace, kClass);
}

// The server's last cleanup unloads the provider while it delivers.
TEST_F(AlertProvider, UnloadWhileEnabledStopsDelivery) {
    tvrnhost::Host& host = session->host();
    const int before = threads();
    ASSERT_TRUE(host.subscribe(tvrne2e::kNameSpace, kClass).ok());
    for (int n = 0; n < 50; n++)
        tvrn_sim_emit_event(kPortEvent);
    ASSERT_TRUE(host.waitForIndications(1, std::chrono::seconds(10)));
    host.cleanup(true);
    EXPECT_EQ(session->calls("unregister_for_events"), 1u);
    EXPECT_EQ(tvrn_sim_emit_event(kPortEvent), 0);
    EXPECT_EQ(threads(), before);  // the delivery and library threads are gone
    Module_Session::close();
}

}  // namespace
