#include <gtest/gtest.h>

#include <map>

#include "gateway/ProviderUtil.h"
#include "tests/gateway/BoundFake.h"

using namespace CPTA;
using gwtest::LogCapture;
using gwtest::parseJson;

namespace {

const char kWwn[] = "10:00:00:05:33:a0:b1:c2";
const char kMac[] = "00:05:33:aa:bb:cc";

class AdapterLookup : public ::testing::Test {
protected:
    void SetUp() override {
        fake = &gwtest::boundFake();
        setAdapterList(R"({"indexStrings": ["10:00:00:05:33:a0:b1:c2", "00:05:33:aa:bb:cc"]})");
        setRecord(kWwn, R"({"hbaData": {"model": "Tavrin-K7M", "serialNumber": "SN100",
            "oemSerialNum": "ABC123456", "partNum": "ABC", "isCNA": false, "hasEthPort": false},
            "driver": {"storageDriverVersion": "  3.2.1.0  ", "networkDriverVersion": "9.9"}})");
        setRecord(kMac, R"({"hbaData": {"model": "Tavrin-1860", "serialNumber": "SN200",
            "oemSerialNum": "", "partNum": "P", "isCNA": true, "hasEthPort": true}, "driver": {}})");
        fake->on("getAdapterId", [](const Json::Value& request) {
            std::string key = request["indexStr"].asString();
            return parseJson(key == kWwn ? R"({"adapterId": 1})"
                             : key == kMac ? R"({"adapterId": 2})" : R"({"error": "unknown"})");
        });
        LogCapture::get().mark();
    }

    void setAdapterList(const std::string& json) {
        Json::Value list = json.empty() ? Json::Value() : parseJson(json);
        fake->on("getAllAdaptersIndexString", [list](const Json::Value&) { return list; });
    }
    // The getHbaByWwn answer for one key (empty text: no such adapter).
    void setRecord(const std::string& key, const std::string& json) {
        if (json.empty())
            records.erase(key);
        else
            records[key] = parseJson(json);
        auto copy = records;
        fake->on("getHbaByWwn", [copy](const Json::Value& request) {
            auto it = copy.find(request[request.isMember("mac") ? "mac" : "wwn"].asString());
            return it != copy.end() ? it->second : Json::Value();
        });
    }
    bool logged(const char* level, const std::string& text) { return LogCapture::get().has(level, text); }

    gwtest::FakeLibrary* fake = nullptr;
    std::map<std::string, Json::Value> records;
};

TEST_F(AdapterLookup, AdapterListAndNumbers) {
    Json::Value list;
    EXPECT_EQ(ProviderUtil::getNumberOfAdapters(list), 2);
    EXPECT_TRUE(fake->lastRequest("getAllAdaptersIndexString").isNull());
    EXPECT_TRUE(logged("INFO", "Number of Adapters: 2"));
    EXPECT_STREQ(ProviderUtil::getAddrByAdapterId(1).c_str(), kWwn);
    EXPECT_STREQ(ProviderUtil::getAddrByAdapterId(2).c_str(), kMac);
    EXPECT_STREQ(ProviderUtil::getAddrByAdapterId(0).c_str(), "");
    EXPECT_TRUE(logged("INFO", "numOfAdapters = 2. Id = 0"));
    EXPECT_STREQ(ProviderUtil::getAddrByAdapterId(3).c_str(), "");

    for (const char* json : {"", R"({"error": "gone"})", R"({"indexStrings": "x"})"}) {
        LogCapture::get().mark();
        setAdapterList(json);
        EXPECT_EQ(ProviderUtil::getNumberOfAdapters(list), -1) << json;
        EXPECT_STREQ(ProviderUtil::getAddrByAdapterId(1).c_str(), "") << json;
        EXPECT_EQ(LogCapture::get().count("ERR", "libGetAllAdaptersIndexString returns NULL."), 2);
    }
}

TEST_F(AdapterLookup, DetailsAskByMacOrWwnAndNeedBothParts) {
    Json::Value details;
    ASSERT_EQ(ProviderUtil::getAdapterDetails("1000000533a0b1c2", details), 0);
    EXPECT_EQ(fake->lastRequest("getHbaByWwn"), parseJson(R"({"wwn": "10:00:00:05:33:a0:b1:c2"})"));
    EXPECT_EQ(details["hbaData"]["model"].asString(), "Tavrin-K7M");
    ASSERT_EQ(ProviderUtil::getAdapterDetails("000533aabbcc", details), 0);
    EXPECT_EQ(fake->lastRequest("getHbaByWwn"), parseJson(R"({"mac": "00:05:33:aa:bb:cc"})"));

    setRecord(kWwn, R"({"hbaData": {"model": "x"}})");
    setRecord(kMac, R"({"hbaData": "x", "driver": {}})");
    EXPECT_EQ(ProviderUtil::getAdapterDetails(kWwn, details), -1);
    EXPECT_EQ(ProviderUtil::getAdapterDetails(kMac, details), -1);
    EXPECT_TRUE(logged("ERR", "Unable to get adapater details for 00:05:33:aa:bb:cc"));
}

TEST_F(AdapterLookup, LibraryExceptionsStopAtTheDetails) {
    fake->on("getHbaByWwn", [](const Json::Value&) -> Json::Value { throw HbaAgentError(7, "busy"); });
    EXPECT_STREQ(ProviderUtil::getAdapterSerialNumber(kWwn).c_str(), "");
    EXPECT_TRUE(logged("ERR", "10:00:00:05:33:a0:b1:c2 - libGetHbaByWwn got User exception 7: busy"));
    EXPECT_TRUE(logged("ERR", "Unable to get Adapter info for 10:00:00:05:33:a0:b1:c2"));
    fake->on("getHbaByWwn", [](const Json::Value&) -> Json::Value { throw 3; });
    EXPECT_FALSE(ProviderUtil::isCNA(kWwn));
    EXPECT_TRUE(logged("ERR", "10:00:00:05:33:a0:b1:c2 - libGetHbaByWwn got default exception"));
}

TEST_F(AdapterLookup, SerialNumberOemRule) {
    EXPECT_STREQ(ProviderUtil::getAdapterSerialNumber(kWwn).c_str(), "123456");
    EXPECT_STREQ(ProviderUtil::getAdapterSerialNumber(kMac).c_str(), "SN200");  // empty OEM number
    setRecord(kWwn, R"({"hbaData": {"oemSerialNum": "XYZ9", "partNum": "ABC"}, "driver": {}})");
    EXPECT_STREQ(ProviderUtil::getAdapterSerialNumber(kWwn).c_str(), "XYZ9");
}

TEST_F(AdapterLookup, ModelPresence) {
    EXPECT_TRUE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-K7M"));
    EXPECT_TRUE(logged("INFO", "Found the Adapter"));
    EXPECT_TRUE(ProviderUtil::checkIfThisAdapterModelPresent("tavrin-1860"));    // any case
    EXPECT_TRUE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-K7M-2P"));  // adapter model is a prefix
    EXPECT_FALSE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-K7"));

    setRecord(kWwn, "");  // an unreadable first adapter does not hide the second
    EXPECT_TRUE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-1860"));
    EXPECT_TRUE(logged("INFO", "Unable to get Adapter info 1 - 10:00:00:05:33:a0:b1:c2"));
    setRecord(kMac, R"({"hbaData": {"model": ""}, "driver": {}})");  // no model matches nothing
    EXPECT_FALSE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-1860"));

    setAdapterList(R"({"indexStrings": []})");
    EXPECT_FALSE(ProviderUtil::checkIfThisAdapterModelPresent("Tavrin-K7M"));
    EXPECT_TRUE(logged("WARN", "No adapters in the system!"));
}

TEST_F(AdapterLookup, CnaAndEthernetFlags) {
    EXPECT_FALSE(ProviderUtil::isCNA("1000000533a0b1c2"));
    EXPECT_TRUE(ProviderUtil::isCNA("000533aabbcc"));
    EXPECT_TRUE(ProviderUtil::hasEthernetPort(kMac));
    EXPECT_TRUE(logged("INFO", "isCNA = 1"));
    EXPECT_TRUE(logged("INFO", "ethFlag = 1"));
    setRecord(kMac, R"({"hbaData": {"isCNA": "yes"}, "driver": {}})");
    EXPECT_FALSE(ProviderUtil::isCNA(kMac));
    EXPECT_FALSE(ProviderUtil::hasEthernetPort(kMac));
    EXPECT_TRUE(logged("ERR", "Unable to get CNA info for 00:05:33:aa:bb:cc"));
    EXPECT_TRUE(logged("ERR", "Unable to get Ethernet info 00:05:33:aa:bb:cc"));
}

TEST_F(AdapterLookup, DriverVersionOfTheFirstAdapter) {
    EXPECT_STREQ(ProviderUtil::getDriverVersion().c_str(), "3.2.1.0");
    EXPECT_TRUE(logged("INFO", "Driver version is 3.2.1.0"));
    setRecord(kWwn, R"({"hbaData": {}, "driver": {"storageDriverVersion": 3, "networkDriverVersion": " 2.0"}})");
    EXPECT_STREQ(ProviderUtil::getDriverVersion().c_str(), "2.0");
    setRecord(kWwn, R"({"hbaData": {}, "driver": {}})");
    EXPECT_STREQ(ProviderUtil::getDriverVersion().c_str(), "");
    EXPECT_TRUE(logged("ERR", "Unable to get driver version for 10:00:00:05:33:a0:b1:c2"));
    setRecord(kWwn, R"({"hbaData": {}, "driver": {"storageDriverVersion": ")" + std::string(99, '7') + "\"}}");
    EXPECT_EQ(ProviderUtil::getDriverVersion().size(), 63u);
}

TEST_F(AdapterLookup, AdapterIdByAddressLength) {
    EXPECT_EQ(ProviderUtil::getAdapterId("1000000533a0b1c2"), 1);
    EXPECT_EQ(fake->lastRequest("getAdapterId"), parseJson(R"({"indexStr": "10:00:00:05:33:a0:b1:c2"})"));
    EXPECT_EQ(ProviderUtil::getAdapterId("000533aabbcc"), 2);
    EXPECT_EQ(ProviderUtil::getAdapterId(kMac), -1);  // the colon form is not looked up
    EXPECT_TRUE(logged("ERR", "The address passed is not MAC or WWN"));
    EXPECT_EQ(fake->calls("getAdapterId"), 2);
    EXPECT_EQ(ProviderUtil::getAdapterId("000533000001"), -1);
    EXPECT_TRUE(logged("ERR", "libGetAdapterId returns NULL."));
}

}  // namespace
