// FC port inventory: ports, protocol endpoints, statistics, port groups,
// beacons and the per-port queries.
#include "inventory/FCHBAManager.h"
#include "inventory/PortHelper.h"
#include "schema/generated/TAVRIN_AlarmDevice.h"
#include "schema/generated/TAVRIN_FCPort.h"
#include "schema/generated/TAVRIN_FCPortStatistics.h"
#include "schema/generated/TAVRIN_LogicalPortGroup.h"
#include "schema/generated/TAVRIN_SCSIProtocolEndpoint.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

class Ports : public InventoryTest {
protected:
    PortHelper* ports() { return PortHelper::getPortHelperObject(); }
};

struct PortFacts {
    const char* wwn;
    const char* node;
    const char* symbolic;
    uint16 state;
    uint16 enabled;
    uint64 speed;
    uint64 maxSpeed;
    uint16 number;
};

const PortFacts kFcPort0 = {"100000051e0a0b0c", "200000051e0a0b0c", "TVR825A0001 port 0", 2, 1,
                            8000000000ull, 16000000000ull, 0};
const PortFacts kFcPortNoLink = {"100000051e0a0b0d", "200000051e0a0b0d", "TVR825A0001 port 1", 13,
                                 6, 0, 16000000000ull, 1};
const PortFacts kFcoePort = {"100000051e8a4b01", "200000051e8a4b01", "TVR1020C0007 FCoE 0", 2, 1,
                             10000000000ull, 10000000000ull, 0};

Instance* expectedPort(const PortFacts& p) {
    TAVRIN_FCPort* fc = expected<TAVRIN_FCPort>();
    fc->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    fc->SystemName.set(String(kHostAddress));
    fc->CreationClassName.set(String("TAVRIN_FCPort"));
    fc->DeviceID.set(String(p.wwn));
    fc->PermanentAddress.set(String(p.wwn));
    fc->Name.set(String(p.node, ":", p.wwn));
    fc->ElementName.set(String(p.node, ":", p.wwn));
    fc->Caption.set(String(p.symbolic));
    fc->OperationalStatus.set(u16s({p.state}));
    fc->EnabledState.set(p.enabled);
    fc->EnabledDefault.set(2);
    fc->UsageRestriction.set(3);
    fc->PortType.set(10);
    fc->LinkTechnology.set(4);
    fc->Speed.set(p.speed);
    fc->MaxSpeed.set(p.maxSpeed);
    fc->SupportedMaximumTransmissionUnit.set(2112);
    fc->PortNumber.set(p.number);
    return fc;
}

TEST_F(Ports, FcAndFcoePortsInFullIncludingAPortWithoutLink) {
    Instances got(fchba(CID_FC_PORT));
    EXPECT_EQ(got.values(&TAVRIN_FCPort::DeviceID),
              (std::vector<std::string>{"100000051e0a0b0c", "100000051e0a0b0d", "100000051e5c6d70",
                                        "100000051e5c6d71", "100000051e8a4b01", "100000051e8a4b02"}));
    for (const PortFacts* p : {&kFcPort0, &kFcPortNoLink, &kFcoePort})
        EXPECT_TRUE(sameInstance(expectedPort(*p), got.find(&TAVRIN_FCPort::DeviceID, p->wwn)));
}

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

TEST_F(Ports, ProtocolEndpointsOfPortsAndTheirTargetsOnly) {
    Instances got(fchba(CID_SCSI_PROTOCOL_ENDPOINT));
    EXPECT_EQ(got.values(&TAVRIN_SCSIProtocolEndpoint::Name),
              (std::vector<std::string>{
                  "100000051e0a0b0c", "100000051e0a0b0c_500507680110f00d",
                  "100000051e0a0b0c_500110a0002b3c01", "100000051e0a0b0c_500110a0002b3c02",
                  "100000051e0a0b0d", "100000051e5c6d70", "100000051e5c6d70_500601603ba01234",
                  "100000051e5c6d71", "100000051e8a4b01", "100000051e8a4b01_500a09818628b20c",
                  "100000051e8a4b02"}));
    for (const char* name : {"100000051e0a0b0d", "100000051e0a0b0c_500507680110f00d"}) {
        const bool local = std::string(name).find('_') == std::string::npos;
        TAVRIN_SCSIProtocolEndpoint* ep = expected<TAVRIN_SCSIProtocolEndpoint>();
        ep->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
        ep->SystemName.set(String(kHostAddress));
        ep->CreationClassName.set(String("TAVRIN_SCSIProtocolEndpoint"));
        ep->Name.set(String(name));
        ep->ElementName.set(String(name));
        ep->OperationalStatus.set(u16s({uint16(local ? 13 : 2)}));
        ep->EnabledState.set(local ? 6 : 1);
        ep->ProtocolIFType.set(1);
        ep->OtherTypeDescription.set(String("SCSI"));
        ep->ConnectionType.set(2);
        ep->Role.set(local ? 2 : 3);
        EXPECT_TRUE(sameInstance(ep, got.find(&TAVRIN_SCSIProtocolEndpoint::Name, name)));
    }
}

TEST_F(Ports, StatisticsFromTheFcOrTheFcoeColumn) {
    Instances got(fchba(CID_FC_PORT_STATISTICS));
    EXPECT_EQ(got.size(), 6u);
    struct Column {
        const char* port;
        uint64 values[14];
    };
    // BytesTransmitted, BytesReceived, PacketsTransmitted, PacketsReceived, LIPCount,
    // NOSCount, ErrorFrames, DumpedFrames, LinkFailures, LossOfSignalCounter,
    // LossOfSyncCounter, PrimitiveSeqProtocolErrCount, CRCErrors, InvalidTransmissionWords
    const Column columns[] = {
        {"100000051e0a0b0c", {39506172, 35061728, 123456, 234567, 3, 1, 2, 5, 1, 2, 4, 0, 7, 11}},
        {"100000051e8a4b01", {0, 0, 0, 0, 0, 0, 1 + 5 + 4 + 6 + 7, 3, 0, 0, 0, 0, 5, 0}},
    };
    for (const Column& c : columns) {
        TAVRIN_FCPortStatistics* st = expected<TAVRIN_FCPortStatistics>();
        st->InstanceID.set(String(c.port));
        st->ElementName.set(String("FC Port Statistics"));
        Property<uint64> TAVRIN_FCPortStatistics::*order[] = {
            &TAVRIN_FCPortStatistics::BytesTransmitted, &TAVRIN_FCPortStatistics::BytesReceived,
            &TAVRIN_FCPortStatistics::PacketsTransmitted, &TAVRIN_FCPortStatistics::PacketsReceived,
            &TAVRIN_FCPortStatistics::LIPCount, &TAVRIN_FCPortStatistics::NOSCount,
            &TAVRIN_FCPortStatistics::ErrorFrames, &TAVRIN_FCPortStatistics::DumpedFrames,
            &TAVRIN_FCPortStatistics::LinkFailures, &TAVRIN_FCPortStatistics::LossOfSignalCounter,
            &TAVRIN_FCPortStatistics::LossOfSyncCounter,
            &TAVRIN_FCPortStatistics::PrimitiveSeqProtocolErrCount,
            &TAVRIN_FCPortStatistics::CRCErrors, &TAVRIN_FCPortStatistics::InvalidTransmissionWords};
        for (size_t i = 0; i < 14; i++)
            (st->*order[i]).set(c.values[i]);
        EXPECT_TRUE(sameInstance(st, got.find(&TAVRIN_FCPortStatistics::InstanceID, c.port)));
    }
}

TEST_F(Ports, StatisticsListsThatCannotBeReadLeaveCountersAtZero) {
    Json::Value list = gwtest::parseJson(R"([
        {"id": 1402, "value": "12x"}, {"id": "1403", "value": "5"}, {"id": 1409, "value": 7},
        {"id": 1410, "value": "99999999999999999999999"}, {"value": "3"}, 17,
        {"id": 1411, "value": "4"}, {"id": 1626, "value": "9"}])");
    prov_pport_stats_s fc = PortHelper::readStatistics(list, false);
    EXPECT_EQ(fc.txFrames, 0u);
    EXPECT_EQ(fc.txWords, 0u);
    EXPECT_EQ(fc.rxFrames, 0u);
    EXPECT_EQ(fc.rxWords, 0u);
    EXPECT_EQ(fc.lipCount, 4u);
    EXPECT_EQ(fc.fcoeCrc, 0u);
    EXPECT_EQ(PortHelper::readStatistics(list, true).fcoeCrc, 9u);
    EXPECT_EQ(PortHelper::readStatistics(Json::Value("text"), false).lipCount, 0u);
}

TEST_F(Ports, LogicalPortGroupPerPort) {
    Instances got(fchba(CID_LOGICAL_PORT_GROUP));
    ASSERT_EQ(got.size(), 6u);
    TAVRIN_LogicalPortGroup* group = expected<TAVRIN_LogicalPortGroup>();
    group->InstanceID.set(String("200000051e5c6d71"));
    group->Name.set(String("100000051e5c6d71"));
    group->NameFormat.set(String("WWN"));
    group->ElementName.set(String("200000051e5c6d71:100000051e5c6d71"));
    group->Caption.set(String(kHostAddress));
    group->Description.set(String(kHostAddress));
    EXPECT_TRUE(sameInstance(group, got[3]));
}

TEST_F(Ports, BeaconsOfEveryPortButMezzanineOnes) {
    load("variants");
    Instances got(fchba(CID_ALARM_DEVICE));
    std::vector<std::string> ids = got.values(&TAVRIN_AlarmDevice::DeviceID);
    EXPECT_EQ(ids.size(), 7u);  // eight ports, less the mezzanine card's
    EXPECT_EQ(std::count(ids.begin(), ids.end(), "100000051e7e8f90"), 0);

    TAVRIN_AlarmDevice* alarm = expected<TAVRIN_AlarmDevice>();
    alarm->SystemCreationClassName.set(String("TAVRIN_ComputerSystem"));
    alarm->SystemName.set(String(kHostAddress));
    alarm->CreationClassName.set(String("TAVRIN_AlarmDevice"));
    alarm->DeviceID.set(String("100000051e0a0b0d"));
    alarm->ElementName.set(String("100000051e0a0b0d"));
    alarm->Description.set(String(kHostAddress));
    alarm->Caption.set(String("TVR825A0001 port 1"));
    alarm->VisibleAlarm.set(true);
    alarm->Urgency.set(3);
    alarm->AlarmState.set(3);
    EXPECT_TRUE(sameInstance(alarm, got.find(&TAVRIN_AlarmDevice::DeviceID, "100000051e0a0b0d")));
    EXPECT_EQ(got.find(&TAVRIN_AlarmDevice::DeviceID, "100000051e0a0b0c")->AlarmState.value, 1);
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
        {"100000051e5c6d70", 3, "getPortByWwn", 0, "ERR", "Current ALARM STATE is not available", 0},
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
    for (const char* entry : {"getPortByWwn", "setPortByWwn"}) {
        for (int kind : {TVRN_SIM_FAULT_HBA_AGENT_ERROR, TVRN_SIM_FAULT_STD_EXCEPTION,
                         TVRN_SIM_FAULT_NON_STANDARD}) {
            tvrn_sim_clear_faults();
            fault(entry, nullptr, kind, "boom");
            EXPECT_EQ(ports()->setAlarmState("100000051e0a0b0c", 3), 0) << entry << " " << kind;
        }
    }
    EXPECT_EQ(logged("ERR", "libGetPortByWwn got User exception 7: boom"), 1);
    EXPECT_EQ(logged("ERR", "libSetPortByWwn got std exception: boom"), 1);
    EXPECT_EQ(logged("ERR", "libSetPortByWwn got default exception"), 1);
}

TEST_F(Ports, PerPortQueries) {
    Json::Value list;
    EXPECT_EQ(ports()->getNumberOfPorts("200000051e5c6d70", list), 2);
    EXPECT_EQ(ports()->getNumberOfPorts("2000000000000001", list), -1);
    EXPECT_EQ(logged("ERR", "libGetFcPhyPortIndicesByAdapter returns NULL for 2000000000000001"), 1);

    EXPECT_TRUE(ports()->isPortDisabled("100000051e5c6d71"));
    EXPECT_FALSE(ports()->isPortDisabled("100000051e5c6d70"));
    EXPECT_FALSE(ports()->isPortDisabled("100000000000dead"));
    EXPECT_EQ(logged("ERR", "Port Info is NOT available"), 1);

    Json::Value port;
    ports()->getPortDetails("0efc008a4b01", port);
    EXPECT_EQ(sim().lastRequest("getPortByWwn"), gwtest::parseJson(R"({"mac": "0e:fc:00:8a:4b:01"})"));

    Json::Value sfp;
    EXPECT_EQ(ports()->getOpticsInfo("100000051e0a0b0c", sfp), 0);
    EXPECT_EQ(sfp["serialNo"].asString(), "UW1234          ");
    EXPECT_EQ(ports()->getOpticsInfo("100000051e5c6d71", sfp), -1);
    EXPECT_EQ(logged("ERR", "Unable to get SFP info for 100000051e5c6d71"), 1);
}

}  // namespace
