// Start-up of the adapter library against the simulator. Each scenario runs in
// a process of its own, as the module's load does: the binding happens once.
#include <gtest/gtest.h>

#include <stdlib.h>

#include "gateway/CIMProviderTfaj.h"
#include "gateway/ProviderInit.h"
#include "gateway/ProviderUtil.h"
#include "simulator/SimControl.h"
#include "tests/gateway/TestSupport.h"

using namespace CPTA;
using gwtest::LogCapture;
using gwtest::parseJson;
using gwtest::SimLibrary;

namespace {

// What the simulator logs while it initialises; it reaches our log only when
// our callback is registered.
const char kSimulatorInitMessage[] = "library initialised for application 2: 3 adapter(s)";

LogCapture& freshLog() {
    LogCapture::get().mark();
    return LogCapture::get();
}

TEST(LogCallbackVersion, ThreeCharacterComparisons) {
    EXPECT_TRUE(ProviderInit::acceptsLogCallback("3.2.1"));
    for (const char* version :
         {"2.9.9", "3.10.0", "4.0.5", "3.2", "", static_cast<const char*>(nullptr)})
        EXPECT_FALSE(ProviderInit::acceptsLogCallback(version)) << (version ? version : "null");
}

TEST(StartUp, BuiltInHostStartsAndTheLibraryLogsThroughUs) {
    gwtest::inFreshProcess([] {
        SimLibrary sim(TVRN_SIM_LIBRARY);
        LogCapture& log = freshLog();
        {
            ProviderInit init;
            EXPECT_EQ(ProviderInit::getDriverStatus(), 0);
            EXPECT_EQ(sim.lastRequest("init_hba_lib"), parseJson(R"({"appId": 2})"));
        }
        // Shut-down takes our callback back (the library stays mapped after
        // the module is gone), then frees the library, and calls nothing more.
        EXPECT_EQ(
            sim.entriesCalled(),
            (std::vector<std::string>{"get_agt_version", "registerLogMsgCb", "init_hba_lib",
                                      "getNumberOfAdapters", "registerLogMsgCb", "free_hba_lib"}));
        EXPECT_EQ(sim.callsAfterFree(), 0u);
        EXPECT_EQ(log.count("ERR", " not found. ", true), 0);
        EXPECT_TRUE(log.has("INFO", "TFAJ Library version: 3.2.1"));
        EXPECT_EQ(log.count("INFO", kSimulatorInitMessage, true), 1) << log.text();
    });
}

TEST(StartUp, OlderLibraryVersionGetsNoLogCallback) {
    gwtest::inFreshProcess([] {
        SimLibrary sim(TVRN_SIM_LIBRARY);
        sim.setVersion("2.9.9");
        LogCapture& log = freshLog();
        { ProviderInit init; }
        EXPECT_EQ(ProviderInit::driverStatus, 0);
        EXPECT_EQ(sim.calls("registerLogMsgCb"), 0u);
        EXPECT_TRUE(log.has("INFO", "TFAJ Library version: 2.9.9"));
        EXPECT_EQ(log.count("INFO", kSimulatorInitMessage, true), 0) << log.text();
    });
}

// Every way the initialisation can fail gives status 1, and the adapters are
// never counted. (One process: none of these registers a callback.)
TEST(StartUp, FailedInitialisationNeverAsksForAdapters) {
    gwtest::inFreshProcess([] {
        SimLibrary sim(TVRN_SIM_LIBRARY);
        struct Case {
            int kind;  // a fault of init_hba_lib, or 0 for an init result of 5
            int code;
            const char* text;
            const char* logged;  // at ERR
        };
        const Case cases[] = {
            {0, 0, nullptr, "libInitHbaLib is failed - 5 "},
            {TVRN_SIM_FAULT_NULL_ANSWER, 0, nullptr,
             "libInitHbaLib returns NULL response or has error"},
            {TVRN_SIM_FAULT_ERROR_OBJECT, 3, "no driver",
             "libInitHbaLib returns NULL response or has error"},
            {TVRN_SIM_FAULT_WRONG_TYPE, 0, "result", "libInitHbaLib is failed - -1 "},
            {TVRN_SIM_FAULT_HBA_AGENT_ERROR, 19, "no driver",
             "libInitHbaLib got User exception 19: no driver"},
            {TVRN_SIM_FAULT_NON_STANDARD, 1, nullptr, "libInitHbaLib got default exception"},
        };
        for (const Case& c : cases) {
            SCOPED_TRACE(c.logged);
            sim.reset();
            sim.setVersion("2.9.9");
            if (c.kind == 0)
                sim.setInitResult(5);
            else
                sim.setFault("init_hba_lib", nullptr, c.kind, c.code, c.text);
            LogCapture& log = freshLog();
            ProviderInit::driverStatus = -7;  // so that each start visibly records its own
            EXPECT_NO_THROW({ ProviderInit init; });
            EXPECT_EQ(ProviderInit::driverStatus, 1);
            EXPECT_EQ(log.count("ERR", c.logged), 1) << log.text();
            EXPECT_EQ(sim.calls("init_hba_lib"), 1u);
            EXPECT_EQ(sim.calls("getNumberOfAdapters"), 0u);
        }
        // A library without a version text is named "Unknown".
        sim.reset();
        sim.setVersion(nullptr);
        LogCapture& log = freshLog();
        { ProviderInit init; }
        EXPECT_TRUE(log.has("INFO", "TFAJ Library version: Unknown"));
        EXPECT_EQ(sim.calls("registerLogMsgCb"), 0u);
    });
}

TEST(StartUp, HostWithoutAdaptersGivesStatusOne) {
    gwtest::inFreshProcess([] {
        setenv("TVRN_SIM_FIXTURE", "empty", 1);  // read when the simulator is first used
        SimLibrary sim(TVRN_SIM_LIBRARY);
        LogCapture& log = freshLog();
        ProviderInit init;  // the library is in use until the scenario ends
        EXPECT_EQ(ProviderInit::driverStatus, 1);
        EXPECT_TRUE(log.has("DBG", "Adapter Count = 0"));
        // Status 1 still lets requests through to the library; 2 and 3 do not.
        EXPECT_TRUE(ProviderUtil::getDriverStatus());
        Json::Value adapters;
        EXPECT_EQ(ProviderUtil::getNumberOfAdapters(adapters), 0);
        for (int refused : {2, 3}) {
            ProviderInit::driverStatus = refused;
            EXPECT_FALSE(ProviderUtil::getDriverStatus());
        }
    });
}

TEST(StartUp, LibraryLackingOneEntryPoint) {
    gwtest::inFreshProcess([] {
        SimLibrary sim(TVRN_SIM_NO_GETCEE);
        LogCapture& log = freshLog();
        ProviderInit init;
        EXPECT_EQ(ProviderInit::driverStatus, 0);
        EXPECT_EQ(log.count("ERR", "getCee not found. "), 1) << log.text();
        EXPECT_EQ(log.count("ERR", " not found. ", true), 1);  // every other entry point is bound

        EXPECT_TRUE(libGetCee == default_JsonReqFP);  // never an empty pointer
        EXPECT_TRUE(libGetCee(Json::Value(Json::objectValue)).isNull());
        EXPECT_STREQ(ProviderUtil::getAdapterSerialNumber("200000051e5c6d70").c_str(), "8C1234XYZ");
    });
}

}  // namespace
