// Get-instance by keys: the same answer as enumerating the class and
// comparing keys, for every object of every shipped fixture; a key that names
// nothing is not found; and a get asks the library as much on a large host as
// on a small one.
#include <cmpidt.h>
#include <gtest/gtest.h>

#include <string>
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

// Every path that enumerating the names of each class gives (at most
// `perClass`, spread over the list, and only the instance classes when
// `withAssociations` is false) gets the instance that enumeration gives.
void expectGetsEqualEnumeration(const std::string& fixture, size_t perClass,
                                bool withAssociations) {
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
        const size_t step = names.items.size() > perClass ? names.items.size() / perClass : 1;
        for (size_t i = 0; i < names.items.size(); i += step) {
            const size_t at = i + step >= names.items.size() ? names.items.size() - 1 : i;
            // The first instance that the path names, as enumerate-and-filter keeps.
            const Instance* expected = nullptr;
            for (const Instance& instance : all.items)
                if (instance.path().identifies(names.items[at])) {
                    expected = &instance;
                    break;
                }
            ASSERT_NE(expected, nullptr) << names.items[at].toString();
            InstanceResult got = s.get(names.items[at]);
            ASSERT_TRUE(got.ok()) << names.items[at].toString() << ": " << got.toString();
            EXPECT_EQ(got.instance.toString(), expected->toString());
            checked++;
            if (at == names.items.size() - 1)
                break;
        }
    }
    EXPECT_GT(checked, 0u);
}

TEST(LookupEquivalence, EveryPathOfEverySmallFixtureGetsWhatEnumerationGives) {
    for (const char* fixture : {"default", "variants", "alerts", "empty"})
        expectGetsEqualEnumeration(fixture, size_t(-1), true);
}

// 23,040 LUNs: a spread of each instance class (the associations still get
// through their enumeration, which the small fixtures cover).
TEST(LookupEquivalence, ASpreadOfTheLargeSanGetsWhatEnumerationGives) {
    expectGetsEqualEnumeration("large-san", 16, false);
}

std::string devicePath(const std::string& className, const std::string& deviceId,
                       const std::string& systemName = "<host>") {
    return className + ".CreationClassName=\"" + className + "\",DeviceID=\"" + deviceId +
           "\",SystemCreationClassName=\"TAVRIN_ComputerSystem\",SystemName=\"" + systemName + "\"";
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

TEST(Lookup, AGetAsksTheLibraryAsMuchOnALargeHostAsOnASmallOne) {
    Module_Session& s = Module_Session::open();
    ASSERT_TRUE(s.loaded());
    const std::vector<std::string> classes = {"TAVRIN_StorageExtent",       "TAVRIN_LogicalDisk",
                                              "TAVRIN_TapeDrive",           "TAVRIN_FCPort",
                                              "TAVRIN_PortController",      "TAVRIN_EthernetPort",
                                              "TAVRIN_SCSIProtocolEndpoint"};
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

struct Expected {
    std::vector<std::string> references;   // object paths, in order
    std::vector<std::string> associators;  // object paths of the other ends, in order
};

// What enumerating the association and keeping the instances that refer to
// `source` (through `role`, when given) gives.
Expected filtered(const std::vector<Instance>& all, const ObjectPath& source,
                  const std::string& role) {
    Expected e;
    for (const Instance& a : all) {
        bool refers = false;
        for (const tvrnhost::Property& p : a.properties())
            if (p.value.type() == tvrnhost::Type::Reference && !p.value.isNull() &&
                (role.empty() || tvrnhost::equalsIgnoreCase(p.name, role)) &&
                p.value.asReference().identifies(source))
                refers = true;
        if (!refers)
            continue;
        e.references.push_back(a.path().toString());
        for (const tvrnhost::Property& p : a.properties())
            if (p.value.type() == tvrnhost::Type::Reference && !p.value.isNull() &&
                !p.value.asReference().identifies(source))
                e.associators.push_back(p.value.asReference().toString());
    }
    return e;
}

std::vector<std::string> pathTexts(const std::vector<ObjectPath>& paths) {
    std::vector<std::string> out;
    for (const ObjectPath& p : paths)
        out.push_back(p.toString());
    return out;
}

std::vector<std::string> pathTexts(const std::vector<Instance>& instances) {
    std::vector<std::string> out;
    for (const Instance& i : instances)
        out.push_back(i.path().toString());
    return out;
}

// From every object of the classes an association refers to (and one of a
// class it does not), ai, ain, ri and rin answer what enumerate-and-filter
// answers, in the same order.
void expectAssociationsEqualFiltering(const std::string& association,
                                      const std::vector<std::string>& endClasses,
                                      const std::vector<std::string>& roles) {
    Module_Session& s = Module_Session::open("default", "ERR");
    ASSERT_TRUE(s.loaded());
    tvrnhost::Host& h = s.host();
    Result<Instance> all = s.enumerate(association);
    ASSERT_TRUE(all.ok()) << all.toString();
    ASSERT_FALSE(all.items.empty());
    for (const std::string& className : endClasses) {
        for (const ObjectPath& source : s.enumerateNames(className).items) {
            for (const std::string& role : roles) {
                SCOPED_TRACE(association + " from " + source.toString() + " role " + role);
                const Expected e = filtered(all.items, source, role);
                Result<ObjectPath> rin = h.referenceNames(source, association, role);
                ASSERT_TRUE(rin.ok()) << rin.toString();
                EXPECT_EQ(pathTexts(rin.items), e.references);
                Result<Instance> ri = h.references(source, association, role);
                ASSERT_TRUE(ri.ok()) << ri.toString();
                EXPECT_EQ(pathTexts(ri.items), e.references);
                Result<ObjectPath> ain = h.associatorNames(source, association, "", role);
                ASSERT_TRUE(ain.ok()) << ain.toString();
                EXPECT_EQ(pathTexts(ain.items), e.associators);
                Result<Instance> ai = h.associators(source, association, "", role);
                ASSERT_TRUE(ai.ok()) << ai.toString();
                EXPECT_EQ(pathTexts(ai.items), e.associators);
            }
        }
    }
}

TEST(ScopedAssociations, LunPathsFromEachEndAnswerWhatFilteringGives) {
    expectAssociationsEqualFiltering("TAVRIN_SCSIInitiatorTargetLogicalUnitPath",
                                     {"TAVRIN_SCSIProtocolEndpoint", "TAVRIN_StorageExtent",
                                      "TAVRIN_TapeDrive", "TAVRIN_FCPort"},
                                     {"", "Initiator", "Target", "LogicalUnit"});
}

}  // namespace

namespace {

TEST(ScopedAssociations, TheObjectsOfOnePortAnswerWhatFilteringGives) {
    const std::vector<std::string> ends = {"TAVRIN_FCPort", "TAVRIN_FCPortStatistics",
                                           "TAVRIN_AlarmDevice", "TAVRIN_SCSIProtocolEndpoint",
                                           "TAVRIN_PortController"};
    expectAssociationsEqualFiltering("TAVRIN_ElementStatisticalData", ends,
                                     {"", "ManagedElement", "Stats"});
    expectAssociationsEqualFiltering("TAVRIN_AssociatedAlarm", ends,
                                     {"", "Antecedent", "Dependent"});
    expectAssociationsEqualFiltering("TAVRIN_DeviceSAPImplementation", ends,
                                     {"", "Antecedent", "Dependent"});
}

}  // namespace
