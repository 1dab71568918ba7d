// The answers the inventory, RPC, diagnostics and update code read, checked
// against the built-in host and the variants fixture.
#include "tests/simulator/SimTestSupport.h"

#include <set>

using namespace simtest;

namespace {

class Inventory : public SimTest {};

TEST_F(Inventory, StartUpAnswers) {
    EXPECT_STREQ("3.2.1", get_agt_version());
    Json::Value init = init_hba_lib(J(R"({"appId": 2})"));
    ASSERT_TRUE(init["result"].isInt());
    EXPECT_EQ(0, init["result"].asInt());
    EXPECT_EQ(3u, getNumberOfAdapters());

    Json::Value all = getAllAdaptersIndexString(Json::Value());
    ASSERT_TRUE(all["indexStrings"].isArray());
    std::vector<std::string> keys;
    for (const Json::Value& k : all["indexStrings"]) keys.push_back(k.asString());
    EXPECT_EQ((std::vector<std::string>{kFcHba, kHpHba, kCna}), keys);
    for (unsigned i = 0; i < keys.size(); ++i)
        EXPECT_EQ(i + 1, getAdapterId(J("{\"indexStr\": \"" + keys[i] + "\"}"))["adapterId"].asUInt());
}

// Members every adapter answers to getHbaByWwn / getHbaByMac, with their types.
TEST_F(Inventory, AdapterDetailsHaveTheMembersTheInventoryReads) {
    for (const char* fixture : {"default", "variants"}) {
        SCOPED_TRACE(fixture);
        ASSERT_EQ(0, tvrn_sim_load_fixture(fixture));
        const Json::Value all = getAllAdaptersIndexString(Json::Value())["indexStrings"];
        for (const Json::Value& key : all) {
            const std::string k = key.asString();
            Json::Value d = k.size() == 17 ? getHbaByMac(J("{\"mac\": \"" + k + "\"}")) : getHbaByWwn(J("{\"wwn\": \"" + k + "\"}"));
            SCOPED_TRACE(k);
            ASSERT_FALSE(isError(d)) << d;
            const Json::Value& h = d["hbaData"];
            for (const char* s : {"model", "serialNumber", "oemSerialNum", "partNum", "oem", "fruNum", "wwn"})
                EXPECT_TRUE(h[s].isString()) << s;
            for (const char* b : {"isCNA", "hasEthPort", "hbaStatus", "isMezz"}) EXPECT_TRUE(h[b].isBool()) << b;
            EXPECT_TRUE(h["portCount"].isIntegral());
            EXPECT_EQ(k.size() == 17, h.isMember("hbaMAC"));
            EXPECT_EQ(h["isCNA"].asBool(), h.isMember("hbaMAC"));
            EXPECT_TRUE(d["driver"]["storageDriverVersion"].isString());
            EXPECT_EQ(h["isCNA"].asBool(), d["driver"].isMember("networkDriverName"));
            EXPECT_TRUE(d["firmware"]["version"].isString());
            EXPECT_TRUE(d["firmware"]["biosVersion"].isString());
        }
    }
    // The CNA is found by its WWN as well as by its MAC.
    EXPECT_EQ("Tavrin-1020", getHbaByWwn(J(std::string("{\"wwn\": \"") + kCnaWwn + "\"}"))["hbaData"]["model"].asString());
}

TEST_F(Inventory, OemVpd) {
    Json::Value hp = getHbaByWwn(J(std::string("{\"wwn\": \"") + kHpHba + "\"}"))["hbaData"];
    EXPECT_EQ("HP", hp["oem"].asString());
    EXPECT_EQ(0u, hp["oemSerialNum"].asString().find(hp["partNum"].asString()));  // prefixed
    EXPECT_EQ(32u, hp["uuid"].asString().size());
    EXPECT_EQ("", getHbaByWwn(J(std::string("{\"wwn\": \"") + kFcHba + "\"}"))["hbaData"]["oemSerialNum"].asString());
}

// The variants fixture: all of the built-in host plus a mezzanine OEM adapter
// and a second CNA, with the odd cases the built-in host leaves out.
TEST_F(Inventory, VariantsHost) {
    ASSERT_EQ(0, tvrn_sim_load_fixture("variants")) << tvrn_sim_last_error();
    const Json::Value all = getAllAdaptersIndexString(Json::Value());
    std::vector<std::string> keys;
    for (const Json::Value& k : all["indexStrings"]) keys.push_back(k.asString());
    EXPECT_EQ((std::vector<std::string>{kFcHba, kHpHba, kDellHba, kCna, kCna2}), keys);

    Json::Value dell = getHbaByWwn(J(std::string("{\"wwn\": \"") + kDellHba + "\"}"))["hbaData"];
    EXPECT_EQ("DELL", dell["oem"].asString());
    EXPECT_EQ("Tavrin-K7M", dell["model"].asString());
    EXPECT_TRUE(dell["isMezz"].asBool());
    EXPECT_NE(0u, dell["oemSerialNum"].asString().find(dell["partNum"].asString()));  // not prefixed
    EXPECT_FALSE(dell.isMember("uuid"));
    EXPECT_FALSE(getFlashInfo(J(std::string("{\"indexStr\": \"") + kDellHba + "\"}"))["flashStatus"].asBool());
    EXPECT_TRUE(getFlashInfo(J(std::string("{\"indexStr\": \"") + kFcHba + "\"}"))["flashStatus"].asBool());

    Json::Value fail = diagMemoryTest(J(std::string("{\"hbaWwn\": \"") + kDellHba + "\"}"));
    EXPECT_TRUE(fail["failed"].asBool());
    EXPECT_EQ(3, fail["status"].asInt());
    for (const char* n : {"address", "expected value", "actual value", "error status", "error address"})
        EXPECT_TRUE(fail[n].isIntegral()) << n;

    // The second CNA: an optic of a kind the inventory does not know, no MTU.
    EXPECT_EQ("1000BASE-T", getOpticsSFP(J(std::string("{\"indexStr\": \"") + kCna2Eth + "\"}"))["transceiver"].asString());
    EXPECT_FALSE(getEthPortByEthMac(J(std::string("{\"mac\": \"") + kCna2Eth + "\"}"))["ethData"].isMember("mtu"));
}

TEST_F(Inventory, FcPortsOfEveryAdapterAnswerPortDetails) {
    int ports = 0;
    const Json::Value all = getAllAdaptersIndexString(Json::Value())["indexStrings"];
    for (const Json::Value& a : all) {
        Json::Value list = getFcPhyPortIndicesByAdapter(J("{\"indexStr\": \"" + a.asString() + "\"}"));
        ASSERT_TRUE(list["indexStrings"].isArray());
        for (const Json::Value& p : list["indexStrings"]) {
            ++ports;
            Json::Value port = getPortByWwn(J("{\"wwn\": \"" + p.asString() + "\"}"));
            SCOPED_TRACE(p.asString());
            EXPECT_EQ(p.asString(), port["wwn"].asString());
            for (const char* s : {"nodeWwn", "PortSymbolicName"}) EXPECT_TRUE(port[s].isString()) << s;
            for (const char* n : {"operatingSpeed", "portTypeMOFValue", "maxFrameSize", "portStatusValue"})
                EXPECT_TRUE(port[n].isIntegral()) << n;
            for (const char* b : {"portStatus", "isMezz", "beaconState"}) EXPECT_TRUE(port[b].isBool()) << b;
            // "isFCoE" is there exactly on the ports of CNAs, and then true.
            EXPECT_EQ(a.asString().size() == 17, port.isMember("isFCoE"));
            EXPECT_EQ(port.isMember("isFCoE"), port.get("isFCoE", false).asBool());
            ASSERT_TRUE(port["supportedPortSpeeds"].isArray());
            EXPECT_TRUE(port["supportedPortSpeeds"][0].isIntegral());
            // The statistics array of {"id", "value" as decimal text}.
            Json::Value stats = getDynamicPortStatistics(J("{\"indexStr\": \"" + p.asString() + "\"}"));
            ASSERT_TRUE(stats.isArray());
            ASSERT_GT(stats.size(), 0u);
            for (const Json::Value& e : stats) {
                EXPECT_TRUE(e["id"].isIntegral());
                ASSERT_TRUE(e["value"].isString());
                EXPECT_EQ(std::string::npos, e["value"].asString().find_first_not_of("0123456789"));
            }
        }
    }
    EXPECT_EQ(6, ports);
}

TEST_F(Inventory, PortVariety) {
    Json::Value down = getPortByWwn(J(std::string("{\"wwn\": \"") + kFcPort1 + "\"}"));
    EXPECT_EQ(99999, down["operatingSpeed"].asInt());
    EXPECT_TRUE(down["beaconState"].asBool());
    Json::Value disabled = getPortByWwn(J(std::string("{\"wwn\": \"") + kHpPort1 + "\"}"));
    EXPECT_FALSE(disabled["portStatus"].asBool());
    EXPECT_TRUE(isError(getOpticsSFP(J(std::string("{\"indexStr\": \"") + kHpPort1 + "\"}"))));  // no optic
    Json::Value fcoe = getPortByWwn(J(std::string("{\"wwn\": \"") + kFcoePort0 + "\"}"));
    EXPECT_TRUE(fcoe["isFCoE"].asBool());
    // Exact counters of adapter 1 port 0, as the statistics builder maps them.
    std::map<int, std::string> byId;
    for (const Json::Value& e : getDynamicPortStatistics(J(std::string("{\"indexStr\": \"") + kFcPort0 + "\"}")))
        byId[e["id"].asInt()] = e["value"].asString();
    EXPECT_EQ("123456", byId[1402]);
    EXPECT_EQ("9876543", byId[1403]);
    EXPECT_EQ("7", byId[1416]);
    EXPECT_EQ("42", byId[1401]);  // an id the builder skips
    std::set<int> fcoeIds;
    for (const Json::Value& e : getDynamicPortStatistics(J(std::string("{\"indexStr\": \"") + kFcoePort0 + "\"}")))
        fcoeIds.insert(e["id"].asInt());
    for (int id : {1615, 1616, 1624, 1625, 1626, 1627, 1628}) EXPECT_TRUE(fcoeIds.count(id)) << id;
}

TEST_F(Inventory, OpticsCarryPaddedSffTexts) {
    Json::Value sfp = getOpticsSFP(J(std::string("{\"indexStr\": \"") + kFcPort0 + "\"}"));
    for (const char* s : {"vendorName", "vendorPart", "serialNo", "revision", "extendedID", "speed"})
        EXPECT_TRUE(sfp[s].isString()) << s;
    EXPECT_EQ("UW1234          ", sfp["serialNo"].asString());
    std::map<std::string, std::string> transceivers;
    for (const char* mac : {kEth0, kEth1})
        transceivers[mac] = getOpticsSFP(J(std::string("{\"indexStr\": \"") + mac + "\"}"))["transceiver"].asString();
    EXPECT_EQ("10G_BASE-SR", transceivers[kEth0]);
    EXPECT_EQ("10G_BASE-LR", transceivers[kEth1]);
}

TEST_F(Inventory, EthernetPortsOfCnas) {
    EXPECT_EQ(0u, getEthPhyPortIndicesByAdapter(J(std::string("{\"indexStr\": \"") + kFcHba + "\"}"))["indexStrings"].size());
    Json::Value list = getEthPhyPortIndicesByAdapter(J(std::string("{\"indexStr\": \"") + kCna + "\"}"));
    ASSERT_EQ(2u, list["indexStrings"].size());
    Json::Value eth = getEthPortByEthMac(J("{\"mac\": \"" + list["indexStrings"][0].asString() + "\"}"))["ethData"];
    EXPECT_EQ("eth2", eth["ethDev"].asString());
    EXPECT_TRUE(eth["ethPortStateMOFValue"].isIntegral());
    EXPECT_EQ(1500, eth["mtu"].asInt());
    // Ethernet ports answer port details by MAC too (diagnostics disable them so).
    Json::Value port = getPortByWwn(J(std::string("{\"mac\": \"") + kEth0 + "\"}"));
    EXPECT_TRUE(port["portStatus"].asBool());
    EXPECT_EQ(3, getAdapterIdByPort(J(std::string("{\"indexStr\": \"") + kEth1 + "\"}"))["adapterId"].asInt());
    EXPECT_EQ(0, getAdapterIdByPort(J(R"({"indexStr": "00:00:00:00:00:01"})"))["adapterId"].asInt());
}

TEST_F(Inventory, RemotePortsAndLuns) {
    const std::string req = std::string("{\"pPortWwn\": \"") + kFcPort0 + "\", \"lPortWwn\": \"" + kFcPort0 + "\"";
    Json::Value rports = getAllRemotePorts(J(req + "}"));
    ASSERT_TRUE(rports.isArray());
    std::map<std::string, Json::Value> devices;
    for (const Json::Value& r : rports) {
        Json::Value full = getCompleteRemotePort(J(req + ", \"rPortWwn\": \"" + r["remotePortWwn"].asString() + "\"}"));
        ASSERT_FALSE(isError(full)) << full;
        devices[r["remotePortWwn"].asString()] = full;
    }
    ASSERT_EQ(4u, devices.size());
    EXPECT_EQ("Disk", devices[kDisk]["deviceData"]["type"].asString());
    EXPECT_EQ("Tape", devices[kTape]["deviceData"]["type"].asString());
    EXPECT_EQ("Media Changer", devices[kChanger]["deviceData"]["type"].asString());
    EXPECT_FALSE(devices[kInitiator]["deviceData"]["isTarget"].asBool());
    EXPECT_FALSE(devices[kInitiator].isMember("lunList"));
    for (const char* t : {kDisk, kTape, kChanger}) {
        EXPECT_TRUE(devices[t]["deviceData"]["isTarget"].asBool());
        EXPECT_TRUE(devices[t]["deviceData"]["stateMofValue"].isIntegral());
    }
    const Json::Value& luns = devices[kDisk]["lunList"];
    ASSERT_EQ(4u, luns.size());
    EXPECT_EQ("ACME    ", luns[3]["vendor"].asString());
    EXPECT_EQ("0001", luns[3]["productSerialNumber"].asString());
    EXPECT_FALSE(luns[3].isMember("lunDescription"));
    EXPECT_FALSE(luns[2].isMember("productSerialNumber"));
    EXPECT_EQ(3, luns[0]["lunDescIdType"].asInt());
    // The simulator's bookkeeping never leaks into answers.
    EXPECT_FALSE(devices[kDisk].isMember("statistics"));
    EXPECT_EQ(4u, getAllLunsByRemotePort(J(req + ", \"rPortWwn\": \"" + kDisk + "\"}"))["lunList"].size());
    // A LUN element without "productID" is kept as the fixture has it.
    Json::Value hp = getCompleteRemotePort(J(R"({"pPortWwn": "10:00:00:05:1e:5c:6d:70", "lPortWwn": "10:00:00:05:1e:5c:6d:70", "rPortWwn": "50:06:01:60:3b:a0:12:34"})"));
    EXPECT_FALSE(hp["lunList"][3].isMember("productID"));
}

TEST_F(Inventory, GlobalInfoAndHost) {
    Json::Value g = getGlobalInfo(Json::Value(Json::arrayValue));
    ASSERT_EQ(3, g["numOfAdapters"].asInt());
    const Json::Value& fc = g["adapter"][0];
    EXPECT_FALSE(fc["cna"].asBool());
    EXPECT_TRUE(fc["fc"].asBool());
    EXPECT_EQ(2, fc["numOfPorts"].asInt());
    EXPECT_EQ(kFcPort0, fc["portWwn"][0].asString());
    EXPECT_TRUE(fc["portHasFc"][1].asBool());
    const Json::Value& cna = g["adapter"][2];
    EXPECT_TRUE(cna["cna"].asBool());
    EXPECT_TRUE(cna["fcoe"].asBool());
    EXPECT_EQ(kCna, cna["mac"].asString());
    EXPECT_TRUE(cna["portHasEth"][0].asBool());
    EXPECT_TRUE(cna["portHasFcoe"][0].asBool());
    EXPECT_EQ(kEth0, cna["portMac"][0].asString());
    for (const char* list : {"portHasFc", "portWwn", "portHasEth", "portMac", "portHasFcoe", "fcoeMac"})
        EXPECT_EQ(cna["numOfPorts"].asUInt(), cna[list].size()) << list;
    // Every port getGlobalInfo names answers getPortByWwn.
    for (const Json::Value& a : g["adapter"])
        for (Json::ArrayIndex j = 0; j < a["numOfPorts"].asUInt(); ++j) {
            Json::Value req(Json::objectValue);
            if (a["portHasFc"][j].asBool()) req["wwn"] = a["portWwn"][j];
            else req["mac"] = a["portHasEth"][j].asBool() ? a["portMac"][j] : a["fcoeMac"][j];
            EXPECT_FALSE(isError(getPortByWwn(req))) << req;
        }
    Json::Value host = getHost(Json::Value(Json::arrayValue));
    EXPECT_EQ("Norvale Computing", host["result"]["hostManufacturer"].asString());
    EXPECT_EQ("NX-2200", host["result"]["hostModel"].asString());
}

TEST_F(Inventory, DiagnosticOutcomes) {
    Json::Value pass = diagMemoryTest(J(std::string("{\"hbaWwn\": \"") + kFcHba + "\"}"));
    EXPECT_FALSE(pass["failed"].asBool());
    const std::string lb = R"(", "mode": 1, "speed": 4, "dataPattern": 3048584629, "frameCount": 131072})";
    Json::Value ok = diagLoopbackTest(J(std::string("{\"portWwn\": \"") + kFcPort0 + lb));
    EXPECT_FALSE(ok["failed"].asBool());
    EXPECT_EQ(131072u, ok["transmitFrames"].asUInt());
    Json::Value lost = diagLoopbackTest(J(std::string("{\"portWwn\": \"") + kFcPort1 + lb));
    EXPECT_TRUE(lost["failed"].asBool());
    EXPECT_EQ(12u, lost["outstandingFrames"].asUInt());
    EXPECT_FALSE(diagPCILoopbackTest(J(std::string("{\"portWwn\": \"") + kEth0 + R"(", "dataPattern": 1, "frameCount": 2})"))["failed"].asBool());
    EXPECT_FALSE(diagEthLoopbackTest(J(std::string("{\"portWwn\": \"") + kEth0 + R"(", "mode": 8, "dataPattern": 1, "frameCount": 65536})"))["failed"].asBool());
}

// Keys must be in colon format and known; requests of the wrong shape answer
// an "error" object instead of crashing.
TEST_F(Inventory, BadKeysAndShapesAnswerErrors) {
    EXPECT_TRUE(isError(getHbaByWwn(J(R"({"wwn": "2000000051e0a0b0c"})"))));      // raw form
    EXPECT_TRUE(isError(getHbaByWwn(J(R"({"wwn": "20:00:00:05:1e:ff:ff:ff"})"))));  // unknown
    EXPECT_TRUE(isError(getPortByWwn(J(R"({"wwn": 1000})"))));                     // wrong type
    EXPECT_TRUE(isError(getPortByWwn(J(std::string("{\"mac\": \"") + kFcPort0 + "\"}"))));  // WWN as MAC
    EXPECT_TRUE(isError(getAllRemotePorts(J(std::string("{\"pPortWwn\": \"") + kFcPort0 + "\"}"))));  // missing member
    EXPECT_TRUE(isError(getCompleteRemotePort(J(std::string("{\"pPortWwn\": \"") + kFcPort0 + "\", \"lPortWwn\": \"" +
                                                kFcPort0 + "\", \"rPortWwn\": \"" + kTape + "0\"}"))));
    EXPECT_TRUE(isError(getDynamicFcoeStatistics(J(std::string("{\"indexStr\": \"") + kFcPort0 + "\"}"))));  // not FCoE

    const Json::Value bad[] = {Json::Value(), Json::Value(7), Json::Value("text"), J("[1, 2]"), J("{}"),
                               J(R"({"indexStr": 5, "wwn": [], "mac": {}, "pPortWwn": true, "portWwn": null})")};
    int answered = 0;
#define ENTRY_POINT(kind, symbol, pointer) ENTRY_POINT_##kind(symbol)
#define ENTRY_POINT_JSON(symbol)                                                                   \
    for (const Json::Value& b : bad) {                                                             \
        Json::Value a = symbol(b);                                                                 \
        EXPECT_TRUE(a.isObject() || a.isArray()) << #symbol << " answered " << a;                  \
        ++answered;                                                                                \
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
    // Nothing above changed the host.
    EXPECT_EQ(3u, getNumberOfAdapters());
}

}  // namespace
