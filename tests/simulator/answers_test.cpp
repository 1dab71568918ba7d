// Answers that no other test reads in full: the golden files pin everything
// the inventory reads from the default and variants hosts; here the global
// information, diagnostic outcomes, and requests of the wrong shape.
#include "tests/simulator/SimTestSupport.h"

using namespace simtest;

namespace {

class Answers : public SimTest {};

// Every port getGlobalInfo names answers getPortByWwn; each list has one
// element per port.
TEST_F(Answers, GlobalInfoAgreesWithThePorts) {
    Json::Value g = getGlobalInfo(Json::Value(Json::arrayValue));
    ASSERT_EQ(3, g["numOfAdapters"].asInt());
    EXPECT_EQ(kCna, g["adapter"][2]["mac"].asString());
    for (const Json::Value& a : g["adapter"]) {
        const Json::ArrayIndex n = a["numOfPorts"].asUInt();
        for (const char* list :
             {"portHasFc", "portWwn", "portHasEth", "portMac", "portHasFcoe", "fcoeMac"})
            EXPECT_TRUE(!a.isMember(list) || a[list].size() == n) << list;
        for (Json::ArrayIndex j = 0; j < n; ++j) {
            Json::Value r(Json::objectValue);
            if (a["portHasFc"][j].asBool())
                r["wwn"] = a["portWwn"][j];
            else
                r["mac"] = a["portHasEth"][j].asBool() ? a["portMac"][j] : a["fcoeMac"][j];
            EXPECT_FALSE(isError(getPortByWwn(r))) << r;
        }
    }
    EXPECT_EQ(3, getAdapterIdByPort(K("indexStr", kEth1))["adapterId"].asInt());
    EXPECT_EQ(0, getAdapterIdByPort(K("indexStr", "00:00:00:00:00:01"))["adapterId"].asInt());
    // The simulator's bookkeeping stays inside.
    const std::string pl =
        std::string("{\"pPortWwn\": \"") + kFcPort0 + "\", \"lPortWwn\": \"" + kFcPort0 + "\"";
    EXPECT_FALSE(
        getCompleteRemotePort(J(pl + ", \"rPortWwn\": \"" + kDisk + "\"}")).isMember("statistics"));
}

// Outcomes are passes unless the fixture says otherwise for that adapter or port.
TEST_F(Answers, DiagnosticOutcomes) {
    const std::string lb =
        R"(", "mode": 1, "speed": 4, "dataPattern": 3048584629, "frameCount": 131072})";
    Json::Value ok = diagLoopbackTest(J(std::string("{\"portWwn\": \"") + kFcPort0 + lb));
    EXPECT_FALSE(ok["failed"].asBool());
    EXPECT_EQ(131072u, ok["transmitFrames"].asUInt());
    Json::Value lost = diagLoopbackTest(J(std::string("{\"portWwn\": \"") + kFcPort1 + lb));
    EXPECT_TRUE(lost["failed"].asBool());
    EXPECT_EQ(12u, lost["outstandingFrames"].asUInt());
    ASSERT_EQ(0, tvrn_sim_load_fixture("variants"));
    Json::Value fail = diagMemoryTest(K("hbaWwn", kDellHba));
    EXPECT_EQ(3, fail["status"].asInt());
    EXPECT_TRUE(fail["error address"].isIntegral());  // defaults kept beside what the fixture gives
}

// Keys must be in colon format and known; requests of the wrong shape answer
// an "error" object instead of crashing.
TEST_F(Answers, BadKeysAndShapesAnswerErrors) {
    EXPECT_TRUE(isError(getHbaByWwn(K("wwn", "2000000051e0a0b0c"))));         // raw form
    EXPECT_TRUE(isError(getHbaByWwn(K("wwn", "20:00:00:05:1e:ff:ff:ff"))));   // unknown
    EXPECT_TRUE(isError(getPortByWwn(J(R"({"wwn": 1000})"))));                // wrong type
    EXPECT_TRUE(isError(getPortByWwn(K("mac", kFcPort0))));                   // WWN as MAC
    EXPECT_TRUE(isError(getAllRemotePorts(K("pPortWwn", kFcPort0))));         // missing member
    EXPECT_TRUE(isError(getDynamicFcoeStatistics(K("indexStr", kFcPort0))));  // not FCoE

    const Json::Value bad[] = {
        Json::Value(),
        Json::Value(7),
        Json::Value("text"),
        J("[1, 2]"),
        J("{}"),
        J(R"({"indexStr": 5, "wwn": [], "mac": {}, "pPortWwn": true, "portWwn": null})")};
    int answered = 0;
#define ENTRY_POINT(kind, symbol, pointer) ENTRY_POINT_##kind(symbol)
#define ENTRY_POINT_JSON(symbol)                                                  \
    for (const Json::Value& b : bad) {                                            \
        Json::Value a = symbol(b);                                                \
        EXPECT_TRUE(a.isObject() || a.isArray()) << #symbol << " answered " << a; \
        ++answered;                                                               \
    }
#define ENTRY_POINT_INT_QUERY(symbol)
#define ENTRY_POINT_UINT_QUERY(symbol)
#define ENTRY_POINT_STRING_QUERY(symbol)
#define ENTRY_POINT_EVENT_CB(symbol)
#define ENTRY_POINT_LOG_CB(symbol)
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
    EXPECT_EQ(111 * 6, answered);
    unregister_for_events(Json::Value());
    EXPECT_EQ(3u, getNumberOfAdapters());  // nothing above changed the host
}

}  // namespace
