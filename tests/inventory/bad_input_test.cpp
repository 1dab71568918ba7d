// Bad answers from the adapter library: null and "error" answers and thrown
// exceptions at every call site, members dropped or of the wrong JSON type,
// and malformed fixture entries. Each costs at most the object it concerns.
#include "inventory/FCHBAManager.h"
#include "inventory/PortHelper.h"
#include "schema/generated/TAVRIN_FCPort.h"
#include "schema/generated/TAVRIN_LANEndpoint.h"
#include "schema/generated/TAVRIN_StorageExtent.h"
#include "tests/inventory/InventoryTestSupport.h"

using namespace CPTA;
using namespace invtest;

namespace {

class BadInput : public InventoryTest {
protected:
    static size_t count(bool fromHdr, classId_t id) {
        return Instances(fromHdr ? hdr(id) : fchba(id)).size();
    }
};

const int kAnswerFaults[] = {TVRN_SIM_FAULT_NULL_ANSWER, TVRN_SIM_FAULT_ERROR_OBJECT};
const int kThrowFaults[] = {TVRN_SIM_FAULT_HBA_AGENT_ERROR, TVRN_SIM_FAULT_STD_EXCEPTION,
                            TVRN_SIM_FAULT_NON_STANDARD};

const char kAdapter1[] = "20:00:00:05:1e:0a:0b:0c";
const char kPort1[] = "10:00:00:05:1e:0a:0b:0c";
const char kDiskTarget[] = "50:05:07:68:01:10:f0:0d";

// One library call site: a fault on `entry` for requests naming `key`, and
// how many instances of the class are left (of `total`) after an unusable
// answer and after an exception.
struct Site {
    const char* entry;
    const char* key;
    bool hdr;
    classId_t classId;
    size_t total;
    size_t afterBadAnswer;
    size_t afterException;
    const char* exceptionLine;  // what a thrown HbaAgentError logs
};

const Site kSites[] = {
    // guarded calls: the object asked about is skipped
    {"getHbaByWwn", kAdapter1, false, CID_PORT_CONTROLLER, 3, 2, 2,
     "20:00:00:05:1e:0a:0b:0c - libGetHbaByWwn got User exception 7: boom"},
    {"getFcPhyPortIndicesByAdapter", kAdapter1, false, CID_FC_PORT, 6, 4, 4,
     "libGetFcPhyPortIndicesByAdapter got User exception 7: boom"},
    {"getPortByWwn", kPort1, false, CID_FC_PORT, 6, 5, 5,
     "libGetPortByWwn got User exception 7: boom"},
    {"getAllRemotePorts", kPort1, false, CID_SCSI_PROTOCOL_ENDPOINT, 11, 8, 8,
     "libGetAllRemotePorts got User exception 7: boom"},
    {"getAllRemotePorts", kPort1, true, CID_STORAGE_EXTENT, 11, 7, 7,
     "libGetAllRemotePorts got User exception 7: boom"},
    // an exception ends the port's remote ports (the tape and changer after the disk)
    {"getCompleteRemotePort", kDiskTarget, false, CID_SCSI_PROTOCOL_ENDPOINT, 11, 10, 8,
     "libGetCompleteRemotePort got User exception 7: boom"},
    {"getCompleteRemotePort", kDiskTarget, true, CID_STORAGE_EXTENT, 11, 7, 7,
     "libGetCompleteRemotePort got User exception 7: boom"},
    {"getDynamicPortStatistics", kPort1, false, CID_FC_PORT_STATISTICS, 6, 5, 5,
     "libGetDynamicPortStatisticsat got User exception 7: boom"},
    {"getOpticsSFP", kPort1, false, CID_PHYSICAL_CONNECTOR, 5, 4, 4,
     "10:00:00:05:1e:0a:0b:0c - libGetOpticsSFP got User exception 7: boom"},
    {"getEthPhyPortIndicesByAdapter", "00:05:1e:8a:4b:00", false, CID_ETHERNET_PORT, 2, 0, 0,
     "00:05:1e:8a:4b:00 - libGetEthPhyPortIndicesByAdapter got User exception 7: boom"},
    {"getEthPortByEthMac", "00:05:1e:8a:4b:01", false, CID_LAN_ENDPOINT, 2, 1, 1,
     "00:05:1e:8a:4b:01 - libGetEthPortByEthMac got User exception 7: boom"},
    {"getOpticsSFP", "00:05:1e:8a:4b:01", false, CID_ETHERNET_PORT, 2, 2, 2,
     "00:05:1e:8a:4b:01 - libGetOpticsSFP got User exception 7: boom"},
    // plain calls: an exception ends the whole enumeration
    {"getAllAdaptersIndexString", nullptr, false, CID_FC_PORT, 6, 0, 0,
     "PortHelper::getInstancesByClass ended by User exception 7: boom"},
    {"getAllAdaptersIndexString", nullptr, false, CID_PRODUCT, 3, 0, 0,
     "AdapterHelper::getInstancesByClass ended by User exception 7: boom"},
    {"getAllAdaptersIndexString", nullptr, false, CID_PHYSICAL_CONNECTOR, 5, 0, 0,
     "PhysicalAssetHelper::getInstancesByClass ended by User exception 7: boom"},
    {"getFlashInfo", kAdapter1, false, CID_ADAPTER_SOFTWARE_IDENTITY, 8, 7, 0,
     "AdapterHelper::getInstancesByClass ended by User exception 7: boom"},
};

TEST_F(BadInput, EveryCallSiteSurvivesUnusableAnswersAndExceptions) {
    for (const Site& s : kSites) {
        SCOPED_TRACE(std::string(s.entry) + " for class id " + std::to_string(s.classId));
        tvrn_sim_clear_faults();
        ASSERT_EQ(count(s.hdr, s.classId), s.total);
        for (int kind : kAnswerFaults) {
            tvrn_sim_clear_faults();
            fault(s.entry, s.key, kind, "boom");
            EXPECT_EQ(count(s.hdr, s.classId), s.afterBadAnswer) << "fault kind " << kind;
        }
        for (int kind : kThrowFaults) {
            tvrn_sim_clear_faults();
            gwtest::LogCapture::get().mark();
            fault(s.entry, s.key, kind, "boom");
            EXPECT_EQ(count(s.hdr, s.classId), s.afterException) << "fault kind " << kind;
            if (kind == TVRN_SIM_FAULT_HBA_AGENT_ERROR) {
                EXPECT_EQ(logged("ERR", s.exceptionLine), 1) << log();
            }
        }
    }
}

TEST_F(BadInput, ExceptionsFromEveryLookUpOfTheEthernetWalkStayInside) {
    for (int kind : kThrowFaults) {
        tvrn_sim_clear_faults();
        fault("getAdapterIdByPort", nullptr, kind, "boom");
        EXPECT_TRUE(Instances(FCHBAManager::getFCHBAManager()->getEthernetPortInstancesByAdapter(
                                  "00051e8a4b01"))
                        .empty());
        tvrn_sim_clear_faults();
        fault("getFcPhyPortIndicesByAdapter", nullptr, kind, "boom");
        Json::Value ports;
        EXPECT_EQ(PortHelper::getPortHelperObject()->getNumberOfPorts(kAdapter1, ports), -1);
    }
    EXPECT_EQ(logged("ERR",
                     "EthernetPortHelper::getEthernetPortInstancesByAdapter ended by User "
                     "exception 7: boom"),
              1);
}

// A member of an answer dropped or given the wrong JSON type.
struct MemberCase {
    const char* entry;
    const char* key;
    int kind;
    const char* member;
    bool hdr;
    classId_t classId;
    size_t count;
    const char* line;  // logged at ERR or INFO, when not null
};

const MemberCase kMemberCases[] = {
    {"getAllAdaptersIndexString", nullptr, TVRN_SIM_FAULT_WRONG_TYPE, "indexStrings", false,
     CID_FC_PORT, 0, "libGetAllAdaptersIndexString returns NULL."},
    {"getAllAdaptersIndexString", nullptr, TVRN_SIM_FAULT_WRONG_TYPE, "indexStrings.0", false,
     CID_PORT_CONTROLLER, 2, "Unable to get Adapter info 1 - "},
    {"getHbaByWwn", kAdapter1, TVRN_SIM_FAULT_WRONG_TYPE, "hbaData", false, CID_PORT_CONTROLLER, 2,
     "Unable to get adapater details for 20:00:00:05:1e:0a:0b:0c"},
    {"getHbaByWwn", kAdapter1, TVRN_SIM_FAULT_DROP_MEMBER, "hbaData.portCount", false,
     CID_PHYSICAL_PACKAGE, 2, nullptr},
    {"getFcPhyPortIndicesByAdapter", kAdapter1, TVRN_SIM_FAULT_WRONG_TYPE, "indexStrings", false,
     CID_LOGICAL_PORT_GROUP, 4, "libGetFcPhyPortIndicesByAdapter returns NULL."},
    {"getFcPhyPortIndicesByAdapter", kAdapter1, TVRN_SIM_FAULT_WRONG_TYPE, "indexStrings.1", false,
     CID_FC_PORT, 5, nullptr},
    {"getPortByWwn", kPort1, TVRN_SIM_FAULT_WRONG_TYPE, "isMezz", false, CID_ALARM_DEVICE, 5,
     "beaconState is NOT available failed for 10:00:00:05:1e:0a:0b:0c."},
    {"getPortByWwn", kPort1, TVRN_SIM_FAULT_DROP_MEMBER, "beaconState", false, CID_ALARM_DEVICE, 5,
     "beaconState is NOT available failed for 10:00:00:05:1e:0a:0b:0c."},
    {"getAllRemotePorts", kPort1, TVRN_SIM_FAULT_WRONG_TYPE, "0.remotePortWwn", false,
     CID_SCSI_PROTOCOL_ENDPOINT, 10, "libGetCompleteRemotePort returned NULL for "},
    {"getCompleteRemotePort", kDiskTarget, TVRN_SIM_FAULT_WRONG_TYPE, "deviceData", false,
     CID_SCSI_PROTOCOL_ENDPOINT, 10,
     "libGetCompleteRemotePort returned NULL for 50:05:07:68:01:10:f0:0d"},
    {"getCompleteRemotePort", kDiskTarget, TVRN_SIM_FAULT_WRONG_TYPE, "lunList", true,
     CID_LOGICAL_DISK, 7, "No LUN Info is available for Rport 50:05:07:68:01:10:f0:0d."},
    {"getCompleteRemotePort", kDiskTarget, TVRN_SIM_FAULT_WRONG_TYPE, "lunList.3.number", true,
     CID_STORAGE_EXTENT, 10, nullptr},
    {"getDynamicPortStatistics", kPort1, TVRN_SIM_FAULT_WRONG_TYPE, "1.value", false,
     CID_FC_PORT_STATISTICS, 6, nullptr},
    {"getEthPortByEthMac", "00:05:1e:8a:4b:01", TVRN_SIM_FAULT_WRONG_TYPE, "ethData", false,
     CID_ETHERNET_PORT, 1, "Unable to get Eth port data for 00:05:1e:8a:4b:01"},
    {"getEthPortByEthMac", "00:05:1e:8a:4b:01", TVRN_SIM_FAULT_WRONG_TYPE, "ethData.mtu", false,
     CID_LAN_ENDPOINT, 2, nullptr},
    {"getOpticsSFP", kPort1, TVRN_SIM_FAULT_WRONG_TYPE, "serialNo", false, CID_PHYSICAL_CONNECTOR,
     5, nullptr},
    {"getAdapterIdByPort", nullptr, TVRN_SIM_FAULT_WRONG_TYPE, "adapterId", false, CID_NONE, 0,
     "libGetAdapterIdByPort returns NULL."},
};

TEST_F(BadInput, MembersMissingOrOfTheWrongTypeCountAsMissing) {
    for (const MemberCase& c : kMemberCases) {
        SCOPED_TRACE(std::string(c.entry) + " " + c.member);
        tvrn_sim_clear_faults();
        gwtest::LogCapture::get().mark();
        fault(c.entry, c.key, c.kind, c.member);
        EXPECT_EQ(
            c.classId == CID_NONE
                ? Instances(FCHBAManager::getFCHBAManager()->getEthernetPortInstancesByAdapter(
                                "00051e8a4b01"))
                      .size()
                : count(c.hdr, c.classId),
            c.count);
        if (c.line != nullptr) {
            EXPECT_EQ(logged("ERR", c.line) + logged("INFO", c.line), 1) << log();
        }
    }
}

TEST_F(BadInput, ImpossibleNumbersFromAFixture) {
    Json::Value fixture = fixtureJson("default");
    Json::Value& port = fixture["adapters"][0]["fcPorts"][0]["port"];
    port["operatingSpeed"] = Json::Int64(9223372036854775807LL);
    port["supportedPortSpeeds"] = gwtest::parseJson(R"([-16, 8])");
    fixture["adapters"][2]["ethPorts"][0]["ethData"]["mtu"] = Json::UInt(4294967295u);
    loadJson(fixture);
    Instances ports(fchba(CID_FC_PORT));
    auto* fc = ports.find(&TAVRIN_FCPort::DeviceID, "100000051e0a0b0c");
    ASSERT_NE(fc, nullptr);
    EXPECT_EQ(fc->Speed.value, 0u);
    EXPECT_EQ(fc->MaxSpeed.value, 0u);
    // An MTU whose size in bits does not fit the property is not reported.
    Instances endpoints(fchba(CID_LAN_ENDPOINT));
    ASSERT_EQ(endpoints.size(), 2u);
    EXPECT_EQ(endpoints.at<TAVRIN_LANEndpoint>(0)->MaxDataSize.value, 0u);
    EXPECT_EQ(endpoints.at<TAVRIN_LANEndpoint>(1)->MaxDataSize.value, 72000u);
}

TEST_F(BadInput, LunEntriesMissingMembersAreSkippedOneByOne) {
    Json::Value fixture = fixtureJson("default");
    Json::Value& luns = fixture["adapters"][0]["fcPorts"][0]["remotePorts"][0]["lunList"];
    const char* bad[] = {
        R"({"number": 7, "productID": "DISK-X"})",                       // no vendor
        R"({"number": "8", "vendor": "ACME", "productID": "DISK-X"})",   // number as text
        R"({"number": 9, "vendor": "ACME", "productID": 17})",           // product as number
        R"({"number": 10, "vendor": ["ACME"], "productID": "DISK-X"})",  // vendor as array
        R"({"number": 11, "vendor": "ACME", "productID": "DISK-X",
            "lunDescription": 5, "productSerialNumber": {"x": 1}})",     // both of the wrong type
    };
    for (const char* text : bad)
        luns.append(gwtest::parseJson(text));
    loadJson(fixture);

    Instances extents(hdr(CID_STORAGE_EXTENT));
    EXPECT_EQ(extents.size(), 12u);  // the 11 of the host and LUN 11
    auto* lun11 = extents.find(&TAVRIN_StorageExtent::ElementName, "LUN_11");
    ASSERT_NE(lun11, nullptr);
    EXPECT_STREQ(lun11->Name.value.c_str(), "Unable To Fetch");
    EXPECT_EQ(logged("ERR", "LUN info is NOT available"), 1 + 4);
}

}  // namespace
