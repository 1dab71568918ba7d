// Changes made through the library stay for the life of the process (until a
// fixture is loaded again) and show in the answers that read them.
#include "tests/simulator/SimTestSupport.h"

#include <cstdio>
#include <fstream>

using namespace simtest;

namespace {

class State : public SimTest {};

Json::Value portOf(const char* wwn) { return getPortByWwn(J(std::string("{\"wwn\": \"") + wwn + "\"}")); }

Json::Value setPort(const std::string& key, const std::string& member, const Json::Value& value) {
    Json::Value req(Json::objectValue);
    req["indexStr"] = key;
    req["port"][member] = value;
    req["propArray"].append(member);
    return setPortByWwn(req);
}

TEST_F(State, PortEnableDisableAndBeacon) {
    ASSERT_FALSE(isError(setPort(kFcPort0, "portStatus", false)));
    EXPECT_FALSE(portOf(kFcPort0)["portStatus"].asBool());
    EXPECT_EQ(10, portOf(kFcPort0)["portStatusValue"].asInt());
    ASSERT_FALSE(isError(setPort(kFcPort0, "portStatus", true)));
    EXPECT_EQ(2, portOf(kFcPort0)["portStatusValue"].asInt());
    // A link-down port comes back as it was.
    setPort(kFcPort1, "portStatus", false);
    setPort(kFcPort1, "portStatus", true);
    EXPECT_EQ(13, portOf(kFcPort1)["portStatusValue"].asInt());
    // Ethernet functions are switched by MAC and report it in their state value.
    setPort(kEth0, "portStatus", false);
    EXPECT_FALSE(getPortByWwn(J(std::string("{\"mac\": \"") + kEth0 + "\"}"))["portStatus"].asBool());
    EXPECT_EQ(10, getEthPortByEthMac(J(std::string("{\"mac\": \"") + kEth0 + "\"}"))["ethData"]["ethPortStateMOFValue"].asInt());

    // Beacon as the alarm device sends it: the whole port with one listed member.
    Json::Value port = portOf(kFcPort0);
    port["beaconState"] = true;
    Json::Value req(Json::objectValue);
    req["indexStr"] = kFcPort0;
    req["port"] = port;
    req["propArray"].append("beaconState");
    ASSERT_FALSE(isError(setPortByWwn(req)));
    EXPECT_TRUE(portOf(kFcPort0)["beaconState"].asBool());
    // Only listed members change, and a member keeps its JSON type.
    EXPECT_TRUE(isError(setPort(kFcPort0, "beaconState", "on")));
    EXPECT_TRUE(isError(setPort("1000000051e0a0b0c", "beaconState", false)));
    EXPECT_TRUE(portOf(kFcPort0)["beaconState"].asBool());
}

TEST_F(State, AdapterStateAliasesTrunkingAndMode) {
    const std::string fc = std::string("{\"indexStr\": \"") + kFcHba + "\"";
    setAdapterState(J(fc + ", \"enableState\": false}"));
    EXPECT_FALSE(getHbaByWwn(J(std::string("{\"wwn\": \"") + kFcHba + "\"}"))["hbaData"]["hbaStatus"].asBool());
    EXPECT_TRUE(isError(setAdapterState(J(fc + ", \"enableState\": \"no\"}"))));

    setAdapterAlias(J(std::string(R"({"type": "Node", "wwn": ")") + kFcHba + R"(", "alias": "boot-hba"})"));
    EXPECT_EQ("boot-hba", getHbaByWwn(J(std::string("{\"wwn\": \"") + kFcHba + "\"}"))["hbaData"]["alias"].asString());
    setPortAlias(J(std::string(R"({"type": "CNA", "mac": ")") + kEth1 + R"(", "alias": "uplink"})"));
    EXPECT_EQ("uplink", getEthPortByEthMac(J(std::string("{\"mac\": \"") + kEth1 + "\"}"))["ethData"]["alias"].asString());

    ASSERT_FALSE(isError(setFcTrunkingState(J(fc + ", \"enableState\": true}"))));
    EXPECT_TRUE(getAdvAdapterData(J(fc + "}"))["trunkingEnabled"].asBool());
    EXPECT_TRUE(isError(setFcTrunkingState(J(std::string("{\"indexStr\": \"") + kCna + "\", \"enableState\": true}"))));
    setAdapterMode(J(fc + ", \"adapterMode\": \"HBA-NPIV\"}"));
    EXPECT_EQ("HBA-NPIV", getAdvAdapterData(J(fc + "}"))["adapterMode"].asString());
}

TEST_F(State, VirtualPorts) {
    const std::string base = std::string("{\"wwn\": \"") + kFcPort0 + "\"}";
    ASSERT_EQ(1u, getAllVPorts(J(base))["vports"].size());
    const std::string create = std::string(R"({"pwwn": ")") + kFcPort0 +
                               R"(", "nwwn": "25:00:00:05:1e:0a:0b:99", "vwwn": "24:00:00:05:1e:0a:0b:99", "symbolicName": "vp2", "vfId": 0})";
    ASSERT_FALSE(isError(createVport(J(create))));
    EXPECT_TRUE(isError(createVport(J(create))));  // WWN now in use
    EXPECT_EQ(2u, getAllVPorts(J(base))["vports"].size());
    Json::Value v = getVPort(J(std::string("{\"pPortWwn\": \"") + kFcPort0 + R"(", "lPortWwn": "24:00:00:05:1e:0a:0b:99"})"));
    EXPECT_EQ("vp2", v["symbolicName"].asString());
    // Statistics of the new virtual port are reachable through it.
    EXPECT_TRUE(getDynamicVPortStatistics(J(std::string("{\"pPortWwn\": \"") + kFcPort0 + R"(", "lPortWwn": "24:00:00:05:1e:0a:0b:99", "vfId": 0})")).isArray());

    const std::string del = std::string("{\"pwwn\": \"") + kFcPort0 + R"(", "vfId": 0, "vportArray": [")";
    EXPECT_TRUE(isError(deleteVport(J(del + kVport + R"(", "24:00:00:05:1e:0a:0b:77"]})"))));  // all or nothing
    EXPECT_EQ(2u, getAllVPorts(J(base))["vports"].size());
    ASSERT_FALSE(isError(deleteVport(J(del + kVport + R"(", "24:00:00:05:1e:0a:0b:99"]})"))));
    EXPECT_EQ(0u, getAllVPorts(J(base))["vports"].size());
    EXPECT_TRUE(isError(getVPort(J(std::string("{\"pPortWwn\": \"") + kFcPort0 + "\", \"lPortWwn\": \"" + kVport + "\"}"))));
}

TEST_F(State, VnicsShowAsPciFunctions) {
    const std::string mac = std::string("{\"mac\": \"") + kEth0 + "\"";
    Json::Value created = createvNIC(J(mac + ", \"minBandwidth\": 10, \"maxBandwidth\": 50}"));
    ASSERT_FALSE(isError(created)) << created;
    const int index = created["vnic"]["pciFunctionIndex"].asInt();
    EXPECT_TRUE(isError(createvNIC(J(mac + ", \"minBandwidth\": 60, \"maxBandwidth\": 50}"))));
    auto functions = [] { return getAdapterPciFnData(J(std::string("{\"indexStr\": \"") + kCna + "\"}"))["pciFunctions"]; };
    const Json::ArrayIndex before = functions().size();
    EXPECT_EQ("vNIC", functions()[before - 1]["type"].asString());
    modifyvNIC(J(mac + ", \"vNICs\": [{\"pciFunctionIndex\": " + std::to_string(index) + ", \"maxBandwidth\": 80}]}"));
    EXPECT_EQ(80, functions()[before - 1]["maxBandwidth"].asInt());
    EXPECT_TRUE(isError(deletevNICs(J(mac + ", \"pciFunctionIndices\": [99]}"))));
    ASSERT_FALSE(isError(deletevNICs(J(mac + ", \"pciFunctionIndices\": [" + std::to_string(index) + "]}"))));
    EXPECT_EQ(before - 1, functions().size());
}

TEST_F(State, LunMaskingAndAdvancedIoProfiles) {
    const std::string port = std::string("{\"indexStr\": \"") + kFcPort0 + "\"";
    const std::string entry = std::string(R"({"lPortWwn": ")") + kFcPort0 + "\", \"rPortWwn\": \"" + kDisk + R"(", "lunId": "3"})";
    setLunMaskData(J(port + ", \"removedLunMaskData\": [], \"addedLunMaskData\": [" + entry + "], \"clearLunMaskData\": false}"));
    Json::Value mask = getLunMaskData(J(port + "}"));
    EXPECT_TRUE(mask["lunMaskEnabled"].asBool());
    ASSERT_EQ(1u, mask["lunMaskData"].size());
    setLunMaskData(J(port + ", \"removedLunMaskData\": [" + entry + "], \"addedLunMaskData\": [], \"clearLunMaskData\": false}"));
    EXPECT_EQ(0u, getLunMaskData(J(port + "}"))["lunMaskData"].size());
    EXPECT_TRUE(isError(setLunMaskData(J(port + ", \"addedLunMaskData\": {}}"))));

    setAdvIoProfile(J(port + ", \"addedAdvancedIoProfiles\": [" + entry + "]}"));
    EXPECT_EQ(1u, getAdvIoProfile(J(port + "}"))["advancedIoProfiles"].size());
    clearAdvIoProfile(J(port + ", \"lPortWwn\": \"" + kFcPort0 + "\", \"rPortWwn\": \"" + kTape + "\"}"));
    EXPECT_EQ(1u, getAdvIoProfile(J(port + "}"))["advancedIoProfiles"].size());  // other scope
    clearAdvIoProfile(J(port + ", \"lPortWwn\": \"" + kFcPort0 + "\", \"rPortWwn\": \"" + kDisk + "\", \"lunId\": \"3\"}"));
    EXPECT_EQ(0u, getAdvIoProfile(J(port + "}"))["advancedIoProfiles"].size());
}

bool allZero(const Json::Value& stats) {
    if (!stats.isArray() || stats.size() == 0) return false;
    for (const Json::Value& e : stats)
        if (e["value"].asString() != "0") return false;
    return true;
}

// Each reset zeroes exactly the counters its getter reports, and they stay zero.
TEST_F(State, StatisticsResets) {
    const std::string p = kFcPort0, r = kDisk, mac = kEth0, fcoe = kFcoePort0;
    const std::string pl = "\"pPortWwn\": \"" + p + "\", \"lPortWwn\": \"" + p + "\"";
    struct Case {
        Json::Value (*get)(const Json::Value&);
        std::string getReq;
        Json::Value (*reset)(const Json::Value&);
        std::string resetReq;
    };
    const Case cases[] = {
        {getDynamicPortStatistics, "{\"indexStr\": \"" + p + "\"}", resetStatisticsForPort, "{\"indexStr\": \"" + p + "\"}"},
        {getDynamicRPortStatistics, "{" + pl + ", \"rPortWwn\": \"" + r + "\", \"vfId\": 0}", resetStatisticsForRPort, "{" + pl + ", \"rPortWwn\": \"" + r + "\", \"vfId\": 0}"},
        {getDynamicFcpimStatistics, "{" + pl + ", \"rPortWwn\": \"" + r + "\"}", resetStatisticsForFcpim, "{" + pl + ", \"rPortWwn\": \"" + r + "\", \"vfId\": 0}"},
        {getDynamicLogicalPortStatistics, "{" + pl + ", \"vfId\": 0}", resetStatisticsForLPort, "{\"pwwn\": \"" + p + "\", \"lwwn\": \"" + p + "\", \"vfId\": 0}"},
        {getDynamicVPortStatistics, "{\"pPortWwn\": \"" + p + "\", \"lPortWwn\": \"" + kVport + "\", \"vfId\": 0}", resetStatisticsForVPort, "{\"pwwn\": \"" + p + "\", \"vwwn\": \"" + kVport + "\", \"vfId\": 0}"},
        {getDynamicQosStatistics, "{\"pPortWwn\": \"" + p + "\"}", resetStatisticsForQos, "{\"pPortWwn\": \"" + p + "\"}"},
        {getDynamicPortAuthStatistics, "{\"pPortWwn\": \"" + p + "\"}", resetStatisticsForPortAuth, "{\"wwn\": \"" + p + "\"}"},
        {getDynamicFabricStatistics, "{\"wwn\": \"" + p + "\", \"vfID\": 0}", resetStatisticsForFabric, "{\"pwwn\": \"" + p + "\", \"vfId\": 0}"},
        {getDynamicIocStatistics, "{\"pwwn\": \"" + p + "\"}", resetStatisticsForIoc, "{\"pwwn\": \"" + p + "\"}"},
        {getDynamicTrunkingStatistics, "{\"indexStr\": \"" + std::string(kFcHba) + "\"}", resetTrunkingStatistics, "{\"indexStr\": \"" + std::string(kFcHba) + "\"}"},
        {getDynamicFirmwareStatistics, "{\"indexStr\": \"" + p + "\"}", resetFirmwareStatistics, "{\"indexStr\": \"" + std::string(kFcHba) + "\"}"},
        {getDynamicvHBAStatistics, "{\"wwn\": \"" + p + "\"}", resetvHBAStatistics, "{\"wwn\": \"" + p + "\"}"},
        {getDynamicFcoeStatistics, "{\"indexStr\": \"" + fcoe + "\"}", resetFcoeStatistics, "{\"indexStr\": \"" + fcoe + "\"}"},
        {getDynamicFcpimModStatistics, "{\"indexStr\": \"" + p + "\"}", resetStatisticsForFcpimMod, "{\"indexStr\": \"" + p + "\"}"},
        {getDynamicLldpStatistics, "{\"mac\": \"" + mac + "\"}", resetLldpStatistics, "{\"mac\": \"" + mac + "\"}"},
        {getDynamicIOCEthernetStatistics, "{\"mac\": \"" + mac + "\"}", resetIOCEthernetStatistics, "{\"mac\": \"" + mac + "\"}"},
        {getDynamicEthernetPortStatistics, "{\"mac\": \"" + mac + "\"}", resetEthernetPortStatistics, "{\"mac\": \"" + mac + "\"}"},
        {getDynamicvNICStatistics, "{\"mac\": \"" + mac + "\"}", resetvNICStatistics, "{\"mac\": \"" + mac + "\"}"},
        {getDynamicAdvancedIoDataAtLun, "{" + pl + ", \"rPortWwn\": \"" + r + "\", \"lunId\": \"2\", \"vfId\": 0}", resetDataForAdvIoProf,
         "{\"indexStr\": \"" + p + "\", \"lPortWwn\": \"" + p + "\", \"rPortWwn\": \"" + r + "\", \"lunId\": \"1\", \"endLunRange\": \"3\"}"},
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
    EXPECT_TRUE(allZero(getDynamicFcpimIopStatistics(J("{" + pl + ", \"rPortWwn\": \"" + r + "\", \"vfId\": 0}"))));
    // A reset of one port leaves the other ports' counters alone.
    EXPECT_FALSE(allZero(getDynamicPortStatistics(J(std::string("{\"indexStr\": \"") + kFcPort1 + "\"}"))));
    // Loading the fixture again brings the counters back.
    tvrn_sim_load_fixture("default");
    EXPECT_FALSE(allZero(getDynamicPortStatistics(J("{\"indexStr\": \"" + p + "\"}"))));
}

TEST_F(State, FlashUpdateChangesTheReportedFirmware) {
    const std::string dir = ::testing::TempDir();
    const std::string plain = dir + "tvrn-fw-3.3.0.1.bin", image = dir + "tvrn-image.json";
    std::ofstream(plain) << "binary image";
    std::ofstream(image) << R"({"version": "3.4.0.0", "biosVersion": "3.4.0.1"})";
    const std::string req = std::string("{\"indexStr\": \"") + kFcHba + "\", \"file\": \"";
    Json::Value r = adapterUpdateFlash(J(req + plain + "\"}"));
    EXPECT_EQ(0, r["status"].asInt());
    EXPECT_TRUE(r["message"].isString());
    EXPECT_EQ("tvrn-fw-3.3.0.1", getHbaByWwn(J(std::string("{\"wwn\": \"") + kFcHba + "\"}"))["firmware"]["version"].asString());
    adapterUpdateFlash(J(req + image + "\"}"));
    Json::Value fw = getHbaByWwn(J(std::string("{\"wwn\": \"") + kFcHba + "\"}"))["firmware"];
    EXPECT_EQ("3.4.0.0", fw["version"].asString());
    EXPECT_EQ("3.4.0.1", fw["biosVersion"].asString());
    // A missing file reports a non-zero status and changes nothing.
    Json::Value missing = adapterUpdateFlash(J(req + dir + "no-such-image.bin\"}"));
    EXPECT_NE(0, missing["status"].asInt());
    EXPECT_EQ("3.4.0.0", getFlashInfo(J(std::string("{\"indexStr\": \"") + kFcHba + "\"}"))["firmwareVersion"].asString());
    std::remove(plain.c_str());
    std::remove(image.c_str());
}

TEST_F(State, DiagnosticRequests) {
    ASSERT_EQ(0, tvrn_sim_load_fixture("variants"));  // for an adapter whose memory test fails
    const std::string id = std::to_string(getRequestID());
    EXPECT_EQ(std::stoi(id) + 1, getRequestID());
    const std::string post = "{\"requestID\": \"" + id + "\", \"function\": ";
    ASSERT_FALSE(isError(postDiagnostics(J(post + "\"MemoryTest\", \"hbaWwn\": \"" + kDellHba + "\"}"))));
    ASSERT_FALSE(isError(postDiagnostics(J(post + "\"QueueTest\", \"hbaWwn\": \"" + kFcHba + "\", \"portWwn\": \"" + kFcPort0 + "\"}"))));
    EXPECT_TRUE(isError(postDiagnostics(J(post + "\"NoSuchTest\"}"))));
    EXPECT_EQ("posted", getDiagnosticsResults(J("{\"requestID\": \"" + id + "\"}"))["state"].asString());
    ASSERT_FALSE(isError(startTests(J("{\"requestID\": \"" + id + "\", \"stopOnError\": true}"))));
    Json::Value res = getDiagnosticsResults(J("{\"requestID\": \"" + id + "\"}"));
    EXPECT_EQ("completed", res["state"].asString());
    ASSERT_EQ(1u, res["results"].size());  // stopped at the failing memory test
    EXPECT_TRUE(res["results"][0]["failed"].asBool());
    EXPECT_TRUE(isError(cancelTests(J("{\"requestID\": \"" + id + "\"}"))));
    EXPECT_TRUE(isError(getDiagnosticsResults(J(R"({"requestID": "99999"})"))));

    // A request still posted (or running) can be cancelled.
    const std::string id2 = std::to_string(getRequestID());
    postDiagnostics(J("{\"requestID\": " + id2 + ", \"function\": \"LEDTest\", \"portWwn\": \"" + kFcPort0 + "\"}"));
    EXPECT_EQ("cancelled", cancelTests(J("{\"requestID\": \"" + id2 + "\"}"))["state"].asString());
    EXPECT_TRUE(isError(startTests(J("{\"requestID\": \"" + id2 + "\", \"stopOnError\": false}"))));

    setDport(J(std::string(R"({"requestID": "1", "portWwn": ")") + kFcPort0 + R"(", "state": true})"));
    EXPECT_TRUE(getDPortTestResult(J(std::string("{\"portWwn\": \"") + kFcPort0 + "\"}"))["dportEnabled"].asBool());
}

TEST_F(State, ConfigurationObjects) {
    const std::string p = kFcPort0;
    setFcByFcWwn(J("{\"portWwn\": \"" + p + R"(", "fcPortData": {"topology": "p2p", "extra": 1}, "paramsConfigured": ["topology"]})"));
    Json::Value fc = getFcByFcWwn(J("{\"wwn\": \"" + p + "\"}"));
    EXPECT_EQ("p2p", fc["topology"].asString());
    EXPECT_FALSE(fc.isMember("extra"));
    setPortAuthentication(J("{\"pPortWwn\": \"" + p + R"(", "portAuth": {"authEnabled": true}})"));
    EXPECT_TRUE(getPortAuthentication(J("{\"wwn\": \"" + p + "\"}"))["authEnabled"].asBool());
    resetPortAuthentication(J("{\"pPortWwn\": \"" + p + "\"}"));
    EXPECT_FALSE(getPortAuthentication(J("{\"wwn\": \"" + p + "\"}"))["authEnabled"].asBool());
    setFcoeByPort(J(std::string("{\"indexStr\": \"") + kFcoePort0 + R"(", "fcoePort": {"vlanId": 1003}, "propArray": ["vlanId"]})"));
    EXPECT_EQ(1003, getFcoeByPort(J(std::string("{\"indexStr\": \"") + kFcoePort0 + "\"}"))["vlanId"].asInt());
    EXPECT_TRUE(isError(getFcoeByPort(J("{\"indexStr\": \"" + p + "\"}"))));
    setEthPort(J(std::string("{\"mac\": \"") + kEth0 + R"(", "ethPort": {"mtu": 9000}, "propArray": ["mtu"]})"));
    EXPECT_EQ(9000, getEthPortByEthMac(J(std::string("{\"mac\": \"") + kEth0 + "\"}"))["ethData"]["mtu"].asInt());
}

}  // namespace
