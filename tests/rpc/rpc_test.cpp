// The JSON-RPC dispatcher and its 123 methods, in process, bound to the
// adapter-library simulator: what a request makes of the library (read back
// from the simulator's call recording) and what the response says.
#include <gtest/gtest.h>
#include <json/json.h>

#include <algorithm>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "gateway/CIMProviderTfaj.h"
#include "rpc/JsonRpcManager.h"
#include "simulator/SimControl.h"

namespace {

using CPTA::JsonRpcManager;

// Keys of the simulator's built-in host.
const std::pair<const char*, const char*> kKeys[] = {
    {"$A1", "20:00:00:05:1e:0a:0b:0c"},  // FC HBA
    {"$P1", "10:00:00:05:1e:0a:0b:0c"},  // its first port
    {"$P2", "10:00:00:05:1e:0a:0b:0d"},  // its second port
    {"$V1", "24:00:00:05:1e:0a:0b:0c"},  // a virtual port of $P1
    {"$R1", "50:05:07:68:01:10:f0:0d"},  // a disk seen through $P1
    {"$CNA", "00:05:1e:8a:4b:00"},       // the CNA
    {"$F1", "10:00:00:05:1e:8a:4b:01"},  // its first FCoE port
    {"$E1", "00:05:1e:8a:4b:01"},        // its first Ethernet port
};

std::string withKeys(std::string text) {
    for (const auto& k : kKeys)
        for (size_t at; (at = text.find(k.first)) != std::string::npos;)
            text.replace(at, std::string(k.first).size(), k.second);
    return text;
}

Json::Value parsed(const std::string& text) {
    Json::Value v;
    std::string errors;
    std::unique_ptr<Json::CharReader> reader(Json::CharReaderBuilder().newCharReader());
    EXPECT_TRUE(reader->parse(text.data(), text.data() + text.size(), &v, &errors))
        << errors << " in " << text;
    return v;
}

JsonRpcManager::response process(const std::string& text) {
    JsonRpcManager::response r;
    JsonRpcManager::instance()->process(text, r);
    return r;
}

// The parsed response to METHOD with PARAMS (JSON text, keys as $A1 ...).
Json::Value rpc(const std::string& method, const std::string& params) {
    JsonRpcManager::response r =
        process(withKeys("{\"version\": \"1.1\", \"id\": 1, \"method\": \"" + method +
                         "\", \"params\": " + params + "}"));
    EXPECT_EQ(200, r.status) << r.body;
    return parsed(r.body);
}

std::string errorText(const Json::Value& response) {
    const Json::Value& e = response["error"];
    return e["name"].asString() + " " + std::to_string(e["code"].asInt()) + " " +
           e["message"].asString();
}

Json::Value recorded() {
    return parsed(tvrn_sim_recorded_calls());
}

// Replaces one entry point for a test.
template <typename FP>
struct Stub {
    FP& slot;
    FP saved;
    Stub(FP& s, FP replacement) : slot(s), saved(s) { slot = replacement; }
    ~Stub() { slot = saved; }
};

class Rpc : public ::testing::Test {
protected:
    static void SetUpTestSuite() { CPTA::setupDLLEntryPoints(); }
    void SetUp() override { ASSERT_EQ(0, tvrn_sim_reset()); }
};

// ---------------------------------------------------------------------------
// The dispatcher
// ---------------------------------------------------------------------------

struct Dispatch_Case {
    const char* what;
    const char* request;
    const char* faultEntry;  // a fault injected into the simulator, or null
    tvrn_sim_fault_kind fault;
    const char* id;     // the response's "id" as JSON text; null: no "id"
    const char* error;  // "name code message"; "name code" checks no message; null: a result
};

const Dispatch_Case kDispatch[] = {
    {"unknown method",
     R"({"version": "1.0", "id": 7, "method": "discovery.nothing", "params": []})",
     nullptr,
     {},
     "7",
     "JSONRPCError 105 Procedure not found"},
    {"a result, no id",
     R"({"method": "discovery.getHbaByWwn", "params": ["$A1"]})",
     nullptr,
     {},
     nullptr,
     nullptr},
    {"any id comes back",
     R"({"id": {"a": [1]}, "method": "discovery.getServerTime"})",
     nullptr,
     {},
     R"({"a": [1]})",
     nullptr},
    {"wrong count",
     R"({"id": 1, "method": "discovery.getHbaByWwn", "params": []})",
     nullptr,
     {},
     "1",
     "USERDEFINEDError 51 Mismatch in number of parameters."},
    {"library error answer", R"({"id": 1, "method": "discovery.getHbaByWwn", "params": ["$A1"]})",
     "getHbaByWwn", TVRN_SIM_FAULT_ERROR_OBJECT, "1", "LibraryError 9 injected"},
    {"HbaAgentError", R"({"id": 1, "method": "discovery.getHbaByWwn", "params": ["$A1"]})",
     "getHbaByWwn", TVRN_SIM_FAULT_HBA_AGENT_ERROR, "1", "USERDEFINEDError 9 injected"},
    {"std::exception", R"({"id": 1, "method": "discovery.getHbaByWwn", "params": ["$A1"]})",
     "getHbaByWwn", TVRN_SIM_FAULT_STD_EXCEPTION, "1", "JSONRPCError 200 injected"},
    {"other exception", R"({"id": 1, "method": "discovery.getHbaByWwn", "params": ["$A1"]})",
     "getHbaByWwn", TVRN_SIM_FAULT_NON_STANDARD, "1",
     "UnCaughtError 5000 Unknown error that was not caught"},
    {"no answer", R"({"id": 1, "method": "discovery.getHbaByWwn", "params": ["$A1"]})",
     "getHbaByWwn", TVRN_SIM_FAULT_NULL_ANSWER, "1",
     "JSONRPCError 200 No answer from the adapter library to getHbaByWwn"},
    {"top-level array",
     R"([{"id": 1, "method": "discovery.getServerTime"}])",
     nullptr,
     {},
     nullptr,
     "USERDEFINEDError 55 Not a JSON Object format."},
    {"top-level number",
     "42",
     nullptr,
     {},
     nullptr,
     "USERDEFINEDError 55 Not a JSON Object format."},
    {"method not a string",
     R"({"id": 1, "method": ["discovery.getServerTime"]})",
     nullptr,
     {},
     "1",
     "JSONRPCError 105 Procedure not found"},
    {"no method", R"({"id": 1})", nullptr, {}, "1", "JSONRPCError 105 Procedure not found"},
    {"params an object",
     R"({"id": 1, "method": "discovery.getHbaByWwn", "params": {"a": "$A1"}})",
     nullptr,
     {},
     "1",
     "USERDEFINEDError 54 Not a JSON array format."},
    {"params a string",
     R"({"id": 1, "method": "discovery.getHbaByWwn", "params": "$A1"})",
     nullptr,
     {},
     "1",
     "USERDEFINEDError 54 Not a JSON array format."},
    {"text param an object",
     R"({"id": 1, "method": "discovery.getHbaByWwn", "params": [{}]})",
     nullptr,
     {},
     "1",
     "JSONRPCError 200"},
    {"object param a string",
     R"({"id": 1, "method": "configuration.setLunMaskDataForPort", "params": ["$P1", "x"]})",
     nullptr,
     {},
     "1",
     "USERDEFINEDError 55 Not a JSON Object format."},
    {"object param without its arrays",
     R"({"id": 1, "method": "configuration.setLunMaskDataForPort", "params": ["$P1", {}]})",
     nullptr,
     {},
     "1",
     "USERDEFINEDError 54 Not a JSON array format."},
    {"alias a string",
     R"({"id": 1, "method": "configuration.setAlias", "params": ["x"]})",
     nullptr,
     {},
     "1",
     "USERDEFINEDError 55 Not a JSON Object format."},
    {"comments allowed",
     "// a client's note\n{\"id\": 1, \"method\": \"discovery.getServerTime\"}",
     nullptr,
     {},
     "1",
     nullptr},
};

TEST_F(Rpc, DispatcherAnswersEveryRequestShape) {
    for (const Dispatch_Case& c : kDispatch) {
        SCOPED_TRACE(c.what);
        tvrn_sim_reset();
        if (c.faultEntry) {
            ASSERT_EQ(0, tvrn_sim_set_fault(c.faultEntry, "", c.fault, 9, "injected", 0));
        }
        JsonRpcManager::response r = process(withKeys(c.request));
        ASSERT_EQ(200, r.status) << r.body;
        Json::Value response = parsed(r.body);
        EXPECT_EQ("1.1", response["version"].asString());
        EXPECT_EQ(c.id != nullptr, response.isMember("id"));
        if (c.id) {
            EXPECT_EQ(parsed(c.id), response["id"]);
        }
        EXPECT_EQ(c.error == nullptr, response.isMember("result")) << r.body;
        if (c.error == nullptr)
            continue;
        const std::string expected = c.error, actual = errorText(response);
        EXPECT_EQ(expected, actual.substr(0, expected.size())) << r.body;
        EXPECT_EQ(3u, response["error"].size()) << r.body;
    }
}

// A request whose params nest `depth` arrays deep.
std::string nested(size_t depth) {
    return R"({"id": 1, "method": "discovery.getGlobalInfo", "params": )" +
           std::string(depth, '[') + std::string(depth, ']') + "}";
}

TEST_F(Rpc, TextThatIsNotJsonGetsTheParseFailureText) {
    EXPECT_EQ(200, process(nested(JsonRpcManager::kMaxNesting - 1)).status);
    for (const std::string& text : {std::string("{\"method\": "), std::string(),
                                    nested(JsonRpcManager::kMaxNesting), nested(1000000)}) {
        JsonRpcManager::response r = process(text);
        EXPECT_EQ(500, r.status);
        EXPECT_EQ(0u, r.body.find(JsonRpcManager::kParseFailure)) << r.body;
        EXPECT_GT(r.body.size(), std::string(JsonRpcManager::kParseFailure).size());
    }
}

// ---------------------------------------------------------------------------
// Every method: the entry point it calls and the request it sends
// ---------------------------------------------------------------------------

struct Method_Case {
    const char* method;
    const char* params;
    const char* entry;  // the first entry point called
    // Its request: the members the params go to, in order ("-": a param not
    // sent; "name=value": a constant number or text), or the request as a
    // JSON text; null: the params themselves.
    const char* request;
};

std::ostream& operator<<(std::ostream& os, const Method_Case& c) {
    return os << c.method;
}

Json::Value expectedRequest(const Method_Case& c) {
    const Json::Value params = parsed(withKeys(c.params));
    if (c.request == nullptr)
        return params;
    if (c.request[0] == '{' || std::string(c.request) == "null")
        return parsed(withKeys(c.request));
    Json::Value request(Json::objectValue);
    std::istringstream words(withKeys(c.request));
    Json::ArrayIndex next = 0;
    for (std::string word; words >> word;) {
        const size_t eq = word.find('=');
        if (eq == std::string::npos) {
            if (word != "-")
                request[word] = params[next];
            ++next;
            continue;
        }
        const std::string value = word.substr(eq + 1);
        request[word.substr(0, eq)] = value.find_first_not_of("0123456789") == std::string::npos
                                          ? Json::Value(std::stoi(value))
                                          : Json::Value(value);
    }
    return request;
}

const Method_Case kMethods[] = {
    {"discovery.getHost", "[]", "getHost", nullptr},
    {"discovery.getGlobalInfo", "[]", "getGlobalInfo", nullptr},
    {"discovery.getHbaByWwn", R"(["$A1"])", "getHbaByWwn", "wwn"},
    {"discovery.getAllHbasByHost", "[]", "getGlobalInfo", nullptr},
    {"discovery.getAllPortsByHba", R"(["$A1"])", "getGlobalInfo", nullptr},
    {"discovery.getPortByWwn", R"(["$P1"])", "getPortByWwn", "wwn"},
    {"discovery.getFcByFcWwn", R"(["$P1"])", "getFcByFcWwn", "wwn"},
    {"discovery.getAllFcByPort", R"(["$P1"])", "getFcByFcWwn", "wwn"},
    {"discovery.getPortStatistics", R"(["$P1"])", "getPortStatistics", "indexStr"},
    {"discovery.getPortAuthentication", R"(["$P1"])", "getPortAuthentication", "wwn"},
    {"discovery.getAllRemotePorts", R"(["$P1", "$P1"])", "getAllRemotePorts", "pPortWwn lPortWwn"},
    {"discovery.getCompleteRemotePort", R"(["$P1", "$P1", "$R1"])", "getCompleteRemotePort",
     "pPortWwn lPortWwn rPortWwn"},
    {"discovery.getAllLunsByRemotePort", R"(["$P1", "$P1", "$R1"])", "getAllLunsByRemotePort",
     "pPortWwn lPortWwn rPortWwn"},
    {"discovery.getAllVPorts", R"(["$P1"])", "getAllVPorts", "wwn"},
    {"discovery.getVPort", R"(["$P1", "$V1"])", "getVPort", "pPortWwn lPortWwn"},
    {"discovery.getServerTime", "[]", "getServerTime", nullptr},
    {"discovery.getDynamicQosStatistics", R"(["$P1"])", "getDynamicQosStatistics", "pPortWwn"},
    {"discovery.getDynamicPortStatistics", R"(["$P1"])", "getDynamicPortStatistics", "indexStr"},
    {"discovery.getDynamicRemotePortStatistics", R"(["$P1", "$P1", "$R1"])",
     "getDynamicRPortStatistics", "pPortWwn lPortWwn rPortWwn vfId=0"},
    {"discovery.getDynamicVportStatistics", R"(["$P1", "$V1"])", "getDynamicVPortStatistics",
     "pPortWwn lPortWwn vfId=0"},
    {"discovery.getDynamicLogicalPortStatistics", R"(["$P1", "$P1"])",
     "getDynamicLogicalPortStatistics", "pPortWwn lPortWwn vfId=0"},
    {"discovery.getDynamicFcpimIOPStatistics", R"(["$P1", "$P1", "$R1"])",
     "getDynamicFcpimIopStatistics", "pPortWwn lPortWwn rPortWwn vfId=0"},
    {"discovery.getDynamicFcpimStatistics", R"(["$P1", "$P1", "$R1"])", "getDynamicFcpimStatistics",
     "pPortWwn lPortWwn rPortWwn"},
    {"discovery.getDynamicFabricStatistics", R"(["$P1"])", "getDynamicFabricStatistics",
     "wwn vfID=0"},
    {"discovery.getDynamicPortAuthenticationStatistics", R"(["$P1"])",
     "getDynamicPortAuthStatistics", "pPortWwn"},
    {"discovery.getDynamicIocStatistics", R"(["$P1"])", "getDynamicIocStatistics", "pwwn"},
    {"discovery.getBootOverSanByPort", R"(["$P1"])", "getBootOverSanByPort", "indexStr"},
    {"discovery.getAdvPortDataByPort", R"(["$P1"])", "getAdvPortDataByPort", "indexStr"},
    {"discovery.getFcoeByPort", R"(["$F1"])", "getFcoeByPort", "indexStr"},
    {"discovery.getFcoeByFcoeWwn", R"(["$F1"])", "getFcoeByPort", "indexStr"},
    {"discovery.getAllFcoeByPort", R"(["$F1"])", "getFcoeByPort", "indexStr"},
    {"discovery.getDynamicFcoeStatistics", R"(["$F1"])", "getDynamicFcoeStatistics", "indexStr"},
    {"discovery.getDynamicFcpimModStatistics", R"(["$P1"])", "getDynamicFcpimModStatistics",
     "indexStr"},
    {"discovery.getDynamicFirmwareStatistics", R"(["$A1"])", "getDynamicFirmwareStatistics",
     "indexStr"},
    {"discovery.getDynamicTrunkingStatistics", R"(["$A1"])", "getDynamicTrunkingStatistics",
     "indexStr"},
    {"discovery.getCompleteEthByPort", R"(["$E1"])", "getEthPortByEthMac", "mac"},
    {"discovery.getCompleteEthByEthMac", R"(["$E1"])", "getEthPortByEthMac", "mac"},
    {"discovery.getAllEthByPort", R"(["$E1"])", "getAllEthPortByEthMac", "mac"},
    {"discovery.getLldp", R"(["$E1"])", "getLldp", "mac"},
    {"discovery.getCee", R"(["$E1"])", "getCee", "mac"},
    {"discovery.getDynamicEthernetPortStatistics", R"(["$E1"])", "getDynamicEthernetPortStatistics",
     "mac"},
    {"discovery.getDynamicIOCEthernetStatistics", R"(["$E1"])", "getDynamicIOCEthernetStatistics",
     "mac"},
    {"discovery.getDynamicvHBAStatistics", R"(["$V1"])", "getDynamicvHBAStatistics", "wwn"},
    {"discovery.getDynamicvNICStatistics", R"(["$E1"])", "getDynamicvNICStatistics", "mac"},
    {"discovery.getDynamicvNICStatisticsForGraph", R"(["$E1"])", "getDynamicvNICStatisticsForGraph",
     "mac"},
    {"discovery.getDynamicLldpStatistics", R"(["$E1"])", "getDynamicLldpStatistics", "mac"},
    {"discovery.getDynamicAdvancedIoDataAtPPort", R"(["$P1"])", "getDynamicAdvancedIoDataAtPPort",
     "pPortWwn vfId=0"},
    {"discovery.getDynamicAdvancedIoDataAtLPort", R"(["$P1", "$P1"])",
     "getDynamicAdvancedIoDataAtLPort", "pPortWwn lPortWwn vfId=0"},
    {"discovery.getDynamicAdvancedIoDataAtRPort", R"(["$P1", "$P1", "$R1"])",
     "getDynamicAdvancedIoDataAtRPort", "pPortWwn lPortWwn rPortWwn vfId=0"},
    {"discovery.getDynamicAdvancedIoDataAtLun", R"(["$P1", "$P1", "$R1", "0"])",
     "getDynamicAdvancedIoDataAtLun", "pPortWwn lPortWwn rPortWwn lunId vfId=0"},
    {"discovery.getDriverUpdateStatusLog", "[]", "getDriverUpdateStatus", nullptr},
    {"discovery.getLunMaskDataByPort", R"(["$P1"])", "getLunMaskData", "indexStr"},
    {"discovery.getAdvAdapterData", R"(["$A1"])", "getAdvAdapterData", "indexStr"},
    {"discovery.getAllPCIFunctions", R"(["$A1"])", "getAdapterPciFnData", "indexStr"},
    {"discovery.getAdvancedIoProfile", R"(["$P1"])", "getAdvIoProfile", "indexStr"},
    {"configuration.createVPort",
     R"(["$P1", "20:00:00:05:1e:0a:0b:99", "24:00:00:05:1e:0a:0b:99", "v9"])", "createVport",
     "pwwn nwwn vwwn symbolicName vfId=0"},
    {"configuration.deleteVPort", R"(["$P1", ["$V1"]])", "deleteVport", "pwwn vportArray vfId=0"},
    {"configuration.setAlias", R"([{"type": "Node", "wwn": "$A1", "alias": "left"}])",
     "setAdapterAlias", R"({"type": "Node", "wwn": "$A1", "alias": "left"})"},
    {"configuration.setAliases", R"([[{"type": "CNA", "mac": "$CNA", "alias": "right"}]])",
     "setPortAlias", R"({"type": "CNA", "mac": "$CNA", "alias": "right"})"},
    {"configuration.setPortByWwn", R"(["$P1", {"portStatus": false}, ["portStatus"]])",
     "setPortByWwn", "indexStr port propArray"},
    {"configuration.setPortAuthentication", R"(["$P1", {"authEnabled": true}])",
     "setPortAuthentication", "pPortWwn portAuth"},
    {"configuration.setFcByFcWwn", R"(["$P1", {"topology": "loop"}, ["topology"]])", "setFcByFcWwn",
     "portWwn fcPortData paramsConfigured"},
    {"configuration.setHbaStatus", R"(["$A1", true])", "setAdapterState", "indexStr enableState"},
    {"configuration.setFCTrunkingState", R"(["$A1", true])", "setFcTrunkingState",
     "indexStr enableState"},
    {"configuration.setFcoeByFcoeWwn", R"(["$F1", {"topology": "loop"}, ["topology"]])",
     "setFcByFcWwn", "portWwn fcPortData paramsConfigured"},
    {"configuration.setFcoePort", R"(["$F1", {"vlanId": 1003}, ["vlanId"]])", "setFcoeByPort",
     "indexStr fcoePort propArray"},
    {"configuration.setEthPort", R"(["$E1", {"mtu": 9000}, ["mtu"]])", "setEthPort",
     "mac ethPort propArray"},
    {"configuration.clearLogsForPort", R"([["$P1"]])", "clearLogsForPort", "propArray"},
    {"configuration.setAdapterMode", R"(["$A1", 2])", "setAdapterMode", "indexStr adapterMode"},
    {"configuration.setLunMaskDataForPort",
     R"(["$P1", {"addedLunMaskData": [{"lun": 1}], "removedLunMaskData": [], "other": 1}])",
     "setLunMaskData",
     R"({"indexStr": "$P1", "addedLunMaskData": [{"lun": 1}], "removedLunMaskData": [], "clearLunMaskData": false})"},
    {"configuration.setAdvancedIoProfile", R"(["$P1", {"addedAdvancedIoProfiles": [{"a": 1}]}])",
     "setAdvIoProfile", R"({"indexStr": "$P1", "addedAdvancedIoProfiles": [{"a": 1}]})"},
    {"configuration.clearAdvancedIoProfilesAtPort", R"(["$P1"])", "clearAdvIoProfile", "indexStr"},
    {"configuration.clearAdvancedIoProfilesAtLogicalPort", R"(["$P1", "$P1"])", "clearAdvIoProfile",
     "indexStr lPortWwn"},
    {"configuration.clearAdvancedIoProfilesAtRemotePort", R"(["$P1", "$P1", "$R1"])",
     "clearAdvIoProfile", "indexStr lPortWwn rPortWwn"},
    {"configuration.clearAdvancedIoProfileOfLun", R"(["$P1", "$P1", "$R1", "1"])",
     "clearAdvIoProfile", "indexStr lPortWwn rPortWwn lunId"},
    {"configuration.resetDataForAdvancedIoAtPPort", R"(["$P1"])", "resetDataForAdvIoProf",
     "indexStr"},
    {"configuration.resetDataForAdvancedIoAtLPort", R"(["$P1", "$P1"])", "resetDataForAdvIoProf",
     "indexStr lPortWwn"},
    {"configuration.resetDataForAdvancedIoAtRPort", R"(["$P1", "$P1", "$R1"])",
     "resetDataForAdvIoProf", "indexStr lPortWwn rPortWwn"},
    {"configuration.resetDataForAdvancedIoAtLun", R"(["$P1", "$P1", "$R1", "0"])",
     "resetDataForAdvIoProf", "indexStr lPortWwn rPortWwn lunId"},
    {"configuration.resetDataForAdvancedIoForLunRange", R"(["$P1", "$P1", "$R1", "0", "3"])",
     "resetDataForAdvIoProf", "indexStr lPortWwn rPortWwn lunId endLunRange"},
    {"configuration.createVnic", R"(["$E1", 10, 50])", "createvNIC",
     "mac minBandwidth maxBandwidth"},
    {"configuration.deleteVnics", R"(["$E1", []])", "deletevNICs", "mac pciFunctionIndices"},
    {"configuration.modifyVnic", R"(["$E1", []])", "modifyvNIC", "mac vNICs"},
    {"diagnostics.startTests", R"(["5", false])", "startTests", "requestID stopOnError"},
    {"diagnostics.cancelTests", R"(["5"])", "cancelTests", "requestID"},
    {"diagnostics.doQuickTest", R"(["7", "$A1"])", "postDiagnostics",
     "requestID hbaWwn function=QuickTest"},
    {"diagnostics.doPOSTest", R"(["7", "$P1", true])", "setDport", "requestID portWwn state"},
    {"diagnostics.doEchoTest",
     R"(["7", "$A1", [{"portWwn": "$P1", "localPortWwn": "$P1", "remotePortWwn": "$R1", "vfID": -1}], 2])",
     "postDiagnostics",
     "requestID hbaWwn - numCycles function=EchoTest vfID=0 portWwn=$P1 localPortWwn=$P1 "
     "remotePortWwn=$R1"},
    {"diagnostics.doMemoryTest", R"(["7", "$A1"])", "postDiagnostics",
     "requestID hbaWwn function=MemoryTest"},
    {"diagnostics.doPCILoopbackTest", R"(["7", "$A1", "$P1", "16", "1", 2])", "postDiagnostics",
     "requestID hbaWwn portWwn frameCount dataPattern numCycles function=PCILoopbackTest"},
    {"diagnostics.doLoopbackTest", R"(["7", "not read", "$P1", 1, 8, 2, "16", "1"])",
     "postDiagnostics",
     "requestID - portWwn mode speed numCycles frameCount dataPattern function=LoopbackTest"},
    {"diagnostics.doLEDTest", R"(["7", "$A1", "$P1", 1, 2, 3, 4])", "postDiagnostics",
     "requestID hbaWwn portWwn ledBitmap command color frequency function=LEDTest"},
    {"diagnostics.doFCPingTest",
     R"(["7", "$A1", [{"portWwn": "$P1", "localPortWwn": "$P1", "remotePortWwn": "$R1", "vfID": -1}], 2])",
     "postDiagnostics",
     "requestID hbaWwn - numCycles function=FCPingTest vfID=0 portWwn=$P1 localPortWwn=$P1 "
     "remotePortWwn=$R1"},
    {"diagnostics.doFCTraceRoute",
     R"(["7", "$A1", [{"portWwn": "$P1", "localPortWwn": "$P1", "remotePortWwn": "$R1", "vfID": -1}], 2])",
     "postDiagnostics",
     "requestID hbaWwn - numCycles function=FCTraceTest vfID=0 portWwn=$P1 localPortWwn=$P1 "
     "remotePortWwn=$R1"},
    {"diagnostics.doEthLoopbackTest", R"(["7", "not read", "$E1", 1, 10, 2, "16", "1"])",
     "postDiagnostics",
     "requestID - portWwn mode speed numCycles frameCount dataPattern function=EthLoopbackTest"},
    {"diagnostics.doQueueTest", R"(["7", "$A1", "$P1"])", "postDiagnostics",
     "requestID hbaWwn portWwn function=QueueTest"},
    {"diagnostics.getOpticsPOM", R"(["$P1"])", "getOpticsPOM", "portWwn"},
    {"diagnostics.getOpticsSFP", R"(["$P1"])", "getOpticsSFP", "indexStr"},
    {"diagnostics.getRequestID", "[]", "getRequestID", "null"},
    {"diagnostics.getDiagnosticsResults", R"(["5"])", "getDiagnosticsResults", "requestID"},
    {"diagnostics.dPortEnable", R"(["7", "$P1", false])", "setDport", "requestID portWwn state"},
    {"diagnostics.doDportTest", R"(["7", "$A1", "$P1", "16", "1", 2])", "postDiagnostics",
     "requestID hbaWwn portWwn frameCount dataPattern numCycles function=DPortTest"},
    {"diagnostics.getDPortTestResults", R"(["$P1"])", "getDPortTestResult", "portWwn"},
    {"configuration.resetPortAuthentication", R"(["$P1"])", "resetPortAuthentication", "pPortWwn"},
    {"configuration.resetStatisticsForPortAuthentication", R"(["$P1"])",
     "resetStatisticsForPortAuth", "wwn"},
    {"configuration.resetStatisticsForPorts", R"([["$P1"]])", "resetStatisticsForPort",
     R"({"indexStr": "$P1"})"},
    {"configuration.resetStatisticsForPort", R"(["$P1"])", "resetStatisticsForPort", "indexStr"},
    {"configuration.resetStatisticsForLPort", R"(["$P1", "$V1"])", "resetStatisticsForLPort",
     "pwwn lwwn vfId=0"},
    {"configuration.resetStatisticsForVPort", R"(["$P1", "$V1"])", "resetStatisticsForVPort",
     "pwwn vwwn vfId=0"},
    {"configuration.resetStatisticsForRPort", R"(["$P1", "$P1", "$R1"])", "resetStatisticsForRPort",
     "pPortWwn lPortWwn rPortWwn vfId=0"},
    {"configuration.resetStatisticsForFcpim", R"(["$P1", "$P1", "$R1"])", "resetStatisticsForFcpim",
     "pPortWwn lPortWwn rPortWwn vfId=0"},
    {"configuration.resetStatisticsForIoc", R"(["$P1"])", "resetStatisticsForIoc", "pwwn"},
    {"configuration.resetStatisticsForFabric", R"(["$P1"])", "resetStatisticsForFabric",
     "pwwn vfId=0"},
    {"configuration.resetStatisticsForQos", R"(["$P1"])", "resetStatisticsForQos", "pPortWwn"},
    {"configuration.resetFirmwareStatistics", R"(["$A1"])", "resetFirmwareStatistics", "indexStr"},
    {"configuration.resetTrunkingStatistics", R"(["$A1"])", "resetTrunkingStatistics", "indexStr"},
    {"configuration.resetLldpStatistics", R"(["$E1"])", "resetLldpStatistics", "mac"},
    {"configuration.resetIOCEthernetStatistics", R"(["$E1"])", "resetIOCEthernetStatistics", "mac"},
    {"configuration.resetEthernetPortStatistics", R"(["$E1"])", "resetEthernetPortStatistics",
     "mac"},
    {"configuration.resetvNICStatistics", R"(["$E1"])", "resetvNICStatistics", "mac"},
    {"configuration.resetFcoeStatistics", R"(["$F1"])", "resetFcoeStatistics", "indexStr"},
    {"configuration.resetvHBAStatistics", R"(["$V1"])", "resetvHBAStatistics", "wwn"},
    {"configuration.resetStatisticsForFcpimMod", R"(["$P1"])", "resetStatisticsForFcpimMod",
     "indexStr"},
};

class Every_Method : public Rpc, public ::testing::WithParamInterface<Method_Case> {};

TEST_P(Every_Method, SendsItsRequestToItsEntryPoint) {
    const Method_Case& c = GetParam();
    // A diagnostic request "5" with one test posted, for the methods that need one.
    Json::Value posted(Json::objectValue);
    posted["function"] = "QuickTest";
    posted["requestID"] = "5";
    ASSERT_FALSE(CPTA::libPostDiagnostics(posted).isMember("error"));
    tvrn_sim_clear_recording();

    const Json::Value response = rpc(c.method, c.params);
    EXPECT_TRUE(response.isMember("result")) << response.toStyledString();
    const Json::Value calls = recorded();
    ASSERT_GE(calls.size(), 1u);
    EXPECT_EQ(c.entry, calls[0]["entry"].asString());
    EXPECT_EQ(expectedRequest(c), calls[0]["request"]);

    // A method that takes params refuses one more and one less.
    const Json::Value params = parsed(withKeys(c.params));
    if (params.empty())
        return;
    for (int change : {+1, -1}) {
        Json::Value wrong = params;
        if (change > 0)
            wrong.append("extra");
        else
            wrong.resize(params.size() - 1);
        tvrn_sim_clear_recording();
        const Json::Value refused = rpc(c.method, Json::FastWriter().write(wrong));
        EXPECT_EQ(51, refused["error"]["code"].asInt()) << change;
        EXPECT_EQ(0u, recorded().size()) << change;
    }
}

INSTANTIATE_TEST_SUITE_P(Rpc, Every_Method, ::testing::ValuesIn(kMethods),
                         [](const ::testing::TestParamInfo<Method_Case>& info) {
                             std::string name = info.param.method;
                             std::replace(name.begin(), name.end(), '.', '_');
                             return name;
                         });

TEST_F(Rpc, EveryRegisteredMethodIsWalked) {
    std::set<std::string> walked;
    for (const Method_Case& c : kMethods)
        walked.insert(c.method);
    const std::vector<std::string> registered = JsonRpcManager::instance()->getMethods();
    EXPECT_EQ(123u, registered.size());
    EXPECT_EQ(walked, std::set<std::string>(registered.begin(), registered.end()));
    EXPECT_TRUE(std::is_sorted(registered.begin(), registered.end()));
}

// ---------------------------------------------------------------------------
// What the table cannot say
// ---------------------------------------------------------------------------

TEST_F(Rpc, A17CharacterKeyIsAMacAnyOtherAWwn) {
    const std::pair<const char*, const char*> cases[] = {
        {"$CNA", R"({"mac": "$CNA"})"},
        {"$A1", R"({"wwn": "$A1"})"},
        {"abc", R"({"wwn": "abc"})"},
    };
    for (const auto& c : cases) {
        tvrn_sim_clear_recording();
        rpc("discovery.getHbaByWwn", std::string("[\"") + c.first + "\"]");
        EXPECT_EQ(parsed(withKeys(c.second)), recorded()[0]["request"]) << c.first;
    }
}

TEST_F(Rpc, LoopbackTestTakesEightParams) {
    const Json::Value seven =
        rpc("diagnostics.doLoopbackTest", R"(["7", "$A1", "$P1", 1, 8, 2, "16"])");
    EXPECT_EQ(51, seven["error"]["code"].asInt());
    EXPECT_EQ(0u, recorded().size());
}

TEST_F(Rpc, TargetTestsMakeAFreshRequestPerTarget) {
    const Json::Value response = rpc("diagnostics.doFCPingTest", R"(["7", "$A1", [
        {"portWwn": "$P1", "localPortWwn": "$P1", "remotePortWwn": "$R1", "vfID": -1},
        {"portWwn": "$P1", "vfID": 3}], 1])");
    const Json::Value calls = recorded();
    ASSERT_EQ(2u, calls.size());
    EXPECT_EQ(0, calls[0]["request"]["vfID"].asInt());
    EXPECT_EQ(3, calls[1]["request"]["vfID"].asInt());
    EXPECT_FALSE(calls[1]["request"].isMember("remotePortWwn"));  // not the first target's
    EXPECT_EQ(1, response["result"]["testIndex"].asInt());        // the second answer

    // A failing first target is the call's error; no later target hides it.
    tvrn_sim_clear_recording();
    ASSERT_EQ(0,
              tvrn_sim_set_fault("postDiagnostics", "", TVRN_SIM_FAULT_ERROR_OBJECT, 9, "down", 1));
    const Json::Value failed = rpc("diagnostics.doEchoTest", R"(["8", "$A1", [
        {"portWwn": "$P1"}, {"portWwn": "$P1"}], 1])");
    EXPECT_EQ("LibraryError 9 down", errorText(failed));
    EXPECT_EQ(1u, recorded().size());

    EXPECT_TRUE(rpc("diagnostics.doFCTraceRoute", R"(["8", "$A1", [], 1])")["result"].isNull());
    EXPECT_EQ(
        54, rpc("diagnostics.doFCPingTest", R"(["8", "$A1", "$P1", 1])")["error"]["code"].asInt());
}

TEST_F(Rpc, AliasesByTypeAndTheirErrors) {
    EXPECT_TRUE(rpc("configuration.setAliases", "[[]]")["result"].isNull());
    EXPECT_EQ(54, rpc("configuration.setAliases", R"(["x"])")["error"]["code"].asInt());
    EXPECT_EQ(55,
              rpc("configuration.setAlias", R"([{"type": "Port", "wwn": "$A1"}])")["error"]["code"]
                  .asInt());
    EXPECT_EQ(0u, recorded().size());

    const Json::Value two = rpc("configuration.setAliases", R"([[
        {"type": "Node", "wwn": "$A1", "alias": "a"}, {"type": "CNA", "mac": "$CNA", "alias": "c"}]])");
    EXPECT_EQ(2u, two["result"].size());
    const Json::Value failed = rpc("configuration.setAliases", R"([[
        {"type": "Node", "wwn": "$A1", "alias": "a"},
        {"type": "Node", "wwn": "20:00:00:00:00:00:00:01", "alias": "b"}]])");
    EXPECT_EQ(3, failed["error"]["code"].asInt()) << failed;  // the second one's answer
}

TEST_F(Rpc, PortResetsSkipFailedPortsAndFailWhenNoneWasReset) {
    const std::string none = "JSONRPCError 200 Couldnt reset any of the port statistics";
    EXPECT_EQ(none, errorText(rpc("configuration.resetStatisticsForPorts", "[[]]")));

    for (tvrn_sim_fault_kind kind : {TVRN_SIM_FAULT_HBA_AGENT_ERROR, TVRN_SIM_FAULT_ERROR_OBJECT,
                                     TVRN_SIM_FAULT_NULL_ANSWER}) {
        tvrn_sim_clear_faults();
        ASSERT_EQ(0, tvrn_sim_set_fault("resetStatisticsForPort", withKeys("$P2").c_str(), kind, 9,
                                        "busy", 0));
        const Json::Value one = rpc("configuration.resetStatisticsForPorts", R"([["$P1", "$P2"]])");
        EXPECT_EQ(1u, one["result"].size()) << kind << one;
        EXPECT_EQ(none, errorText(rpc("configuration.resetStatisticsForPorts", R"([["$P2"]])")));
    }

    // Any other exception ends the call.
    ASSERT_EQ(0, tvrn_sim_set_fault("resetStatisticsForPort", "", TVRN_SIM_FAULT_STD_EXCEPTION, 0,
                                    "gone", 0));
    EXPECT_EQ("JSONRPCError 200 gone",
              errorText(rpc("configuration.resetStatisticsForPorts", R"([["$P1"]])")));
}

TEST_F(Rpc, AdapterWalksBelieveOnlyWhatIsThere) {
    // Every adapter by its kind: two FC HBAs by WWN, the CNA by MAC.
    const Json::Value all = rpc("discovery.getAllHbasByHost", "[]");
    EXPECT_EQ(3u, all["result"].size());
    std::vector<std::string> entries;
    for (const Json::Value& c : recorded())
        entries.push_back(c["entry"].asString());
    EXPECT_EQ(
        (std::vector<std::string>{"getGlobalInfo", "getHbaByWwn", "getHbaByWwn", "getHbaByMac"}),
        entries);
    const Json::Value ports = rpc("discovery.getAllPortsByHba", R"(["$CNA"])");
    EXPECT_EQ(2u, ports["result"].size()) << ports;  // one answer per port position

    // The library's error answer is the call's error.
    ASSERT_EQ(0, tvrn_sim_set_fault("getGlobalInfo", "", TVRN_SIM_FAULT_ERROR_OBJECT, 9, "no", 0));
    EXPECT_EQ("LibraryError 9 no", errorText(rpc("discovery.getAllHbasByHost", "[]")));
    EXPECT_EQ("LibraryError 9 no", errorText(rpc("discovery.getAllPortsByHba", R"(["$A1"])")));
    tvrn_sim_clear_faults();

    // No matching adapter, and an empty key (FC HBAs have an empty "mac").
    for (const char* key : {"", "20:00:00:00:00:00:00:01"})
        EXPECT_EQ(200, rpc("discovery.getAllPortsByHba",
                           std::string("[\"") + key + "\"]")["error"]["code"]
                           .asInt())
            << key;

    // Counts far beyond the arrays present make no more calls than there are entries.
    static Json::Value info;
    info = parsed(withKeys(R"({"numOfAdapters": 2000000000, "adapter": [{"wwn": "$A1",
        "fc": true, "numOfPorts": 2000000000, "portHasFc": [true], "portWwn": ["$P1"]}]})"));
    Stub<CPTA::JsonReqFP> stub(CPTA::libGetGlobalInfo, [](const Json::Value&) { return info; });
    tvrn_sim_clear_recording();
    EXPECT_EQ(1u, rpc("discovery.getAllHbasByHost", "[]")["result"].size());
    EXPECT_EQ(1u, rpc("discovery.getAllPortsByHba", R"(["$A1"])")["result"].size());
    EXPECT_EQ(2u, recorded().size());
}

TEST_F(Rpc, NoRequestIdIsAnError) {
    Stub<CPTA::VoidRetIntFP> stub(CPTA::libGetRequestID, [] { return -1; });
    EXPECT_EQ(200, rpc("diagnostics.getRequestID", "[]")["error"]["code"].asInt());
}

TEST_F(Rpc, SecretsAreMaskedInLogText) {
    const JsonRpcManager* m = JsonRpcManager::instance();
    const std::string set = withKeys(
        R"({"method": "configuration.setPortAuthentication", "params": ["$P1", {"chap": "s3"}]})");
    ASSERT_TRUE(m->isSecret(set));
    EXPECT_FALSE(m->isSecret(R"({"method": "discovery.getServerTime"})"));
    const std::string logged = m->loggable(set, true);
    EXPECT_EQ(std::string::npos, logged.find("s3")) << logged;
    EXPECT_EQ(std::string::npos, m->loggable(R"({"result": {"chap": "s3"}})", true).find("s3"));
    // Secret-looking members of any method, and nothing else.
    const std::string answer =
        m->loggable(R"({"result": {"authSecret": "s3", "on": true}})", false);
    EXPECT_EQ(std::string::npos, answer.find("s3")) << answer;
    EXPECT_NE(std::string::npos, answer.find("\"on\":true")) << answer;
    EXPECT_EQ(std::string::npos, m->loggable("{\"password\": \"s3\"", false).find("s3"));
}

}  // namespace
