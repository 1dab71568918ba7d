// The computer system and the inventory instance providers of
// libtvrnprovider.so, through the embedded host on the adapter-library
// simulator. Whole instances are in the golden files (tests/golden/); these
// tests hold what the golden files cannot say by themselves.
#include <cmpidt.h>
#include <gtest/gtest.h>

#include <set>
#include <string>
#include <vector>

#include "tests/e2e/Module_Session.h"

using namespace tvrne2e;
using tvrnhost::Value;

namespace {

struct Inventory_Class {
    const char* name;
    size_t onDefaultHost;     // instances of the simulator's built-in host
    const char* noInstances;  // what its provider logs when there are none
};

const Inventory_Class kClasses[] = {
    {"TAVRIN_ComputerSystem", 1, nullptr},
    {"TAVRIN_PortController", 3, "No Adapter Found!"},
    {"TAVRIN_FCPort", 6, "No FC Ports Found!"},
    {"TAVRIN_SCSIProtocolEndpoint", 11, "No FC Ports Found!"},
    {"TAVRIN_FCPortStatistics", 6, "No FC Ports Found!"},
    {"TAVRIN_PhysicalPackage", 3, "No Adapter Found!"},
    {"TAVRIN_Product", 3, "No Adapter Found!"},
    {"TAVRIN_AdapterSoftwareIdentity", 8, "No Adapter Found!"},
    {"TAVRIN_StorageExtent", 11, "No StorageExtents Found!"},
    {"TAVRIN_TapeDrive", 3, "No TapeDrives Found!"},
    {"TAVRIN_EthernetPort", 2, "Error: Invalid mapping information"},
    {"TAVRIN_LogicalPortGroup", 6, "No Logical Port Groups found!"},
    {"TAVRIN_LANEndpoint", 2, "No Ethernet Port Found"},
    {"TAVRIN_PhysicalConnector", 5, "No Connector Found!"},
    {"TAVRIN_AlarmDevice", 6, "Invalid number of Instances returned"},
    {"TAVRIN_LogicalDisk", 11, "No LogicalDisks Found!"},
};

std::string text(const Instance& i, const char* property) {
    const Value* v = i.get(property);
    return v == nullptr || v->isNull() ? "NULL" : v->asString();
}

// An integer property; -1 for null or absent.
long long number(const Instance& i, const char* property) {
    const Value* v = i.get(property);
    return v == nullptr || v->isNull() ? -1 : (long long)v->asUint();
}

const Instance* find(const std::vector<Instance>& items, const char* property,
                     const std::string& value) {
    for (const Instance& i : items)
        if (text(i, property) == value)
            return &i;
    return nullptr;
}

std::vector<Instance> all(Module_Session& s, const char* className) {
    Result<Instance> r = s.enumerate(className);
    EXPECT_TRUE(r.ok()) << className << ": " << r.toString();
    return r.items;
}

std::string devicePath(const char* className, const std::string& deviceId,
                       const std::string& systemName = "<host>") {
    return std::string(className) + ".CreationClassName=\"" + className + "\",DeviceID=\"" +
           deviceId + "\",SystemCreationClassName=\"TAVRIN_ComputerSystem\",SystemName=\"" +
           systemName + "\"";
}

TEST(Inventory, WithoutAdaptersEveryProviderSucceedsEmptyAndSaysSoOnce) {
    Module_Session& s = Module_Session::open("empty");
    ASSERT_TRUE(s.loaded());
    EXPECT_EQ(s.enumerate("TAVRIN_ComputerSystem").items.size(), 1u);
    for (const Inventory_Class& c : kClasses) {
        if (c.noInstances == nullptr)
            continue;
        SCOPED_TRACE(c.name);
        s.markLog();
        Result<Instance> got = s.enumerate(c.name);
        EXPECT_TRUE(got.ok()) << got.toString();
        EXPECT_TRUE(got.items.empty());
        // Told once, by the provider itself.
        std::vector<std::string> told;
        for (const std::string& line : s.logLines())
            if (line.find(c.noInstances) != std::string::npos)
                told.push_back(line);
        ASSERT_EQ(told.size(), 1u) << c.noInstances;
        EXPECT_NE(told[0].find(std::string(c.name) + "_Provider.cpp"), std::string::npos)
            << told[0];
        EXPECT_EQ(s.logCount("Returning instances"), 0u);
    }
}

TEST(FCPort, GetByItsFourKeysAsksOnlyForThatPort) {
    Module_Session& s = Module_Session::open();
    ASSERT_TRUE(s.loaded());
    InstanceResult got = s.get(s.path(devicePath("TAVRIN_FCPort", "100000051e5c6d70")));
    ASSERT_TRUE(got.ok()) << got.toString();
    EXPECT_EQ(text(got.instance, "DeviceID"), "100000051e5c6d70");
    EXPECT_EQ(s.calls("getPortByWwn"), 1u);
    for (const std::string& path :
         {devicePath("TAVRIN_FCPort", "100000051e5c6d70", "some-other-host"),
          devicePath("TAVRIN_FCPort", "10:00:00:05:1e:5c:6d:70")})
        EXPECT_EQ(s.get(s.path(path)).rc, CMPI_RC_ERR_NOT_FOUND) << path;
}

// What each LUN becomes is in tests/golden/storage.golden; what is not said there:
TEST(StorageExtent, ALunWithoutProductIdIsLeftOutAndSaidSo) {
    Module_Session& s = Module_Session::open();
    const std::string target = "100000051e5c6d70_500601603ba01234_";  // LUNs 0 to 5, 3 without
    size_t behind = 0;
    for (const Instance& e : all(s, "TAVRIN_StorageExtent"))
        behind += text(e, "DeviceID").compare(0, target.size(), target) == 0;
    EXPECT_EQ(behind, 5u);
    EXPECT_EQ(s.logCount("LUN info is NOT available"), 1u);
}

MethodResult setAlarmState(Module_Session& s, const std::string& deviceId, unsigned state) {
    return s.invoke(s.path(devicePath("TAVRIN_AlarmDevice", deviceId)), "SetAlarmState",
                    {{"RequestedAlarmState", Value::uint16(std::uint16_t(state))}});
}

long long alarmState(Module_Session& s, const std::string& deviceId) {
    std::vector<Instance> alarms = all(s, "TAVRIN_AlarmDevice");
    const Instance* a = find(alarms, "DeviceID", deviceId);
    return a == nullptr ? -2 : number(*a, "AlarmState");
}

TEST(AlarmDevice, SetAlarmStateSwitchesTheBeaconAndTellsHowItWent) {
    Module_Session& s = Module_Session::open();
    ASSERT_TRUE(s.loaded());
    const std::string port = "100000051e0a0b0c";
    ASSERT_EQ(alarmState(s, port), 1);
    struct Step {
        unsigned state;
        long long returnValue;
        unsigned long long sets;  // setPortByWwn calls
        long long alarmStateAfter;
    } steps[] = {
        {3, 0, 1, 3},  // on
        {3, 2, 0, 3},  // already on: the adapter is not asked to change
        {1, 0, 1, 1},  // off
        {2, 2, 0, 1},  // not a state the beacon has
    };
    for (const Step& step : steps) {
        SCOPED_TRACE("State " + std::to_string(step.state));
        s.resetCounters();
        s.markLog();
        MethodResult r = setAlarmState(s, port, step.state);
        ASSERT_TRUE(r.ok()) << r.toString();
        EXPECT_EQ((long long)r.returnValue.asUint(), step.returnValue);
        EXPECT_EQ(s.calls("setPortByWwn"), step.sets);
        if (step.state == 2) {
            EXPECT_EQ(s.totalCalls(), 0u);
            EXPECT_EQ(s.logCount("Error: Invalid Input State"), 1u);
        } else {
            EXPECT_EQ(s.logCount("return value = " + std::to_string(step.returnValue)), 1u);
        }
        EXPECT_EQ(alarmState(s, port), step.alarmStateAfter);
    }
    // A port the library does not know.
    MethodResult unknown = setAlarmState(s, "100000051e0a0bff", 3);
    ASSERT_TRUE(unknown.ok()) << unknown.toString();
    EXPECT_EQ(unknown.returnValue.asUint(), 2u);
}

TEST(AlarmDevice, AMezzanineAdapterHasNoBeaconToSwitch) {
    Module_Session& s = Module_Session::open("variants");
    ASSERT_TRUE(s.loaded());
    const std::string mezzaninePort = "100000051e7e8f90";
    EXPECT_EQ(alarmState(s, mezzaninePort), -2) << "no alarm device for a mezzanine port";
    MethodResult r = setAlarmState(s, mezzaninePort, 3);
    ASSERT_TRUE(r.ok()) << r.toString();
    EXPECT_EQ(r.returnValue.asUint(), 1u);
    EXPECT_EQ(s.calls("setPortByWwn"), 0u);
}

}  // namespace
