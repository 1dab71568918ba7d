// The binding and the adapter look-ups against the simulator's built-in host:
// Tavrin-825 (FC), an HP OEM Tavrin-1860 (FC) and a Tavrin-1020 CNA.
#include <gtest/gtest.h>

#include <dlfcn.h>

#include "gateway/CIMProviderTfaj.h"
#include "gateway/ProviderUtil.h"
#include "simulator/SimControl.h"
#include "tests/gateway/BoundSimulator.h"

using namespace CPTA;
using gwtest::LogCapture;

namespace {

const char kFc[] = "20:00:00:05:1e:0a:0b:0c";  // adapter 1
const char kFcRaw[] = "200000051e0a0b0c";
const char kHp[] = "20:00:00:05:1e:5c:6d:70";  // adapter 2
const char kHpRaw[] = "200000051e5c6d70";
const char kCna[] = "00:05:1e:8a:4b:00";  // adapter 3
const char kCnaRaw[] = "00051e8a4b00";

Json::Value keyed(const char* member, const char* key) {
    Json::Value v(Json::objectValue);
    v[member] = key;
    return v;
}

class AdapterLookup : public ::testing::Test {
protected:
    void SetUp() override {
        sim = &gwtest::boundSimulator();
        LogCapture::get().mark();
    }
    static bool logged(const char* level, const std::string& text) {
        return LogCapture::get().has(level, text);
    }

    gwtest::SimLibrary* sim = nullptr;
};

TEST(Binding, EveryEntryPointResolvesIntoTheLibraryOnce) {
    gwtest::SimLibrary& sim = gwtest::boundSimulator();
    setupDLLEntryPoints();  // a second call changes nothing
    EXPECT_EQ(libHandle, sim.handle());
#define ENTRY_POINT(kind, symbol, pointer)                                              \
    {                                                                                   \
        Dl_info info;                                                                   \
        ASSERT_NE(dladdr(reinterpret_cast<const void*>(pointer), &info), 0) << #symbol; \
        EXPECT_EQ(sim.path(), info.dli_fname) << #symbol;                               \
        EXPECT_STREQ(info.dli_sname, #symbol);                                          \
    }
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
}

TEST_F(AdapterLookup, AdapterListAndNumbers) {
    Json::Value list;
    EXPECT_EQ(ProviderUtil::getNumberOfAdapters(list), 3);
    EXPECT_STREQ(ProviderUtil::getAddrByAdapterId(3).c_str(), kCna);
    EXPECT_STREQ(ProviderUtil::getAddrByAdapterId(0).c_str(), "");
    EXPECT_STREQ(ProviderUtil::getAddrByAdapterId(4).c_str(), "");

    // An unusable list: no answer, an error, "indexStrings" not an array.
    const std::pair<int, const char*> faults[] = {{TVRN_SIM_FAULT_NULL_ANSWER, nullptr},
                                                  {TVRN_SIM_FAULT_ERROR_OBJECT, "gone"},
                                                  {TVRN_SIM_FAULT_WRONG_TYPE, "indexStrings"}};
    for (const auto& f : faults) {
        sim->reset();
        sim->setFault("getAllAdaptersIndexString", nullptr, f.first, 0, f.second);
        LogCapture::get().mark();
        EXPECT_EQ(ProviderUtil::getNumberOfAdapters(list), -1) << f.first;
        EXPECT_STREQ(ProviderUtil::getAddrByAdapterId(1).c_str(), "") << f.first;
        EXPECT_EQ(LogCapture::get().count("ERR", "libGetAllAdaptersIndexString returns NULL."), 2)
            << f.first;
    }
}

TEST_F(AdapterLookup, DetailsAskByMacOrWwnAndNeedBothParts) {
    Json::Value details;
    ASSERT_EQ(ProviderUtil::getAdapterDetails(kFcRaw, details), 0);
    EXPECT_EQ(sim->lastRequest("getHbaByWwn"), keyed("wwn", kFc));
    ASSERT_EQ(ProviderUtil::getAdapterDetails(kCnaRaw, details), 0);
    EXPECT_EQ(sim->lastRequest("getHbaByWwn"), keyed("mac", kCna));
    EXPECT_EQ(details["hbaData"]["model"].asString(), "Tavrin-1020");

    sim->setFault("getHbaByWwn", kFc, TVRN_SIM_FAULT_DROP_MEMBER, 0, "driver");
    sim->setFault("getHbaByWwn", kHp, TVRN_SIM_FAULT_WRONG_TYPE, 0, "hbaData");
    for (const char* key :
         {kFc, kHp, "20:00:00:05:1e:ff:ff:ff"}) {  // the last unknown: an error answer
        EXPECT_EQ(ProviderUtil::getAdapterDetails(key, details), -1) << key;
        EXPECT_TRUE(logged("ERR", std::string("Unable to get adapater details for ") + key));
    }
}

// Exceptions of the library stop at the details: each look-up built on them
// answers "not there". Each fault fires once.
TEST_F(AdapterLookup, LibraryExceptionsStopAtTheDetails) {
    sim->setFault("getHbaByWwn", nullptr, TVRN_SIM_FAULT_HBA_AGENT_ERROR, 7, "busy", 1);
    EXPECT_STREQ(ProviderUtil::getAdapterSerialNumber(kFc).c_str(), "");
    EXPECT_TRUE(logged("ERR", std::string(kFc) + " - libGetHbaByWwn got User exception 7: busy"));
    sim->setFault("getHbaByWwn", nullptr, TVRN_SIM_FAULT_STD_EXCEPTION, 0, "transport down", 1);
    EXPECT_FALSE(ProviderUtil::hasEthernetPort(kCna));
    sim->setFault("getHbaByWwn", nullptr, TVRN_SIM_FAULT_NON_STANDARD, 3, nullptr, 1);
    EXPECT_FALSE(ProviderUtil::isCNA(kCna));
    EXPECT_TRUE(ProviderUtil::isCNA(kCna));
    EXPECT_FALSE(ProviderUtil::isCNA(kFcRaw));
    EXPECT_FALSE(ProviderUtil::hasEthernetPort(kHpRaw));
    // A flag of the wrong type, or missing, is "no".
    sim->setFault("getHbaByWwn", kCna, TVRN_SIM_FAULT_WRONG_TYPE, 0, "hbaData.isCNA", 1);
    EXPECT_FALSE(ProviderUtil::isCNA(kCna));
    sim->setFault("getHbaByWwn", kCna, TVRN_SIM_FAULT_DROP_MEMBER, 0, "hbaData.hasEthPort");
    EXPECT_FALSE(ProviderUtil::hasEthernetPort(kCna));
}

TEST_F(AdapterLookup, ModelPresence) {
    EXPECT_TRUE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-825"));
    EXPECT_EQ(sim->requests("getHbaByWwn").size(), 1u);  // stops at the first match
    EXPECT_TRUE(ProviderUtil::checkIfThisAdapterModelPresent("tavrin-1860"));  // any case
    EXPECT_TRUE(ProviderUtil::checkIfThisAdapterModelPresent(
        "Tavrin-1020-2P"));  // adapter model is a prefix
    EXPECT_FALSE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-82"));
    sim->setFault("getHbaByWwn", kFc, TVRN_SIM_FAULT_NULL_ANSWER);  // an unreadable first adapter
    EXPECT_TRUE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-1860"));
    sim->loadFixture("empty");
    EXPECT_FALSE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-825"));
    EXPECT_TRUE(logged("WARN", "No adapters in the system!"));
}

TEST_F(AdapterLookup, DriverVersionOfTheFirstAdapter) {
    EXPECT_STREQ(ProviderUtil::getDriverVersion().c_str(), "3.2.1.0");  // " 3.2.1.0 " trimmed
    EXPECT_EQ(sim->requests("getHbaByWwn"), std::vector<Json::Value>{keyed("wwn", kFc)});
    sim->setFault("getHbaByWwn", nullptr, TVRN_SIM_FAULT_DROP_MEMBER, 0,
                  "driver.storageDriverVersion");
    EXPECT_STREQ(ProviderUtil::getDriverVersion().c_str(), "");  // an FC HBA has no network driver

    // A first adapter with only a network driver, or an overlong version.
    sim->loadFixtureText(
        R"({"adapters": [{"hbaData": {"model": "Tavrin-1020", "hbaMAC": "00:05:1e:00:00:01"},
                                           "driver": {"networkDriverVersion": " 2.0 "}}]})");
    EXPECT_STREQ(ProviderUtil::getDriverVersion().c_str(), "2.0");
    sim->loadFixtureText(
        R"({"adapters": [{"hbaData": {"model": "Tavrin-825", "wwn": "20:00:00:05:1e:00:00:01"},
                                           "driver": {"storageDriverVersion": ")" +
        std::string(99, '7') + "\"}}]}");
    EXPECT_EQ(ProviderUtil::getDriverVersion().size(), 63u);
}

TEST_F(AdapterLookup, AdapterIdByAddressLength) {
    EXPECT_EQ(ProviderUtil::getAdapterId(kFcRaw), 1);
    EXPECT_EQ(sim->lastRequest("getAdapterId"), keyed("indexStr", kFc));
    EXPECT_EQ(ProviderUtil::getAdapterId(kCnaRaw), 3);
    EXPECT_EQ(ProviderUtil::getAdapterId(kCna), -1);  // the colon form is not looked up
    EXPECT_EQ(sim->calls("getAdapterId"), 2u);
    EXPECT_EQ(ProviderUtil::getAdapterId("00051e000001"), 0);  // the library's "no such adapter"
    sim->setFault("getAdapterId", nullptr, TVRN_SIM_FAULT_DROP_MEMBER, 0, "adapterId", 1);
    sim->setFault("getAdapterId", kFc, TVRN_SIM_FAULT_ERROR_OBJECT, 3, "gone", 1);
    EXPECT_EQ(ProviderUtil::getAdapterId(kHpRaw), -1);
    EXPECT_EQ(ProviderUtil::getAdapterId(kFcRaw), -1);
}

}  // namespace
