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

// Lines the provider of `association` logged that contain `message` (at
// `level`, when given).
size_t logged(Module_Session& s, const std::string& association, const std::string& message,
              const char* level = nullptr) {
    size_t n = 0;
    for (const std::string& line : s.logLines())
        if (line.find(association + "_Provider.cpp") != std::string::npos &&
            line.find(message) != std::string::npos &&
            (level == nullptr || line.find(std::string(" ") + level + ": ") != std::string::npos))
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
    const char* level;    // of the message
    const char* message;  // logged by its provider; null: nothing to say
};

const Empty_Case kEmptyHost[] = {
    {"TAVRIN_AdapterElementSoftwareIdentity", nullptr, nullptr},
    {"TAVRIN_AssociatedAlarm", "WARN", "No FC Ports Found!"},
    {"TAVRIN_ControlledBy", nullptr, nullptr},
    {"TAVRIN_DeviceSAPImplementation", "ERR", "Error: Invalid number of instances returned"},
    {"TAVRIN_ElementStatisticalData", "WARN", "No FC Ports Found"},
    {"TAVRIN_EthernetPortControlledBy", nullptr, nullptr},
    {"TAVRIN_EthernetPortRealizes", "WARN", "No Connector Found"},
    {"TAVRIN_EthernetPortSystemDevice", nullptr, nullptr},
    {"TAVRIN_FCPortSystemDevice", nullptr, nullptr},
    {"TAVRIN_HostedAccessPoint", "WARN",
     "Invalid number of SCSIProtocolEndPoint instances returned."},
    {"TAVRIN_HostedCollection", "WARN", "No Logical Port Groups found!"},
    {"TAVRIN_HostedDependency", nullptr, nullptr},
    {"TAVRIN_HostedLANEndpoint", "WARN", "No Ethernet Port Found"},
    {"TAVRIN_InstalledSoftwareIdentity", "ERR", "Error: Invalid mapping information"},
    {"TAVRIN_LANEndpointDeviceSAPImplementation", "WARN", "No Ethernet Port Found"},
    {"TAVRIN_MemberOfCollection", "WARN", "No FC Ports Found!"},
    {"TAVRIN_PhysicalConnectorContainer", "WARN", "No Connectors retrieved"},
    {"TAVRIN_PortControllerSystemDevice", "ERR", "Error: Invalid mapping information"},
    {"TAVRIN_ProductElementComponent", nullptr, nullptr},
    {"TAVRIN_ProductPhysicalComponent", nullptr, nullptr},
    {"TAVRIN_Realizes", nullptr, nullptr},
    {"TAVRIN_SCSIInitiatorTargetLogicalUnitPath", "ERR",
     "Error: Invalid number of instances returned!"},
    {"TAVRIN_StorageResourcesSystemDevice", nullptr, nullptr},
};

TEST(Associations, OnAHostWithoutAdaptersAnswerEmptyAndSaySo) {
    for (const Empty_Case& c : kEmptyHost) {
        SCOPED_TRACE(c.association);
        Module_Session& s = Module_Session::open("empty");
        Result<Instance> r = s.enumerate(c.association);
        EXPECT_TRUE(r.ok()) << r.toString();
        EXPECT_TRUE(r.items.empty());
        if (c.message != nullptr) {
            EXPECT_EQ(logged(s, c.association, c.message, c.level), 1u);
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
    bool fails = true;  // false: an empty answer
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
    // Endpoints, but no FC ports left for them.
    {"TAVRIN_DeviceSAPImplementation", "getAllAdaptersIndexString", "", TVRN_SIM_FAULT_NULL_ANSWER,
     "", 1, "Error: No FCPort found!", false},
};

TEST(Associations, FailWhenTheirSetsDoNotAgree) {
    for (const Mismatch_Case& c : kMismatches) {
        SCOPED_TRACE(c.association);
        Module_Session& s = Module_Session::open();
        ASSERT_EQ(0, tvrn_sim_set_fault_after(c.entryPoint, c.key, c.kind, 0, c.text, c.skip, 1));
        Result<Instance> r = s.enumerate(c.association);
        EXPECT_EQ(r.rc, c.fails ? CMPI_RC_ERR_FAILED : CMPI_RC_OK) << r.toString();
        EXPECT_TRUE(r.items.empty());
        EXPECT_EQ(logged(s, c.association, c.message, "ERR"), 1u);
        EXPECT_EQ(logged(s, c.association, "Returning: enum_instances"), 1u);
        EXPECT_EQ(logged(s, c.association, "Building and returning"), 0u);
    }
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
