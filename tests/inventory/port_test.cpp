// FC ports: the per-port queries, statistics lists and the beacon switch
// (whole instances of ports and what hangs off them are in the golden files).
#include "inventory/FCHBAManager.h"
#include "inventory/PortHelper.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

class Ports : public InventoryTest {
protected:
    PortHelper* ports() { return PortHelper::getPortHelperObject(); }
};

TEST_F(Ports, PortsOfOneAdapterByAnyFormOfItsAddress) {
    FCHBAManager* manager = FCHBAManager::getFCHBAManager();
    for (const char* key : {"200000051e0a0b0c", "20:00:00:05:1e:0a:0b:0c", "00051e8a4b00"}) {
        Instances got(manager->getFCPortInstancesByAdapter(key));
        EXPECT_EQ(got.size(), 2u) << key;
    }
    Instances none(manager->getFCPortInstancesByAdapter("2000000000000001"));
    EXPECT_TRUE(none.empty());
    EXPECT_EQ(logged("ERR", "libGetFcPhyPortIndicesByAdapter returns NULL"), 1);
}

TEST_F(Ports, StatisticsListsThatCannotBeReadLeaveCountersAtZero) {
    Json::Value list = gwtest::parseJson(R"([
        {"id": 1402, "value": "12x"}, {"id": "1403", "value": "5"}, {"id": 1409, "value": 7},
        {"id": 1410, "value": "99999999999999999999999"}, {"value": "3"}, 17,
        {"id": 1411, "value": "4"}, {"id": 1626, "value": "9"}])");
    prov_pport_stats_s fc = PortHelper::readStatistics(list, false);
    EXPECT_EQ((std::vector<uint64>{fc.txFrames, fc.txWords, fc.rxFrames, fc.rxWords, fc.lipCount,
                                   fc.fcoeCrc}),
              (std::vector<uint64>{0, 0, 0, 0, 4, 0}));
    EXPECT_EQ(PortHelper::readStatistics(list, true).fcoeCrc, 9u);
    EXPECT_EQ(PortHelper::readStatistics(Json::Value("text"), false).lipCount, 0u);
}

TEST_F(Ports, SetAlarmStateOutcomes) {
    load("variants");
    struct Case {
        const char* device;
        int state;
        const char* fault;  // entry point answering an "error" object
        int result;
        const char* level;
        const char* message;
        unsigned long long sets;  // setPortByWwn calls
    };
    const Case cases[] = {
        {"100000051e0a0b0c", 3, nullptr, 1, "INFO", "setAlarmState success", 1},
        {"100000051e0a0b0c", 3, nullptr, 3, "WARN", "setAlarmState : State already set", 0},
        {"10:00:00:05:1e:0a:0b:0c", 1, nullptr, 1, "INFO", "setAlarmState success", 1},
        {"100000051e0a0b0d", 2, nullptr, 1, "INFO", "setAlarmState success", 1},  // on -> off
        {"100000051e7e8f90", 3, nullptr, 2, "WARN",
         "setAlarmState: Operation not supported on Mezz cards", 0},
        {"100000000000dead", 3, nullptr, 0, "ERR", "Current ALARM STATE is not available", 0},
        {"100000051e5c6d70", 3, "setPortByWwn", 0, "ERR",
         "libSetPortByWwn response is null or has error", 1},
        {"100000051e5c6d70", 3, "getPortByWwn", 0, "ERR", "Current ALARM STATE is not available",
         0},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(std::string(c.device) + " state " + std::to_string(c.state));
        gwtest::LogCapture::get().mark();
        tvrn_sim_clear_faults();
        if (c.fault != nullptr)
            fault(c.fault, nullptr, TVRN_SIM_FAULT_ERROR_OBJECT);
        tvrn_sim_reset_counters();
        EXPECT_EQ(ports()->setAlarmState(c.device, c.state), c.result);
        EXPECT_EQ(logged(c.level, c.message), 1);
        EXPECT_EQ(sim().calls("setPortByWwn"), c.sets);
    }
    Json::Value sent = sim().lastRequest("setPortByWwn");
    EXPECT_EQ(sent["indexStr"].asString(), "10:00:00:05:1e:5c:6d:70");
    EXPECT_EQ(sent["propArray"], gwtest::parseJson(R"(["beaconState"])"));
    EXPECT_TRUE(sent["port"]["beaconState"].asBool());
}

TEST_F(Ports, ThrowingLibraryMakesSetAlarmStateFail) {
    for (const char* entry : {"getPortByWwn", "setPortByWwn"})
        for (int kind : {TVRN_SIM_FAULT_HBA_AGENT_ERROR, TVRN_SIM_FAULT_STD_EXCEPTION,
                         TVRN_SIM_FAULT_NON_STANDARD}) {
            tvrn_sim_clear_faults();
            fault(entry, nullptr, kind, "boom");
            EXPECT_EQ(ports()->setAlarmState("100000051e0a0b0c", 3), 0) << entry << " " << kind;
        }
    EXPECT_EQ(logged("ERR", "libGetPortByWwn got User exception 7: boom"), 1);
    EXPECT_EQ(logged("ERR", "libSetPortByWwn got std exception: boom"), 1);
    EXPECT_EQ(logged("ERR", "libSetPortByWwn got default exception"), 1);
}

TEST_F(Ports, PerPortQueries) {
    Json::Value list;
    EXPECT_EQ(ports()->getNumberOfPorts("200000051e5c6d70", list), 2);
    EXPECT_EQ(ports()->getNumberOfPorts("2000000000000001", list), -1);
    EXPECT_EQ(logged("ERR", "libGetFcPhyPortIndicesByAdapter returns NULL for 2000000000000001"),
              1);

    EXPECT_TRUE(ports()->isPortDisabled("100000051e5c6d71"));
    EXPECT_FALSE(ports()->isPortDisabled("100000051e5c6d70"));
    EXPECT_FALSE(ports()->isPortDisabled("100000000000dead"));
    EXPECT_EQ(logged("ERR", "Port Info is NOT available"), 1);

    Json::Value port;
    ports()->getPortDetails("0efc008a4b01", port);
    EXPECT_EQ(sim().lastRequest("getPortByWwn"),
              gwtest::parseJson(R"({"mac": "0e:fc:00:8a:4b:01"})"));

    Json::Value sfp;
    EXPECT_EQ(ports()->getOpticsInfo("100000051e0a0b0c", sfp), 0);
    EXPECT_EQ(sfp["serialNo"].asString(), "UW1234          ");
    EXPECT_EQ(ports()->getOpticsInfo("100000051e5c6d71", sfp), -1);
    EXPECT_EQ(logged("ERR", "Unable to get SFP info for 100000051e5c6d71"), 1);
}

}  // namespace
