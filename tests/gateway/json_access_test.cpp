#include <gtest/gtest.h>

#include "gateway/JsonAccess.h"
#include "gateway/ProviderUtil.h"
#include "tests/gateway/TestSupport.h"

using namespace CPTA;
using gwtest::parseJson;

namespace {

TEST(JsonAccess, WrongTypeCountsAsMissing) {
    Json::Value v = parseJson(R"({"name": "p0", "count": 12, "negative": -3, "big": 5000000000,
        "whole": 4.0, "ratio": 2.5, "flag": true, "list": [1], "nested": {"a": "b"},
        "countText": "12", "flagNumber": 1, "none": null})");
    EXPECT_STREQ(jsonString(v, "name").c_str(), "p0");
    EXPECT_EQ(jsonInt(v, "count"), 12);
    EXPECT_EQ(jsonInt(v, "whole"), 4);  // an integral real fits an int
    EXPECT_EQ(jsonUInt64(v, "big"), 5000000000ull);
    EXPECT_TRUE(jsonBool(v, "flag"));
    EXPECT_STREQ(jsonString(jsonObject(v, "nested"), "a").c_str(), "b");

    EXPECT_EQ(jsonInt(v, "countText", -1), -1);
    EXPECT_EQ(jsonInt(v, "ratio", -1), -1);
    EXPECT_EQ(jsonInt(v, "big", -1), -1);  // does not fit
    EXPECT_EQ(jsonUInt(v, "negative", 9), 9u);
    EXPECT_EQ(jsonInt(v, "flag", -1), -1);  // booleans are not numbers...
    EXPECT_FALSE(jsonBool(v, "flagNumber"));  // ...nor numbers booleans
    EXPECT_STREQ(jsonString(v, "count", "d").c_str(), "d");
    EXPECT_STREQ(jsonString(v, "none", "d").c_str(), "d");
    EXPECT_EQ(jsonArray(v, "nested").size(), 0u);
    EXPECT_EQ(jsonObject(v, "list").size(), 0u);
    EXPECT_TRUE(jsonHas(v, "count", Json::uintValue));
    EXPECT_FALSE(jsonHas(v, "negative", Json::uintValue));
    EXPECT_TRUE(jsonHas(v, "none", Json::nullValue));
    EXPECT_FALSE(jsonHas(v, "absent", Json::nullValue));
}

// jsoncpp's own isMember/operator[] throw on arrays and scalars.
TEST(JsonAccess, NonObjectsNeverThrow) {
    for (const Json::Value& v : {Json::Value(), parseJson("[1,2]"), Json::Value(5), Json::Value("t")}) {
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
    EXPECT_TRUE(ProviderUtil::isValidJsonResponse(parseJson("{}")));
    EXPECT_TRUE(ProviderUtil::isValidJsonResponse(parseJson(R"([{"error": 1}])")));
    EXPECT_TRUE(ProviderUtil::isValidJsonResponse(Json::Value(0)));
}

}  // namespace
