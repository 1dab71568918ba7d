// The inventory associations of libtvrnprovider.so through the embedded host,
// on the adapter-library simulator. What each association holds on the
// default host, and where associator and reference requests lead, is in the
// golden files tests/golden/associations_*.golden; these tests hold the cases
// a fixture alone does not show: other hosts, hosts that change between two
// fetches, failing library calls, and how often the library is asked.
#include <gtest/gtest.h>

#include <cmpidt.h>

#include <cstdlib>
#include <fstream>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "simulator/SimControl.h"
#include "tests/e2e/Module_Session.h"

using namespace tvrne2e;

namespace {

// An end written short, "FCPort:100000051e0a0b0c": the class without
// "TAVRIN_" and the key that tells its instances apart.
std::string shortName(const tvrnhost::ObjectPath& path) {
    std::string name = path.className();
    if (name.compare(0, 7, "TAVRIN_") == 0)
        name.erase(0, 7);
    for (const char* key : {"IdentifyingNumber", "DeviceID", "Tag", "InstanceID", "Name"})
        if (const tvrnhost::Value* v = path.key(key))
            return name + ":" + v->asString();
    return name + ":?";
}

// The ends of each association in the order of `roles`, blank-separated.
std::vector<std::string> ends(const std::vector<Instance>& associations,
                              std::initializer_list<const char*> roles) {
    std::vector<std::string> out;
    for (const Instance& a : associations) {
        std::string line;
        for (const char* role : roles) {
            const tvrnhost::Value* v = a.get(role);
            line += (line.empty() ? "" : " ") + (v == nullptr || v->isNull()
                                                     ? std::string(role) + ":NULL"
                                                     : shortName(v->asReference()));
        }
        out.push_back(line);
    }
    return out;
}

// Lines the provider of `association` logged that contain `message`.
size_t logged(Module_Session& s, const std::string& association, const std::string& message) {
    size_t n = 0;
    for (const std::string& line : s.logLines())
        if (line.find(association + "_Provider.cpp") != std::string::npos &&
            line.find(message) != std::string::npos)
            n++;
    return n;
}

// The JSON text of a fixture of the source tree, with `from` replaced by `to`.
std::string fixtureText(const std::string& name, const std::string& from, const std::string& to) {
    std::ifstream is(std::string(getenv("TVRN_SOURCE_DIR")) + "/simulator/fixtures/" + name);
    std::stringstream text;
    text << is.rdbuf();
    std::string json = text.str();
    for (size_t at = json.find(from); at != std::string::npos; at = json.find(from, at + to.size()))
        json.replace(at, from.size(), to);
    return json;
}

// ---- a host without adapters ---------------------------------------------------

struct Empty_Case {
    const char* association;
    const char* message;  // logged by its provider; null: nothing to say
};

const Empty_Case kEmptyHost[] = {
    {"TAVRIN_AdapterElementSoftwareIdentity", nullptr},
    {"TAVRIN_AssociatedAlarm", "No FC Ports Found!"},
    {"TAVRIN_ControlledBy", nullptr},
    {"TAVRIN_DeviceSAPImplementation", "Error: Invalid number of instances returned"},
    {"TAVRIN_ElementStatisticalData", "No FC Ports Found"},
    {"TAVRIN_EthernetPortControlledBy", nullptr},
    {"TAVRIN_EthernetPortRealizes", "No Connector Found"},
    {"TAVRIN_EthernetPortSystemDevice", nullptr},
    {"TAVRIN_FCPortSystemDevice", nullptr},
    {"TAVRIN_HostedAccessPoint", "Invalid number of SCSIProtocolEndPoint instances returned."},
    {"TAVRIN_HostedCollection", "No Logical Port Groups found!"},
    {"TAVRIN_HostedDependency", nullptr},
    {"TAVRIN_HostedLANEndpoint", "No Ethernet Port Found"},
    {"TAVRIN_InstalledSoftwareIdentity", "Error: Invalid mapping information"},
    {"TAVRIN_LANEndpointDeviceSAPImplementation", "No Ethernet Port Found"},
    {"TAVRIN_MemberOfCollection", "No FC Ports Found!"},
    {"TAVRIN_PhysicalConnectorContainer", "No Connectors retrieved"},
    {"TAVRIN_PortControllerSystemDevice", "Error: Invalid mapping information"},
    {"TAVRIN_ProductElementComponent", nullptr},
    {"TAVRIN_ProductPhysicalComponent", nullptr},
    {"TAVRIN_Realizes", nullptr},
    {"TAVRIN_SCSIInitiatorTargetLogicalUnitPath", "Error: Invalid number of instances returned!"},
    {"TAVRIN_StorageResourcesSystemDevice", nullptr},
};

TEST(Associations, OnAHostWithoutAdaptersAnswerEmptyAndSaySo) {
    for (const Empty_Case& c : kEmptyHost) {
        SCOPED_TRACE(c.association);
        Module_Session& s = Module_Session::open("empty");
        Result<Instance> r = s.enumerate(c.association);
        EXPECT_TRUE(r.ok()) << r.toString();
        EXPECT_TRUE(r.items.empty());
        if (c.message != nullptr) {
            EXPECT_EQ(logged(s, c.association, c.message), 1u);
        }
        EXPECT_EQ(logged(s, c.association, "Returning: enum_instances"), 1u);
    }
}

// ---- sets that do not agree -------------------------------------------------------

struct Mismatch_Case {
    const char* association;
    const char* entryPoint;  // the fault that makes the sets disagree
    const char* key;
    tvrn_sim_fault_kind kind;
    const char* text;
    int skip;  // calls before the fault fires: it hits the second fetch
    const char* message;
};

const Mismatch_Case kMismatches[] = {
    // An adapter gone between the two readings of the adapter list.
    {"TAVRIN_ProductElementComponent", "getAllAdaptersIndexString", "", TVRN_SIM_FAULT_DROP_MEMBER,
     "indexStrings.2", 1, "Invalid mapping information."},
    {"TAVRIN_ProductPhysicalComponent", "getAllAdaptersIndexString", "", TVRN_SIM_FAULT_DROP_MEMBER,
     "indexStrings.2", 1, "Error: Improper Product Information!"},
    {"TAVRIN_Realizes", "getAllAdaptersIndexString", "", TVRN_SIM_FAULT_DROP_MEMBER,
     "indexStrings.2", 1, "Error: Invalid number of instances returned!"},
    // No adapters left for the port groups.
    {"TAVRIN_MemberOfCollection", "getAllAdaptersIndexString", "", TVRN_SIM_FAULT_NULL_ANSWER, "",
     1, "Error: Invalid number of instances returned!"},
    // An Ethernet port that cannot be read while the ports are fetched.
    {"TAVRIN_LANEndpointDeviceSAPImplementation", "getEthPortByEthMac", "00:05:1e:8a:4b:01",
     TVRN_SIM_FAULT_NULL_ANSWER, "", 0, "Error: Invalid mapping information!"},
};

TEST(Associations, FailWhenTheirSetsDoNotAgree) {
    for (const Mismatch_Case& c : kMismatches) {
        SCOPED_TRACE(c.association);
        Module_Session& s = Module_Session::open();
        ASSERT_EQ(0, tvrn_sim_set_fault_after(c.entryPoint, c.key, c.kind, 0, c.text, c.skip, 1));
        Result<Instance> r = s.enumerate(c.association);
        EXPECT_EQ(r.rc, CMPI_RC_ERR_FAILED) << r.toString();
        EXPECT_TRUE(r.items.empty());
        EXPECT_EQ(logged(s, c.association, c.message), 1u);
        EXPECT_EQ(logged(s, c.association, "Returning: enum_instances"), 1u);
        EXPECT_EQ(logged(s, c.association, "Building and returning"), 0u);
    }
}

TEST(Associations, RealizesPairsOnlyByPosition) {
    Module_Session& s = Module_Session::open();
    // The packages see the first adapter without a serial number.
    ASSERT_EQ(
        0, tvrn_sim_set_fault_after("getHbaByWwn", "20:00:00:05:1e:0a:0b:0c",
                                    TVRN_SIM_FAULT_DROP_MEMBER, 0, "hbaData.serialNumber", 1, 1));
    Result<Instance> r = s.enumerate("TAVRIN_Realizes");
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(
        ends(r.items, {"Dependent", "Antecedent"}),
        (std::vector<std::string>{
            "PortController:200000051e5c6d70 PhysicalPackage:5f3c9e2a1b4d4e6f8a9b0c1d2e3f4a5b",
            "PortController:00051e8a4b00 PhysicalPackage:a1b2c3d4e5f60718293a4b5c6d7e8f90"}));
}

// ---- adapters of other hosts ---------------------------------------------------------

TEST(Associations, DriversGoWithTheControllersTheyDrive) {
    // Two FC HBAs, a mezzanine FC HBA and two CNAs, with the network driver
    // under its usual name "tna" and under another one.
    for (const std::string network : {"tna", "tvne"}) {
        SCOPED_TRACE(network);
        Module_Session& s = Module_Session::open("variants");
        ASSERT_EQ(0, tvrn_sim_load_fixture_text(
                         fixtureText("variants.json", "\"tna\"", "\"" + network + "\"").c_str()));
        Result<Instance> r = s.enumerate("TAVRIN_AdapterElementSoftwareIdentity");
        ASSERT_TRUE(r.ok()) << r.toString();
        std::set<std::string> withStorageDriver, withNetworkDriver;
        for (const Instance& a : r.items) {
            const std::string controller =
                a.get("Dependent")->asReference().key("DeviceID")->asString();
            const std::string identity =
                a.get("Antecedent")->asReference().key("InstanceID")->asString();
            if (identity == "tvfc")
                withStorageDriver.insert(controller);
            else if (identity == network)
                withNetworkDriver.insert(controller);
            else  // firmware or BIOS: its own adapter's only
                EXPECT_EQ(identity.substr(0, identity.find('_')), controller);
        }
        EXPECT_EQ(withStorageDriver,
                  (std::set<std::string>{"200000051e0a0b0c", "200000051e5c6d70", "200000051e7e8f90",
                                         "00051e8a4b00", "00051e9c5d00"}));
        EXPECT_EQ(withNetworkDriver, (std::set<std::string>{"00051e8a4b00", "00051e9c5d00"}));
    }
}

TEST(Associations, HostedDependencyGoesOnWithTheNextCna) {
    Module_Session& s = Module_Session::open("variants");
    Result<Instance> all = s.enumerate("TAVRIN_HostedDependency");
    ASSERT_TRUE(all.ok()) << all.toString();
    EXPECT_EQ(ends(all.items, {"Dependent", "Antecedent"}),
              (std::vector<std::string>{"FCPort:100000051e8a4b01 EthernetPort:00051e8a4b01",
                                        "FCPort:100000051e8a4b02 EthernetPort:00051e8a4b02",
                                        "FCPort:100000051e9c5d01 EthernetPort:00051e9c5d01"}));

    // The first CNA's FC ports, then its Ethernet ports, cannot be listed.
    const struct {
        const char* entryPoint;
        const char* message;
    } gone[] = {{"getFcPhyPortIndicesByAdapter", "There are no FCPORT instances returned"},
                {"getEthPhyPortIndicesByAdapter", "There are no ETHPORT instances returned"}};
    for (const auto& g : gone) {
        SCOPED_TRACE(g.entryPoint);
        Module_Session::open("variants");
        ASSERT_EQ(0, tvrn_sim_set_fault(g.entryPoint, "00:05:1e:8a:4b:00",
                                        TVRN_SIM_FAULT_NULL_ANSWER, 0, nullptr, 0));
        Result<Instance> r = s.enumerate("TAVRIN_HostedDependency");
        ASSERT_TRUE(r.ok()) << r.toString();
        EXPECT_EQ(ends(r.items, {"Dependent", "Antecedent"}),
                  (std::vector<std::string>{"FCPort:100000051e9c5d01 EthernetPort:00051e9c5d01"}));
        EXPECT_EQ(logged(s, "TAVRIN_HostedDependency", g.message), 1u);
    }
}

TEST(Associations, ConnectorTagsWithUnderscoresInTheSerial) {
    Module_Session& s = Module_Session::open();
    ASSERT_EQ(0, tvrn_sim_load_fixture_text(
                     fixtureText("default.json", "\"UX2002 ", "\"UX_2002_B ").c_str()));
    Result<Instance> packages = s.enumerate("TAVRIN_PhysicalConnectorContainer");
    Result<Instance> ports = s.enumerate("TAVRIN_EthernetPortRealizes");
    ASSERT_TRUE(packages.ok() && ports.ok()) << packages.toString() << ports.toString();
    EXPECT_EQ(ends(packages.items, {"PartComponent", "GroupComponent"}).back(),
              "PhysicalConnector:UX_2002_B_3_1 PhysicalPackage:a1b2c3d4e5f60718293a4b5c6d7e8f90");
    EXPECT_EQ(ends(ports.items, {"Antecedent", "Dependent"}).back(),
              "PhysicalConnector:UX_2002_B_3_1 EthernetPort:00051e8a4b02");
}

// ---- paths through a SAN ------------------------------------------------------------------

TEST(Associations, TwoLunsBehindOneTargetGiveTwoPathsThatShareItsEnds) {
    Module_Session& s = Module_Session::open();
    Result<Instance> r = s.enumerate("TAVRIN_SCSIInitiatorTargetLogicalUnitPath");
    ASSERT_TRUE(r.ok()) << r.toString();
    std::vector<std::string> cna;
    for (const std::string& path : ends(r.items, {"Initiator", "Target", "LogicalUnit"}))
        if (path.find("SCSIProtocolEndpoint:100000051e8a4b01 ") == 0)
            cna.push_back(path);
    EXPECT_EQ(cna,
              (std::vector<std::string>{
                  "SCSIProtocolEndpoint:100000051e8a4b01 "
                  "SCSIProtocolEndpoint:100000051e8a4b01_500a09818628b20c "
                  "StorageExtent:100000051e8a4b01_500a09818628b20c_NETSTOR_LUN-C-MODE_LUN_0",
                  "SCSIProtocolEndpoint:100000051e8a4b01 "
                  "SCSIProtocolEndpoint:100000051e8a4b01_500a09818628b20c "
                  "StorageExtent:100000051e8a4b01_500a09818628b20c_NETSTOR_LUN-C-MODE_LUN_1"}));
}

TEST(Associations, EveryPathOfAGeneratedSan) {
    // 3 adapters x 2 ports, each port with 3 targets (one of them tape) of 4
    // LUNs, and a remote initiator that leads nowhere.
    Module_Session& s = Module_Session::open();
    ASSERT_EQ(0, tvrn_sim_load_fixture_text(
                     R"({"generate": {"fcHbas": 2, "cnas": 1, "portsPerAdapter": 2,
                                      "targetsPerPort": 3, "lunsPerTarget": 4,
                                      "tapeTargetsPerPort": 1, "initiatorsPerPort": 1}})"));
    Result<Instance> r = s.enumerate("TAVRIN_SCSIInitiatorTargetLogicalUnitPath");
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(r.items.size(), 6u * 3u * 4u);
    std::set<std::string> distinct;
    for (const Instance& path : r.items) {
        const std::string initiator = path.get("Initiator")->asReference().key("Name")->asString();
        const std::string target = path.get("Target")->asReference().key("Name")->asString();
        const std::string unit = path.get("LogicalUnit")->asReference().key("DeviceID")->asString();
        EXPECT_EQ(target.compare(0, initiator.size() + 1, initiator + "_"), 0) << target;
        EXPECT_EQ(unit.compare(0, target.size() + 1, target + "_"), 0) << unit;
        distinct.insert(unit);
    }
    EXPECT_EQ(distinct.size(), r.items.size());
}

// ---- the library, asked once per answer ----------------------------------------------------

// Library calls of one enumeration.
unsigned long long callsOf(Module_Session& s, const char* className, const char* entryPoint) {
    s.resetCounters();
    Result<Instance> r = s.enumerate(className);
    EXPECT_TRUE(r.ok()) << className << ": " << r.toString();
    return s.calls(entryPoint);
}

TEST(Associations, ConnectorsAskForEachAdapterOnce) {
    Module_Session& s = Module_Session::open();
    const char* kConnector = "TAVRIN_PhysicalConnector";
    const char* kPackage = "TAVRIN_PhysicalPackage";
    // Five connectors on three adapters: one adapter list and one serial number
    // per adapter besides what the two sets cost.
    EXPECT_EQ(callsOf(s, "TAVRIN_PhysicalConnectorContainer", "getHbaByWwn"),
              callsOf(s, kConnector, "getHbaByWwn") + callsOf(s, kPackage, "getHbaByWwn") + 3);
    EXPECT_EQ(callsOf(s, "TAVRIN_PhysicalConnectorContainer", "getAllAdaptersIndexString"),
              callsOf(s, kConnector, "getAllAdaptersIndexString") +
                  callsOf(s, kPackage, "getAllAdaptersIndexString") + 1);
    // The Ethernet ports of each adapter that has connectors, once.
    EXPECT_EQ(callsOf(s, "TAVRIN_EthernetPortRealizes", "getEthPhyPortIndicesByAdapter"), 3u);
}

TEST(Associations, ALibraryExceptionFailsTheRequest) {
    Module_Session& s = Module_Session::open();
    // The connectors and the packages are fetched; reading the adapter list
    // for the connectors' serial numbers throws.
    const unsigned long long fetches =
        callsOf(s, "TAVRIN_PhysicalConnector", "getAllAdaptersIndexString") +
        callsOf(s, "TAVRIN_PhysicalPackage", "getAllAdaptersIndexString");
    Module_Session::open();
    ASSERT_EQ(
        0, tvrn_sim_set_fault_after("getAllAdaptersIndexString", "", TVRN_SIM_FAULT_HBA_AGENT_ERROR,
                                    42, "bus reset", int(fetches), 1));
    Result<Instance> r = s.enumerate("TAVRIN_PhysicalConnectorContainer");
    EXPECT_EQ(r.rc, CMPI_RC_ERR_FAILED) << r.toString();
    EXPECT_TRUE(r.items.empty());
    EXPECT_EQ(logged(s, "TAVRIN_PhysicalConnectorContainer",
                     "enum_instances got User exception 42: bus reset"),
              1u);
}

}  // namespace
