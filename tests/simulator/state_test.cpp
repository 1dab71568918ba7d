// Changes made through the library stay for the life of the process (until a
// fixture is loaded again) and show in the answers that read them.
#include "tests/simulator/SimTestSupport.h"

#include <cstdio>
#include <fstream>

using namespace simtest;

namespace {

class State : public SimTest {};

Json::Value portOf(const char* wwn) {
    return getPortByWwn(K("wwn", wwn));
}

Json::Value setPort(const std::string& key, const std::string& member, const Json::Value& value) {
    Json::Value req(Json::objectValue);
    req["indexStr"] = key;
    req["port"][member] = value;
    req["propArray"].append(member);
    return setPortByWwn(req);
}

TEST_F(State, PortEnableDisableAndBeacon) {
    ASSERT_FALSE(isError(setPort(kFcPort0, "portStatus", false)));
    EXPECT_EQ(10, portOf(kFcPort0)["portStatusValue"].asInt());
    ASSERT_FALSE(isError(setPort(kFcPort0, "portStatus", true)));
    EXPECT_EQ(2, portOf(kFcPort0)["portStatusValue"].asInt());
    // A link-down port comes back as it was.
    setPort(kFcPort1, "portStatus", false);
    setPort(kFcPort1, "portStatus", true);
    EXPECT_EQ(13, portOf(kFcPort1)["portStatusValue"].asInt());
    // Ethernet functions are switched by MAC and report it in their state value.
    setPort(kEth0, "portStatus", false);
    EXPECT_EQ(10, getEthPortByEthMac(K("mac", kEth0))["ethData"]["ethPortStateMOFValue"].asInt());

    // The beacon as the alarm device switches it is in tests/golden/set_alarm_state.golden.
    // A member keeps its JSON type; keys are in colon format.
    EXPECT_TRUE(isError(setPort(kFcPort0, "beaconState", "on")));
    EXPECT_TRUE(isError(setPort("1000000051e0a0b0c", "beaconState", true)));
    EXPECT_FALSE(portOf(kFcPort0)["beaconState"].asBool());
}

// Setters check the types of what they are given and copy only the listed
// (or known) members.
TEST_F(State, SettersCheckTypesAndCopyOnlyListedMembers) {
    const std::string fc = std::string("{\"indexStr\": \"") + kFcHba + "\"";
    setAdapterState(J(fc + ", \"enableState\": false}"));
    EXPECT_FALSE(getHbaByWwn(K("wwn", kFcHba))["hbaData"]["hbaStatus"].asBool());
    EXPECT_TRUE(isError(setAdapterState(J(fc + ", \"enableState\": \"no\"}"))));
    ASSERT_FALSE(isError(setFcTrunkingState(J(fc + ", \"enableState\": true}"))));
    EXPECT_TRUE(getAdvAdapterData(J(fc + "}"))["trunkingEnabled"].asBool());
    EXPECT_TRUE(isError(setFcTrunkingState(
        J(std::string("{\"indexStr\": \"") + kCna + "\", \"enableState\": true}"))));
    setPortAlias(
        J(std::string(R"({"type": "CNA", "mac": ")") + kEth1 + R"(", "alias": "uplink"})"));
    EXPECT_EQ("uplink", getEthPortByEthMac(K("mac", kEth1))["ethData"]["alias"].asString());

    const std::string p = kFcPort0;
    setFcByFcWwn(J(
        "{\"portWwn\": \"" + p +
        R"(", "fcPortData": {"topology": "p2p", "extra": 1}, "paramsConfigured": ["topology"]})"));
    Json::Value fc0 = getFcByFcWwn(K("wwn", p));
    EXPECT_EQ("p2p", fc0["topology"].asString());
    EXPECT_FALSE(fc0.isMember("extra"));
    setPortAuthentication(J("{\"pPortWwn\": \"" + p + R"(", "portAuth": {"authEnabled": true}})"));
    resetPortAuthentication(K("pPortWwn", p));
    EXPECT_FALSE(getPortAuthentication(K("wwn", p))["authEnabled"].asBool());
    setEthPort(J(std::string("{\"mac\": \"") + kEth0 +
                 R"(", "ethPort": {"mtu": 9000}, "propArray": ["mtu"]})"));
    EXPECT_EQ(9000, getEthPortByEthMac(K("mac", kEth0))["ethData"]["mtu"].asInt());
}

TEST_F(State, VirtualPorts) {
    const std::string p = kFcPort0, v2 = "24:00:00:05:1e:0a:0b:99";
    auto count = [&] { return getAllVPorts(K("wwn", p))["vports"].size(); };
    const std::string create = "{\"pwwn\": \"" + p +
                               R"(", "nwwn": "25:00:00:05:1e:0a:0b:99", "vwwn": ")" + v2 +
                               R"(", "symbolicName": "vp2", "vfId": 0})";
    ASSERT_FALSE(isError(createVport(J(create))));
    EXPECT_TRUE(isError(createVport(J(create))));  // WWN now in use
    EXPECT_EQ(2u, count());
    const std::string pl = "{\"pPortWwn\": \"" + p + "\", \"lPortWwn\": \"" + v2 + "\"";
    EXPECT_EQ("vp2", getVPort(J(pl + "}"))["symbolicName"].asString());
    EXPECT_TRUE(getDynamicVPortStatistics(J(pl + ", \"vfId\": 0}")).isArray());

    const std::string del =
        "{\"pwwn\": \"" + p + R"(", "vfId": 0, "vportArray": [")" + kVport + "\", \"";
    EXPECT_TRUE(isError(deleteVport(J(del + "24:00:00:05:1e:0a:0b:77\"]}"))));  // all or nothing
    EXPECT_EQ(2u, count());
    ASSERT_FALSE(isError(deleteVport(J(del + v2 + "\"]}"))));
    EXPECT_EQ(0u, count());
}

TEST_F(State, VnicsShowAsPciFunctions) {
    const std::string mac = std::string("{\"mac\": \"") + kEth0 + "\"";
    Json::Value created = createvNIC(J(mac + ", \"minBandwidth\": 10, \"maxBandwidth\": 50}"));
    ASSERT_FALSE(isError(created)) << created;
    const std::string index = std::to_string(created["vnic"]["pciFunctionIndex"].asInt());
    EXPECT_TRUE(isError(createvNIC(J(mac + ", \"minBandwidth\": 60, \"maxBandwidth\": 50}"))));
    auto functions = [] { return getAdapterPciFnData(K("indexStr", kCna))["pciFunctions"]; };
    const Json::ArrayIndex before = functions().size();
    modifyvNIC(
        J(mac + ", \"vNICs\": [{\"pciFunctionIndex\": " + index + ", \"maxBandwidth\": 80}]}"));
    EXPECT_EQ(80, functions()[before - 1]["maxBandwidth"].asInt());
    EXPECT_TRUE(isError(deletevNICs(J(mac + ", \"pciFunctionIndices\": [99]}"))));
    ASSERT_FALSE(isError(deletevNICs(J(mac + ", \"pciFunctionIndices\": [" + index + "]}"))));
    EXPECT_EQ(before - 1, functions().size());
}

TEST_F(State, LunMaskingAndAdvancedIoProfiles) {
    const std::string port = std::string("{\"indexStr\": \"") + kFcPort0 + "\"";
    const std::string scope = std::string(R"("lPortWwn": ")") + kFcPort0 + "\", \"rPortWwn\": \"";
    const std::string entry = "{" + scope + kDisk + R"(", "lunId": "3"})";
    auto mask = [&] { return getLunMaskData(J(port + "}")); };
    setLunMaskData(J(port + ", \"removedLunMaskData\": [], \"addedLunMaskData\": [" + entry +
                     "], \"clearLunMaskData\": false}"));
    EXPECT_TRUE(mask()["lunMaskEnabled"].asBool());
    ASSERT_EQ(1u, mask()["lunMaskData"].size());
    setLunMaskData(J(port + ", \"removedLunMaskData\": [" + entry +
                     "], \"addedLunMaskData\": [], \"clearLunMaskData\": false}"));
    EXPECT_EQ(0u, mask()["lunMaskData"].size());
    EXPECT_TRUE(isError(setLunMaskData(J(port + ", \"addedLunMaskData\": {}}"))));

    auto profiles = [&] { return getAdvIoProfile(J(port + "}"))["advancedIoProfiles"].size(); };
    setAdvIoProfile(J(port + ", \"addedAdvancedIoProfiles\": [" + entry + "]}"));
    EXPECT_EQ(1u, profiles());
    clearAdvIoProfile(J(port + ", " + scope + kTape + "\"}"));
    EXPECT_EQ(1u, profiles());  // other scope
    clearAdvIoProfile(J(port + ", " + scope + kDisk + "\", \"lunId\": \"3\"}"));
    EXPECT_EQ(0u, profiles());
}

bool allZero(const Json::Value& stats) {
    if (!stats.isArray() || stats.size() == 0)
        return false;
    for (const Json::Value& e : stats)
        if (e["value"].asString() != "0")
            return false;
    return true;
}

// Each reset zeroes exactly the counters its getter reports, and they stay
// zero: one reset of each kind of scope.
TEST_F(State, StatisticsResets) {
    const std::string p = kFcPort0, r = kDisk, mac = kEth0;
    const std::string pl = "\"pPortWwn\": \"" + p + "\", \"lPortWwn\": \"" + p + "\"";
    struct Case {
        Json::Value (*get)(const Json::Value&);
        std::string getReq;
        Json::Value (*reset)(const Json::Value&);
        std::string resetReq;
    };
    const Case cases[] = {
        {getDynamicPortStatistics, "{\"indexStr\": \"" + p + "\"}", resetStatisticsForPort,
         "{\"indexStr\": \"" + p + "\"}"},
        {getDynamicFcpimStatistics, "{" + pl + ", \"rPortWwn\": \"" + r + "\"}",
         resetStatisticsForFcpim, "{" + pl + ", \"rPortWwn\": \"" + r + "\", \"vfId\": 0}"},
        {getDynamicLogicalPortStatistics, "{" + pl + ", \"vfId\": 0}", resetStatisticsForLPort,
         "{\"pwwn\": \"" + p + "\", \"lwwn\": \"" + p + "\", \"vfId\": 0}"},
        {getDynamicVPortStatistics,
         "{\"pPortWwn\": \"" + p + "\", \"lPortWwn\": \"" + kVport + "\", \"vfId\": 0}",
         resetStatisticsForVPort,
         "{\"pwwn\": \"" + p + "\", \"vwwn\": \"" + kVport + "\", \"vfId\": 0}"},
        {getDynamicFirmwareStatistics, "{\"indexStr\": \"" + p + "\"}", resetFirmwareStatistics,
         "{\"indexStr\": \"" + std::string(kFcHba) + "\"}"},
        {getDynamicvHBAStatistics, "{\"wwn\": \"" + p + "\"}", resetvHBAStatistics,
         "{\"wwn\": \"" + p + "\"}"},
        {getDynamicLldpStatistics, "{\"mac\": \"" + mac + "\"}", resetLldpStatistics,
         "{\"mac\": \"" + mac + "\"}"},
        {getDynamicAdvancedIoDataAtLun,
         "{" + pl + ", \"rPortWwn\": \"" + r + "\", \"lunId\": \"2\", \"vfId\": 0}",
         resetDataForAdvIoProf,
         "{\"indexStr\": \"" + p + "\", \"lPortWwn\": \"" + p + "\", \"rPortWwn\": \"" + r +
             "\", \"lunId\": \"1\", \"endLunRange\": \"3\"}"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.getReq);
        Json::Value before = c.get(J(c.getReq));
        ASSERT_TRUE(before.isArray()) << before;
        EXPECT_FALSE(allZero(before));
        EXPECT_EQ(before, c.get(J(c.getReq)));  // stable between calls
        ASSERT_FALSE(isError(c.reset(J(c.resetReq)))) << c.resetReq;
        EXPECT_TRUE(allZero(c.get(J(c.getReq))));
    }
    // The FC-IM reset covers the I/O profile counters as well.
    EXPECT_TRUE(allZero(
        getDynamicFcpimIopStatistics(J("{" + pl + ", \"rPortWwn\": \"" + r + "\", \"vfId\": 0}"))));
    // A reset of one port leaves the other ports' counters alone.
    EXPECT_FALSE(
        allZero(getDynamicPortStatistics(J(std::string("{\"indexStr\": \"") + kFcPort1 + "\"}"))));
    // Loading the fixture again brings the counters back.
    tvrn_sim_load_fixture("default");
    EXPECT_FALSE(allZero(getDynamicPortStatistics(J("{\"indexStr\": \"" + p + "\"}"))));
}

// An image in JSON (its version and BIOS version) is in
// tests/golden/software_update.golden; another file is flashed as its name.
TEST_F(State, FlashUpdateChangesTheReportedFirmware) {
    const std::string dir = ::testing::TempDir();
    const std::string plain = dir + "tvrn-fw-3.3.0.1.bin";
    std::ofstream(plain) << "binary image";
    const std::string req = std::string("{\"indexStr\": \"") + kFcHba + "\", \"file\": \"";
    EXPECT_EQ(0, adapterUpdateFlash(J(req + plain + "\"}"))["status"].asInt());
    EXPECT_EQ("tvrn-fw-3.3.0.1", getHbaByWwn(K("wwn", kFcHba))["firmware"]["version"].asString());
    // A missing file reports a non-zero status and changes nothing.
    EXPECT_NE(0, adapterUpdateFlash(J(req + dir + "no-such-image.bin\"}"))["status"].asInt());
    EXPECT_EQ("tvrn-fw-3.3.0.1", getFlashInfo(K("indexStr", kFcHba))["firmwareVersion"].asString());
    std::remove(plain.c_str());
}

TEST_F(State, DiagnosticRequests) {
    ASSERT_EQ(0, tvrn_sim_load_fixture("variants"));  // for an adapter whose memory test fails
    const std::string id = std::to_string(getRequestID());
    EXPECT_EQ(std::stoi(id) + 1, getRequestID());
    const Json::Value byId = K("requestID", id);
    const std::string post = "{\"requestID\": \"" + id + "\", \"function\": ";
    ASSERT_FALSE(
        isError(postDiagnostics(J(post + "\"MemoryTest\", \"hbaWwn\": \"" + kDellHba + "\"}"))));
    ASSERT_FALSE(isError(postDiagnostics(J(post + "\"QueueTest\", \"hbaWwn\": \"" + kFcHba +
                                           "\", \"portWwn\": \"" + kFcPort0 + "\"}"))));
    EXPECT_TRUE(isError(postDiagnostics(J(post + "\"NoSuchTest\"}"))));
    EXPECT_EQ("posted", getDiagnosticsResults(byId)["state"].asString());
    ASSERT_FALSE(isError(startTests(J("{\"requestID\": \"" + id + "\", \"stopOnError\": true}"))));
    Json::Value res = getDiagnosticsResults(byId);
    EXPECT_EQ("completed", res["state"].asString());
    ASSERT_EQ(1u, res["results"].size());  // stopped at the failing memory test
    EXPECT_TRUE(res["results"][0]["failed"].asBool());
    EXPECT_TRUE(isError(cancelTests(byId)));
    EXPECT_TRUE(isError(getDiagnosticsResults(K("requestID", "99999"))));

    // A request still posted (or running) can be cancelled.
    const std::string id2 = std::to_string(getRequestID());
    postDiagnostics(J("{\"requestID\": " + id2 + ", \"function\": \"LEDTest\", \"portWwn\": \"" +
                      kFcPort0 + "\"}"));
    EXPECT_EQ("cancelled", cancelTests(K("requestID", id2))["state"].asString());
    EXPECT_TRUE(isError(startTests(J("{\"requestID\": \"" + id2 + "\", \"stopOnError\": false}"))));

    setDport(
        J(std::string(R"({"requestID": "1", "portWwn": ")") + kFcPort0 + R"(", "state": true})"));
    EXPECT_TRUE(getDPortTestResult(K("portWwn", kFcPort0))["dportEnabled"].asBool());
}

}  // namespace
