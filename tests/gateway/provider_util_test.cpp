// Provider utilities without the adapter library: address forms, class
// names and reading JSON answers.
#include <gtest/gtest.h>

#include <cstring>

#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "tests/gateway/TestSupport.h"

using namespace CPTA;
using gwtest::parseJson;

namespace {

TEST(AddressForms, ColonFormatAndTags) {
    auto colon = [](const char* s) {
        return std::string(ProviderUtil::getIndexInColonFormat(s).c_str());
    };
    EXPECT_EQ(colon("1000000533a0b1c2"), "10:00:00:05:33:a0:b1:c2");
    EXPECT_EQ(colon("12345"), "12:345");  // an odd last character stays with the last pair
    EXPECT_EQ(colon("123"), "123");
    EXPECT_STREQ(ProviderUtil::eraseColonsFromIndex("10:00:00:05:33:a0:b1:c2").c_str(),
                 "1000000533a0b1c2");
    // Characters 19..22 hold the node part, 24 on the rest.
    EXPECT_STREQ(ProviderUtil::getNodeMACOrWWNFromTag("Adapter-00001-Port-ABCD:12").c_str(),
                 "ABCD12");
    EXPECT_STREQ(ProviderUtil::getNodeMACOrWWNFromTag("short").c_str(), "");
}

// Exactly the expected number of hexadecimal digits, nothing else.
TEST(AddressForms, RawBytesAreStrictHex) {
    unsigned char wwn[9];
    wwn[8] = 0x5A;
    ASSERT_TRUE(ProviderUtil::getRawWWNFromStr("1000000533A0b1c2", wwn));
    const unsigned char expected[8] = {0x10, 0x00, 0x00, 0x05, 0x33, 0xa0, 0xb1, 0xc2};
    EXPECT_EQ(std::memcmp(wwn, expected, 8), 0);
    EXPECT_EQ(wwn[8], 0x5A);  // exactly eight bytes written

    unsigned char mac[6];
    EXPECT_TRUE(ProviderUtil::getRawMacFromStr("0005331aBbCc", mac));
    EXPECT_EQ(mac[5], 0xcc);
    for (const char* bad :
         {"0005331a", "00:05:33:1a:bb:cc", "0005331aBbCg", static_cast<const char*>(nullptr)})
        EXPECT_FALSE(ProviderUtil::getRawMacFromStr(bad, mac)) << (bad ? bad : "null");
}

TEST(ClassNames, OutOfRangeIsInvalid) {
    EXPECT_STREQ(ProviderUtil::getClassName(CID_FC_PORT).c_str(), "TAVRIN_FCPort");
    EXPECT_STREQ(ProviderUtil::getClassName(classId_t(39)).c_str(), "INVALID CLASS");
    EXPECT_STREQ(ProviderUtil::getClassName(classId_t(-1)).c_str(), "INVALID CLASS");
}

TEST(JsonAccess, WrongTypeCountsAsMissing) {
    Json::Value v = parseJson(R"({"name": "p0", "count": 12, "negative": -3, "big": 5000000000,
        "whole": 4.0, "ratio": 2.5, "flag": true, "list": [1], "nested": {"a": "b"},
        "countText": "12", "flagNumber": 1, "none": null})");
    EXPECT_EQ(jsonInt(v, "whole"), 4);  // an integral real fits an int
    EXPECT_EQ(jsonUInt64(v, "big"), 5000000000ull);
    EXPECT_STREQ(jsonString(jsonObject(v, "nested"), "a").c_str(), "b");

    EXPECT_EQ(jsonInt(v, "countText", -1), -1);
    EXPECT_EQ(jsonInt(v, "ratio", -1), -1);
    EXPECT_EQ(jsonInt(v, "big", -1), -1);  // does not fit
    EXPECT_EQ(jsonUInt(v, "negative", 9), 9u);
    EXPECT_EQ(jsonInt(v, "flag", -1), -1);    // booleans are not numbers...
    EXPECT_FALSE(jsonBool(v, "flagNumber"));  // ...nor numbers booleans
    EXPECT_STREQ(jsonString(v, "count", "d").c_str(), "d");
    EXPECT_STREQ(jsonString(v, "none", "d").c_str(), "d");
    EXPECT_EQ(jsonArray(v, "nested").size(), 0u);
    EXPECT_EQ(jsonObject(v, "list").size(), 0u);
    EXPECT_FALSE(jsonHas(v, "negative", Json::uintValue));
    EXPECT_TRUE(jsonHas(v, "none", Json::nullValue));
    EXPECT_FALSE(jsonHas(v, "absent", Json::nullValue));
}

// jsoncpp's own isMember/operator[] throw on arrays and scalars.
TEST(JsonAccess, NonObjectsNeverThrow) {
    for (const Json::Value& v :
         {Json::Value(), parseJson("[1,2]"), Json::Value(5), Json::Value("t")}) {
        EXPECT_NO_THROW({
            EXPECT_EQ(jsonInt(v, "x", -1), -1);
            EXPECT_STREQ(jsonString(v, "x").c_str(), "");
            EXPECT_FALSE(jsonHas(v, "x", Json::nullValue));
            EXPECT_EQ(jsonArray(v, "x").size(), 0u);
        });
    }
}

TEST(JsonAccess, ValidResponseRule) {
    EXPECT_FALSE(ProviderUtil::isValidJsonResponse(Json::Value()));
    EXPECT_FALSE(ProviderUtil::isValidJsonResponse(parseJson(R"({"error": null, "a": 1})")));
    EXPECT_TRUE(ProviderUtil::isValidJsonResponse(parseJson(R"([{"error": 1}])")));
    EXPECT_TRUE(ProviderUtil::isValidJsonResponse(Json::Value(0)));
}

}  // namespace
