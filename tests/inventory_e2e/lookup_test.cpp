// Get-instance by keys: the same answer as enumerating the class and
// comparing keys, for every object of every shipped fixture; a key that names
// nothing is not found; and a get asks the library as much on a large host as
// on a small one.
#include <cmpidt.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <set>
#include <string>
#include <unordered_map>
#include <vector>

#include "tests/e2e/Module_Session.h"

using namespace tvrne2e;

namespace {

// The classes the module serves instances of, with or without the
// associations.
std::vector<std::string> instanceClasses(Module_Session& s, bool withAssociations) {
    std::vector<std::string> out;
    for (const tvrnhost::Registration& r : s.host().registrations())
        if ((r.kinds & tvrnhost::kInstanceMI) &&
            (withAssociations || !(r.kinds & tvrnhost::kAssociationMI)))
            out.push_back(r.className);
    return out;
}

// Every path that enumerating the names of each class gives (only the
// instance classes when `withAssociations` is false) gets the instance that
// enumeration gives: the first one with that path, as enumerate-and-filter
// keeps.
void expectGetsEqualEnumeration(const std::string& fixture, bool withAssociations) {
    Module_Session& s = Module_Session::open(fixture, "ERR");
    ASSERT_TRUE(s.loaded());
    size_t checked = 0;
    for (const std::string& className : instanceClasses(s, withAssociations)) {
        SCOPED_TRACE(fixture + " " + className);
        Result<ObjectPath> names = s.enumerateNames(className);
        ASSERT_TRUE(names.ok()) << names.toString();
        if (names.items.empty())
            continue;
        Result<Instance> all = s.enumerate(className);
        ASSERT_TRUE(all.ok()) << all.toString();
        ASSERT_EQ(all.items.size(), names.items.size());
        std::unordered_map<std::string, const Instance*> byPath;
        for (const Instance& instance : all.items)
            byPath.emplace(instance.path().toString(), &instance);
        for (const ObjectPath& path : names.items) {
            auto expected = byPath.find(path.toString());
            ASSERT_NE(expected, byPath.end()) << path.toString();
            InstanceResult got = s.get(path);
            ASSERT_TRUE(got.ok()) << path.toString() << ": " << got.toString();
            ASSERT_EQ(got.instance.toString(), expected->second->toString());
            checked++;
        }
    }
    EXPECT_GT(checked, 0u);
}

TEST(LookupEquivalence, EveryPathOfEverySmallFixtureGetsWhatEnumerationGives) {
    for (const char* fixture : {"default", "variants", "alerts", "empty"})
        expectGetsEqualEnumeration(fixture, true);
}

// 23,040 LUNs: every path of every instance class. The associations are not
// looked up by keys (a get of one goes through the association's
// enumeration, over every LUN path), and the small fixtures cover them.
TEST(LookupEquivalence, EveryPathOfTheLargeSanGetsWhatEnumerationGives) {
    expectGetsEqualEnumeration("large-san", false);
}

std::string devicePath(const std::string& className, const std::string& deviceId,
                       const std::string& systemName = "<host>") {
    return className + ".CreationClassName=\"" + className + "\",DeviceID=\"" + deviceId +
           "\",SystemCreationClassName=\"TAVRIN_ComputerSystem\",SystemName=\"" + systemName + "\"";
}

std::string connectorPath(const std::string& tag) {
    return "TAVRIN_PhysicalConnector.CreationClassName=\"TAVRIN_PhysicalConnector\",Tag=\"" + tag +
           "\"";
}

TEST(Lookup, KeysThatNameNothingAreNotFound) {
    Module_Session& s = Module_Session::open();
    ASSERT_TRUE(s.loaded());
    const std::string lun = "100000051e0a0b0c_500507680110f00d_ACME_DISK-X_LUN_3";
    ASSERT_TRUE(s.get(s.path(devicePath("TAVRIN_StorageExtent", lun))).ok());
    struct Case {
        std::string path;
        bool asksLibrary;  // false: answered from the keys alone
    };
    const Case cases[] = {
        // another host, malformed keys
        {devicePath("TAVRIN_StorageExtent", lun, "some-other-host"), false},
        {devicePath("TAVRIN_StorageExtent", "100000051e0a0b0c_LUN_3"), false},
        {devicePath("TAVRIN_StorageExtent", "10:00:00:05:1e:0a:0b:0c_500507680110f00d_x"), false},
        {devicePath("TAVRIN_FCPort", "100000051e0a0b0"), false},
        {devicePath("TAVRIN_FCPort", "100000051e0a0b0c", "some-other-host"), false},
        {devicePath("TAVRIN_EthernetPort", "00051e8a4b01xx"), false},
        {devicePath("TAVRIN_PortController", "not-an-adapter"), false},
        {"TAVRIN_SCSIProtocolEndpoint.CreationClassName=\"TAVRIN_SCSIProtocolEndpoint\","
         "Name=\"100000051e0a0b0c_\",SystemCreationClassName=\"TAVRIN_ComputerSystem\","
         "SystemName=\"<host>\"",
         false},
        {connectorPath("UW1234"), false},
        {connectorPath("UW1234_0_0"), false},
        // well formed, but nothing has these keys
        {devicePath("TAVRIN_StorageExtent", "100000051e0a0b0c_500507680110f00d_ACME_DISK-X_LUN_9"),
         true},
        {devicePath("TAVRIN_StorageExtent", "100000051e0a0b0c_5005076801100000_ACME_DISK-X_LUN_3"),
         true},
        {devicePath("TAVRIN_StorageExtent", "100000051e0a0b0d_500507680110f00d_ACME_DISK-X_LUN_3"),
         true},
        {devicePath("TAVRIN_TapeDrive", lun), true},
        {devicePath("TAVRIN_FCPort", "1000000000000000"), true},
        {devicePath("TAVRIN_FCPort", "100000051E0A0B0C"), true},
        {devicePath("TAVRIN_AlarmDevice", "100000051e0a0b0e"), true},
        {devicePath("TAVRIN_EthernetPort", "00051e8a4b09"), true},
        {devicePath("TAVRIN_PortController", "200000051e0a0b0f"), true},
        {"TAVRIN_FCPortStatistics.InstanceID=\"100000051e0a0b0e\"", true},
        {"TAVRIN_AdapterSoftwareIdentity.InstanceID=\"200000051e0a0b0f_firmware\"", true},
        {"TAVRIN_AdapterSoftwareIdentity.InstanceID=\"tvfc2\"", true},
        {connectorPath("UW9999_1_0"), true},
        {connectorPath("UW1234_1_7"), true},
        {connectorPath("UW1234_9_0"), true},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.path);
        s.resetCounters();
        EXPECT_EQ(s.get(s.path(c.path)).rc, CMPI_RC_ERR_NOT_FOUND);
        if (!c.asksLibrary)
            EXPECT_EQ(s.totalCalls(), 0u);
        else
            EXPECT_LE(s.totalCalls(), 8u) << "a look-up, not a walk";
    }
}

}  // namespace

namespace {

// Library calls of one get of the first object of each class, on a host.
std::vector<unsigned long long> callsPerGet(Module_Session& s, const char* fixture,
                                            const std::vector<std::string>& classes) {
    EXPECT_EQ(tvrn_sim_load_fixture_text(fixture), 0) << tvrn_sim_last_error();
    std::vector<unsigned long long> calls;
    for (const std::string& className : classes) {
        Result<ObjectPath> names = s.enumerateNames(className);
        EXPECT_FALSE(names.items.empty()) << className;
        if (names.items.empty())
            return calls;
        s.resetCounters();
        EXPECT_TRUE(s.get(names.items.front()).ok()) << names.items.front().toString();
        calls.push_back(s.totalCalls());
    }
    return calls;
}

// Library calls of the LUN paths from the first SCSI endpoint whose role is
// `role` (2 initiator, 3 target) and from the first storage extent.
std::vector<unsigned long long> callsPerPathRequest(Module_Session& s, const char* fixture) {
    EXPECT_EQ(tvrn_sim_load_fixture_text(fixture), 0) << tvrn_sim_last_error();
    std::vector<ObjectPath> sources;
    for (unsigned long long role : {2, 3})
        for (const Instance& e : s.enumerate("TAVRIN_SCSIProtocolEndpoint").items)
            if (e.get("Role") && e.get("Role")->asUint() == role) {
                sources.push_back(e.path());
                break;
            }
    Result<ObjectPath> extents = s.enumerateNames("TAVRIN_StorageExtent");
    if (!extents.items.empty())
        sources.push_back(extents.items.front());
    EXPECT_EQ(sources.size(), 3u);
    std::vector<unsigned long long> calls;
    for (const ObjectPath& source : sources) {
        s.resetCounters();
        Result<ObjectPath> ends =
            s.host().associatorNames(source, "TAVRIN_SCSIInitiatorTargetLogicalUnitPath");
        EXPECT_TRUE(ends.ok() && !ends.items.empty()) << source.toString();
        calls.push_back(s.totalCalls());
    }
    return calls;
}

TEST(Lookup, APathRequestFromOneEndAsksTheLibraryOnlyAboutItsPort) {
    Module_Session& s = Module_Session::open();
    ASSERT_TRUE(s.loaded());
    // The same targets behind each port; more adapters, ports, targets and
    // LUNs elsewhere.
    const auto small = callsPerPathRequest(s, R"({"generate": {"fcHbas": 1, "cnas": 1,
        "portsPerAdapter": 2, "targetsPerPort": 3, "lunsPerTarget": 2,
        "tapeTargetsPerPort": 1, "initiatorsPerPort": 1}})");
    const auto large = callsPerPathRequest(s, R"({"generate": {"fcHbas": 5, "cnas": 3,
        "portsPerAdapter": 4, "targetsPerPort": 3, "lunsPerTarget": 2,
        "tapeTargetsPerPort": 1, "initiatorsPerPort": 1}})");
    EXPECT_EQ(small, large);
    // From a target or a LUN: the same however many targets the port has.
    const auto moreTargets = callsPerPathRequest(s, R"({"generate": {"fcHbas": 1, "cnas": 1,
        "portsPerAdapter": 2, "targetsPerPort": 24, "lunsPerTarget": 16,
        "tapeTargetsPerPort": 4, "initiatorsPerPort": 2}})");
    ASSERT_EQ(moreTargets.size(), 3u);
    EXPECT_EQ(moreTargets[1], small[1]);
    EXPECT_EQ(moreTargets[2], small[2]);
    tvrn_sim_reset();
}

// Two generated hosts with the same adapter ports; the large one has more
// adapters, targets and LUNs.
const char kSmallHost[] = R"({"generate": {"fcHbas": 1, "cnas": 1, "portsPerAdapter": 2,
    "targetsPerPort": 2, "lunsPerTarget": 2, "tapeTargetsPerPort": 1, "initiatorsPerPort": 1}})";
const char kLargeHost[] = R"({"generate": {"fcHbas": 4, "cnas": 3, "portsPerAdapter": 2,
    "targetsPerPort": 16, "lunsPerTarget": 16, "tapeTargetsPerPort": 4, "initiatorsPerPort": 2}})";

// Library calls of one request from the first object of a class over an
// association (ain, or rin when `references`), on a host.
struct Walk {
    const char* association;
    const char* from;
    bool references;
};

std::vector<unsigned long long> callsPerWalk(Module_Session& s, const char* fixture,
                                             const std::vector<Walk>& walks) {
    EXPECT_EQ(tvrn_sim_load_fixture_text(fixture), 0) << tvrn_sim_last_error();
    std::vector<unsigned long long> calls;
    for (const Walk& w : walks) {
        Result<ObjectPath> names = s.enumerateNames(w.from);
        EXPECT_FALSE(names.items.empty()) << w.from;
        if (names.items.empty())
            return calls;
        s.resetCounters();
        const size_t found =
            w.references
                ? s.host().referenceNames(names.items.front(), w.association).items.size()
                : s.host().associatorNames(names.items.front(), w.association).items.size();
        EXPECT_GT(found, 0u) << w.association << " from " << names.items.front().toString();
        calls.push_back(s.totalCalls());
    }
    return calls;
}

TEST(Lookup, AnAssociationRequestFromOneObjectAsksAsMuchOnALargeHostAsOnASmallOne) {
    Module_Session& s = Module_Session::open();
    ASSERT_TRUE(s.loaded());
    const std::vector<Walk> walks = {
        {"TAVRIN_ControlledBy", "TAVRIN_PortController", false},  // the ports of one adapter
        {"TAVRIN_ControlledBy", "TAVRIN_FCPort", false},
        {"TAVRIN_FCPortSystemDevice", "TAVRIN_FCPort", false},
        {"TAVRIN_ElementStatisticalData", "TAVRIN_FCPort", true},
        {"TAVRIN_EthernetPortControlledBy", "TAVRIN_EthernetPort", false},
        {"TAVRIN_StorageResourcesSystemDevice", "TAVRIN_StorageExtent", false},
        {"TAVRIN_HostedAccessPoint", "TAVRIN_SCSIProtocolEndpoint", true},
        {"TAVRIN_Realizes", "TAVRIN_PortController", false},
        {"TAVRIN_HostedDependency", "TAVRIN_EthernetPort", false},
    };
    const auto small = callsPerWalk(s, kSmallHost, walks);
    const auto large = callsPerWalk(s, kLargeHost, walks);
    ASSERT_EQ(small.size(), walks.size());
    for (size_t i = 0; i < walks.size(); i++) {
        EXPECT_EQ(small[i], large[i]) << walks[i].association << " from " << walks[i].from;
        EXPECT_LE(small[i], 16u) << walks[i].association << " from " << walks[i].from;
    }
    tvrn_sim_reset();
}

TEST(Lookup, AGetAsksTheLibraryAsMuchOnALargeHostAsOnASmallOne) {
    Module_Session& s = Module_Session::open();
    ASSERT_TRUE(s.loaded());
    const std::vector<std::string> classes = {"TAVRIN_StorageExtent",
                                              "TAVRIN_LogicalDisk",
                                              "TAVRIN_TapeDrive",
                                              "TAVRIN_FCPort",
                                              "TAVRIN_PortController",
                                              "TAVRIN_EthernetPort",
                                              "TAVRIN_SCSIProtocolEndpoint",
                                              "TAVRIN_PhysicalConnector",
                                              "TAVRIN_AdapterSoftwareIdentity"};
    const auto small = callsPerGet(s, R"({"generate": {"fcHbas": 1, "cnas": 1,
        "portsPerAdapter": 2, "targetsPerPort": 2, "lunsPerTarget": 2,
        "tapeTargetsPerPort": 1, "initiatorsPerPort": 1}})",
                                   classes);
    const auto large = callsPerGet(s, R"({"generate": {"fcHbas": 4, "cnas": 3,
        "portsPerAdapter": 4, "targetsPerPort": 16, "lunsPerTarget": 16,
        "tapeTargetsPerPort": 4, "initiatorsPerPort": 2}})",
                                   classes);
    ASSERT_EQ(small.size(), classes.size());
    for (size_t i = 0; i < classes.size(); i++) {
        SCOPED_TRACE(classes[i]);
        EXPECT_EQ(small[i], large[i]);
        EXPECT_LE(small[i], 8u);
    }
    tvrn_sim_reset();
}

}  // namespace

namespace {

// ---- associations from one object --------------------------------------------------

std::vector<std::string> associationClasses(Module_Session& s) {
    std::vector<std::string> out;
    for (const tvrnhost::Registration& r : s.host().registrations())
        if (r.kinds & tvrnhost::kAssociationMI)
            out.push_back(r.className);
    return out;
}

// The reference properties of an association instance, in order.
std::vector<const tvrnhost::Property*> referencesOf(const Instance& association) {
    std::vector<const tvrnhost::Property*> out;
    for (const tvrnhost::Property& p : association.properties())
        if (p.value.type() == tvrnhost::Type::Reference && !p.value.isNull())
            out.push_back(&p);
    return out;
}

struct Request {
    std::string role, resultClass, resultRole;
};

struct Expected {
    std::vector<std::string> referencePaths;  // of the association instances, in order
    std::vector<std::string> references;      // the association instances, whole
    std::vector<std::string> associators;     // object paths of the other ends, in order
};

// What enumerating the association and keeping the instances that refer to
// `source` gives. "CIM_ManagedElement" stands for any result class.
Expected filtered(const std::vector<Instance>& all, const ObjectPath& source, const Request& r) {
    Expected e;
    for (const Instance& a : all) {
        bool refers = false;
        for (const tvrnhost::Property* p : referencesOf(a))
            if ((r.role.empty() || tvrnhost::equalsIgnoreCase(p->name, r.role)) &&
                p->value.asReference().identifies(source))
                refers = true;
        if (!refers)
            continue;
        e.referencePaths.push_back(a.path().toString());
        e.references.push_back(a.toString());
        for (const tvrnhost::Property* p : referencesOf(a)) {
            const ObjectPath& end = p->value.asReference();
            if (end.identifies(source) ||
                (!r.resultRole.empty() && !tvrnhost::equalsIgnoreCase(p->name, r.resultRole)) ||
                (!r.resultClass.empty() && r.resultClass != "CIM_ManagedElement" &&
                 !tvrnhost::equalsIgnoreCase(end.className(), r.resultClass)))
                continue;
            e.associators.push_back(end.toString());
        }
    }
    return e;
}

template <class T>
std::vector<std::string> texts(const std::vector<T>& items) {
    std::vector<std::string> out;
    for (const T& i : items)
        out.push_back(i.toString());
    return out;
}

// The whole instances of the classes an association refers to, by path.
class Ends {
public:
    explicit Ends(Module_Session& s) : _s(s) {}
    std::string whole(const ObjectPath& path) {
        if (_read.insert(path.className()).second)
            for (const Instance& i : _s.enumerate(path.className()).items)
                _byPath[i.path().toString()] = i.toString();
        return _byPath[path.toString()];
    }

private:
    Module_Session& _s;
    std::set<std::string> _read;
    std::map<std::string, std::string> _byPath;
};

// From `source`, rin and ain of every request, ri and ai of those without
// result filters, answer what enumerate-and-filter gives: the same
// association instances and the same ends, whole, in the same order.
void expectSameAsFiltering(Module_Session& s, Ends& ends, const std::string& association,
                           const std::vector<Instance>& all, const ObjectPath& source,
                           const std::vector<Request>& requests) {
    tvrnhost::Host& h = s.host();
    for (const Request& r : requests) {
        SCOPED_TRACE(association + " from " + source.toString() + " role " + r.role + " result " +
                     r.resultClass + " " + r.resultRole);
        const Expected e = filtered(all, source, r);
        Result<ObjectPath> ain =
            h.associatorNames(source, association, r.resultClass, r.role, r.resultRole);
        ASSERT_TRUE(ain.ok()) << ain.toString();
        EXPECT_EQ(texts(ain.items), e.associators);
        if (!r.resultClass.empty() || !r.resultRole.empty())
            continue;
        Result<ObjectPath> rin = h.referenceNames(source, association, r.role);
        ASSERT_TRUE(rin.ok()) << rin.toString();
        EXPECT_EQ(texts(rin.items), e.referencePaths);
        Result<Instance> ri = h.references(source, association, r.role);
        ASSERT_TRUE(ri.ok()) << ri.toString();
        EXPECT_EQ(texts(ri.items), e.references);
        Result<Instance> ai = h.associators(source, association, "", r.role);
        ASSERT_TRUE(ai.ok()) << ai.toString();
        std::vector<std::string> whole;
        for (const std::string& end : e.associators)
            whole.push_back(ends.whole(s.path(end)));
        EXPECT_EQ(texts(ai.items), whole);
    }
}

// Every association, from every object of every class it refers to (and
// from the host): every role, and associator names narrowed by each result
// role and result class.
TEST(ScopedAssociations, EveryAssociationFromEveryObjectAnswersWhatFilteringGives) {
    Module_Session& s = Module_Session::open("default", "ERR");
    ASSERT_TRUE(s.loaded());
    Ends ends(s);
    size_t associations = 0, sources = 0;
    for (const std::string& association : associationClasses(s)) {
        Result<Instance> all = s.enumerate(association);
        ASSERT_TRUE(all.ok()) << association << ": " << all.toString();
        std::vector<std::string> roles, classes = {"TAVRIN_ComputerSystem"};
        for (const Instance& a : all.items)
            for (const tvrnhost::Property* p : referencesOf(a)) {
                if (std::find(roles.begin(), roles.end(), p->name) == roles.end())
                    roles.push_back(p->name);
                const std::string& c = p->value.asReference().className();
                if (std::find(classes.begin(), classes.end(), c) == classes.end())
                    classes.push_back(c);
            }
        if (all.items.empty())
            continue;
        associations++;
        std::vector<Request> requests = {{"", "", ""}, {"", "CIM_ManagedElement", ""}};
        for (const std::string& role : roles) {
            requests.push_back({role, "", ""});
            requests.push_back({"", "", role});
        }
        for (const std::string& c : classes)
            requests.push_back({"", c, ""});
        for (const std::string& className : classes)
            for (const ObjectPath& source : s.enumerateNames(className).items) {
                expectSameAsFiltering(s, ends, association, all.items, source, requests);
                sources++;
            }
    }
    // Every inventory association has instances on this host (the diagnostic
    // ones have none until a test runs).
    EXPECT_GE(associations, 33u);
    EXPECT_GT(sources, 0u);
}

}  // namespace
