#include "rpc/ProviderDiscoveryMethods.h"

#include <strings.h>

#include <algorithm>
#include <cstring>
#include <initializer_list>
#include <stdexcept>
#include <string>

#include "cmpi/cimom.h"
#include "framework/Log.h"
#include "gateway/CIMProviderTfaj.h"
#include "gateway/JsonAccess.h"
#include "rpc/RpcErrors.h"
#include "schema/generated/CIM_ComputerSystem.h"

namespace CPTA {

const char ProviderDiscoveryMethods::kHypervisorNameSpace[] = "vmware/esxv2";

namespace {

// ---------------------------------------------------------------------------
// The table
// ---------------------------------------------------------------------------

// How one positional param is read. A param without a member name is only
// checked here and left to the method's code.
enum class Kind : unsigned char {
    End,      // no more params
    Text,     // asString(): numbers and booleans as their text
    Integer,  // asInt()
    Boolean,  // asBool()
    Object,   // a JSON object, else ErrorBadJsonObject
    Array,    // a JSON array, else ErrorBadJsonArray
    Unread,   // counted, not read
};

struct Param {
    const char* member;
    Kind kind;
};

constexpr Param S(const char* member) {
    return {member, Kind::Text};
}
constexpr Param I(const char* member) {
    return {member, Kind::Integer};
}
constexpr Param B(const char* member) {
    return {member, Kind::Boolean};
}
constexpr Param O(const char* member) {
    return {member, Kind::Object};
}
constexpr Param A(const char* member) {
    return {member, Kind::Array};
}
constexpr Param NOT_READ = {nullptr, Kind::Unread};
constexpr Param KEY = {nullptr, Kind::Text};       // read by the method's code
constexpr Param OBJECT = {nullptr, Kind::Object};  // checked, read by the method's code
constexpr Param ARRAY = {nullptr, Kind::Array};    // checked, read by the method's code

constexpr size_t kMaxParams = 8;

struct MethodRow;
typedef void (*Runner)(const MethodRow& row, const Json::Value& params, Json::Value& result);

struct MethodRow {
    const char* name;
    Runner run;
    JsonReqFP* entry;
    Param params[kMaxParams] = {};   // in order; their number is the expected count
    const char* zeroed = nullptr;    // a member always sent as 0 ("vfId" or "vfID")
    const char* function = nullptr;  // the "function" of a postDiagnostics test
    const char* handler = nullptr;   // the handler's name in logs; null: the name after the prefix
    bool secret = false;             // params or answers carry secrets: never logged

    constexpr MethodRow(const char* name_, Runner run_, JsonReqFP* entry_,
                        std::initializer_list<Param> params_)
        : name(name_), run(run_), entry(entry_) {
        size_t i = 0;
        for (const Param& p : params_)
            params[i++] = p;  // more than kMaxParams does not compile
    }
    // The row with one member changed (defined before its users, so that
    // every compiler can evaluate the table at compile time).
    template <typename T>
    constexpr MethodRow with(T MethodRow::*field, T value) const {
        MethodRow r = *this;
        r.*field = value;
        return r;
    }
    constexpr MethodRow zero(const char* member) const { return with(&MethodRow::zeroed, member); }
    constexpr MethodRow test(const char* name_) const { return with(&MethodRow::function, name_); }
    constexpr MethodRow handledBy(const char* name_) const {
        return with(&MethodRow::handler, name_);
    }
    constexpr MethodRow secretive() const { return with(&MethodRow::secret, true); }
};

void positional(const MethodRow&, const Json::Value&, Json::Value&);
void macOrWwn(const MethodRow&, const Json::Value&, Json::Value&);
void passThrough(const MethodRow&, const Json::Value&, Json::Value&);
void getHost(const MethodRow&, const Json::Value&, Json::Value&);
void getAllHbasByHost(const MethodRow&, const Json::Value&, Json::Value&);
void getAllPortsByHba(const MethodRow&, const Json::Value&, Json::Value&);
void setAlias(const MethodRow&, const Json::Value&, Json::Value&);
void setAliases(const MethodRow&, const Json::Value&, Json::Value&);
void setLunMaskData(const MethodRow&, const Json::Value&, Json::Value&);
void setAdvIoProfile(const MethodRow&, const Json::Value&, Json::Value&);
void targetTest(const MethodRow&, const Json::Value&, Json::Value&);
void getRequestID(const MethodRow&, const Json::Value&, Json::Value&);
void resetStatisticsForPorts(const MethodRow&, const Json::Value&, Json::Value&);

// A method of the common shape: the params in order under their members.
constexpr MethodRow Plain(const char* name, JsonReqFP* entry, std::initializer_list<Param> params) {
    return MethodRow(name, positional, entry, params);
}
// A method with code of its own; `params` are only counted and checked.
constexpr MethodRow Special(const char* name, Runner run, JsonReqFP* entry,
                            std::initializer_list<Param> params = {}) {
    return MethodRow(name, run, entry, params);
}

const char kVfId[] = "vfId";
const char kVfID[] = "vfID";

#define P3 S("pPortWwn"), S("lPortWwn"), S("rPortWwn")
#define ADV_IO_AT(...) S("indexStr"), __VA_ARGS__
#define LOOPBACK                                                                   \
    S("requestID"), NOT_READ, S("portWwn"), I("mode"), I("speed"), I("numCycles"), \
        S("frameCount"), S("dataPattern")
#define TARGETS S("requestID"), S("hbaWwn"), ARRAY, I("numCycles")

// In registration order.
constexpr MethodRow kMethods[] = {
    Special("discovery.getHost", getHost, &libGetHost),
    Special("discovery.getGlobalInfo", passThrough, &libGetGlobalInfo),
    Special("discovery.getHbaByWwn", macOrWwn, &libGetHbaByWwn, {KEY}),
    Special("discovery.getAllHbasByHost", getAllHbasByHost, &libGetGlobalInfo),
    Special("discovery.getAllPortsByHba", getAllPortsByHba, &libGetGlobalInfo, {KEY}),
    Special("discovery.getPortByWwn", macOrWwn, &libGetPortByWwn, {KEY}),
    Plain("discovery.getFcByFcWwn", &libGetFcByFcWwn, {S("wwn")}),
    Plain("discovery.getAllFcByPort", &libGetFcByFcWwn, {S("wwn")}),
    Plain("discovery.getPortStatistics", &libGetPortStatistics, {S("indexStr")}),
    Plain("discovery.getPortAuthentication", &libGetPortAuthentication, {S("wwn")}).secretive(),
    Plain("discovery.getAllRemotePorts", &libGetAllRemotePorts, {S("pPortWwn"), S("lPortWwn")}),
    Plain("discovery.getCompleteRemotePort", &libGetCompleteRemotePort, {P3}),
    Plain("discovery.getAllLunsByRemotePort", &libGetAllLunsByRemotePort, {P3}),
    Plain("discovery.getAllVPorts", &libGetAllVPorts, {S("wwn")}),
    Plain("discovery.getVPort", &libGetVPort, {S("pPortWwn"), S("lPortWwn")}),
    Special("discovery.getServerTime", passThrough, &libGetServerTime),
    Plain("discovery.getDynamicQosStatistics", &libGetDynamicQosStatistics, {S("pPortWwn")}),
    Plain("discovery.getDynamicPortStatistics", &libGetDynamicPortStatistics, {S("indexStr")}),
    Plain("discovery.getDynamicRemotePortStatistics", &libGetDynamicRPortStatistics, {P3})
        .zero(kVfId)
        .handledBy("getDynamicRPortStatistics"),
    Plain("discovery.getDynamicVportStatistics", &libGetDynamicVPortStatistics,
          {S("pPortWwn"), S("lPortWwn")})
        .zero(kVfId),
    Plain("discovery.getDynamicLogicalPortStatistics", &libGetDynamicLogicalPortStatistics,
          {S("pPortWwn"), S("lPortWwn")})
        .zero(kVfId),
    Plain("discovery.getDynamicFcpimIOPStatistics", &libGetDynamicFcpimIopStatistics, {P3})
        .zero(kVfId),
    Plain("discovery.getDynamicFcpimStatistics", &libGetDynamicFcpimStatistics, {P3}),
    Plain("discovery.getDynamicFabricStatistics", &libGetDynamicFabricStatistics, {S("wwn")})
        .zero(kVfID),
    Plain("discovery.getDynamicPortAuthenticationStatistics", &libGetDynamicPortAuthStatistics,
          {S("pPortWwn")})
        .handledBy("getDynamicPortAuthStatistics"),
    Plain("discovery.getDynamicIocStatistics", &libGetDynamicIocStatistics, {S("pwwn")}),
    Plain("discovery.getBootOverSanByPort", &libGetBootOverSanByPort, {S("indexStr")}),
    Plain("discovery.getAdvPortDataByPort", &libGetAdvPortDataByPort, {S("indexStr")}),
    Plain("discovery.getFcoeByPort", &libGetFcoeByPort, {S("indexStr")}),
    Plain("discovery.getFcoeByFcoeWwn", &libGetFcoeByPort, {S("indexStr")})
        .handledBy("getFcoeByPort"),
    Plain("discovery.getAllFcoeByPort", &libGetFcoeByPort, {S("indexStr")}),
    Plain("discovery.getDynamicFcoeStatistics", &libGetDynamicFcoeStatistics, {S("indexStr")}),
    Plain("discovery.getDynamicFcpimModStatistics", &libGetDynamicFcpimModStatistics,
          {S("indexStr")}),
    Plain("discovery.getDynamicFirmwareStatistics", &libGetDynamicFirmwareStatistics,
          {S("indexStr")}),
    Plain("discovery.getDynamicTrunkingStatistics", &libGetDynamicTrunkingStatistics,
          {S("indexStr")}),
    Plain("discovery.getCompleteEthByPort", &libGetEthPortByEthMac, {S("mac")}),
    Plain("discovery.getCompleteEthByEthMac", &libGetEthPortByEthMac, {S("mac")}),
    Plain("discovery.getAllEthByPort", &libGetAllEthPortByEthMac, {S("mac")}),
    Plain("discovery.getLldp", &libGetLldp, {S("mac")}),
    Plain("discovery.getCee", &libGetCee, {S("mac")}),
    Plain("discovery.getDynamicEthernetPortStatistics", &libGetDynamicEthernetPortStatistics,
          {S("mac")}),
    Plain("discovery.getDynamicIOCEthernetStatistics", &libGetDynamicIOCEthernetStatistics,
          {S("mac")}),
    Plain("discovery.getDynamicvHBAStatistics", &libGetDynamicvHBAStatistics, {S("wwn")}),
    Plain("discovery.getDynamicvNICStatistics", &libGetDynamicvNICStatistics, {S("mac")}),
    Plain("discovery.getDynamicvNICStatisticsForGraph", &libGetDynamicvNICStatisticsForGraph,
          {S("mac")}),
    Plain("discovery.getDynamicLldpStatistics", &libGetDynamicLldpStatistics, {S("mac")}),
    Plain("discovery.getDynamicAdvancedIoDataAtPPort", &libGetDynamicAdvancedIoDataAtPPort,
          {S("pPortWwn")})
        .zero(kVfId),
    Plain("discovery.getDynamicAdvancedIoDataAtLPort", &libGetDynamicAdvancedIoDataAtLPort,
          {S("pPortWwn"), S("lPortWwn")})
        .zero(kVfId),
    Plain("discovery.getDynamicAdvancedIoDataAtRPort", &libGetDynamicAdvancedIoDataAtRPort, {P3})
        .zero(kVfId),
    Plain("discovery.getDynamicAdvancedIoDataAtLun", &libGetDynamicAdvancedIoDataAtLun,
          {P3, S("lunId")})
        .zero(kVfId),
    Special("discovery.getDriverUpdateStatusLog", passThrough, &libGetDriverUpdateStatus),
    Plain("discovery.getLunMaskDataByPort", &libGetLunMaskData, {S("indexStr")}),
    Plain("discovery.getAdvAdapterData", &libGetAdvAdapterData, {S("indexStr")}),
    Plain("discovery.getAllPCIFunctions", &libGetAdapterPciFnData, {S("indexStr")}),
    Plain("discovery.getAdvancedIoProfile", &libGetAdvIoProfile, {S("indexStr")}),
    Plain("configuration.createVPort", &libCreateVport,
          {S("pwwn"), S("nwwn"), S("vwwn"), S("symbolicName")})
        .zero(kVfId),
    Plain("configuration.deleteVPort", &libDeleteVport, {S("pwwn"), A("vportArray")}).zero(kVfId),
    Special("configuration.setAlias", setAlias, &libSetAdapterAlias, {OBJECT}),
    Special("configuration.setAliases", setAliases, &libSetAdapterAlias, {ARRAY}),
    Plain("configuration.setPortByWwn", &libSetPortByWwn,
          {S("indexStr"), O("port"), A("propArray")}),
    Plain("configuration.setPortAuthentication", &libSetPortAuthentication,
          {S("pPortWwn"), O("portAuth")})
        .secretive(),
    Plain("configuration.setFcByFcWwn", &libSetFcByFcWwn,
          {S("portWwn"), O("fcPortData"), A("paramsConfigured")}),
    Plain("configuration.setHbaStatus", &libSetAdapterState, {S("indexStr"), B("enableState")}),
    Plain("configuration.setFCTrunkingState", &libSetFcTrunkingState,
          {S("indexStr"), B("enableState")}),
    Plain("configuration.setFcoeByFcoeWwn", &libSetFcByFcWwn,
          {S("portWwn"), O("fcPortData"), A("paramsConfigured")})
        .handledBy("setFcByFcWwn"),
    Plain("configuration.setFcoePort", &libSetFcoeByPort,
          {S("indexStr"), O("fcoePort"), A("propArray")}),
    Plain("configuration.setEthPort", &libSetEthPort, {S("mac"), O("ethPort"), A("propArray")}),
    Plain("configuration.clearLogsForPort", &libClearLogsForPort, {A("propArray")}),
    Plain("configuration.setAdapterMode", &libSetAdapterMode, {S("indexStr"), I("adapterMode")}),
    Special("configuration.setLunMaskDataForPort", setLunMaskData, &libSetLunMaskData,
            {S("indexStr"), OBJECT}),
    Special("configuration.setAdvancedIoProfile", setAdvIoProfile, &libSetAdvIoProfile,
            {S("indexStr"), OBJECT}),
    Plain("configuration.clearAdvancedIoProfilesAtPort", &libClearAdvIoProfile, {S("indexStr")}),
    Plain("configuration.clearAdvancedIoProfilesAtLogicalPort", &libClearAdvIoProfile,
          {ADV_IO_AT(S("lPortWwn"))}),
    Plain("configuration.clearAdvancedIoProfilesAtRemotePort", &libClearAdvIoProfile,
          {ADV_IO_AT(S("lPortWwn"), S("rPortWwn"))}),
    Plain("configuration.clearAdvancedIoProfileOfLun", &libClearAdvIoProfile,
          {ADV_IO_AT(S("lPortWwn"), S("rPortWwn"), S("lunId"))}),
    Plain("configuration.resetDataForAdvancedIoAtPPort", &libResetDataForAdvIoProf,
          {S("indexStr")}),
    Plain("configuration.resetDataForAdvancedIoAtLPort", &libResetDataForAdvIoProf,
          {ADV_IO_AT(S("lPortWwn"))}),
    Plain("configuration.resetDataForAdvancedIoAtRPort", &libResetDataForAdvIoProf,
          {ADV_IO_AT(S("lPortWwn"), S("rPortWwn"))}),
    Plain("configuration.resetDataForAdvancedIoAtLun", &libResetDataForAdvIoProf,
          {ADV_IO_AT(S("lPortWwn"), S("rPortWwn"), S("lunId"))}),
    Plain("configuration.resetDataForAdvancedIoForLunRange", &libResetDataForAdvIoProf,
          {ADV_IO_AT(S("lPortWwn"), S("rPortWwn"), S("lunId"), S("endLunRange"))}),
    Plain("configuration.createVnic", &libCreatevNIC,
          {S("mac"), I("minBandwidth"), I("maxBandwidth")}),
    Plain("configuration.deleteVnics", &libDeletevNICs, {S("mac"), A("pciFunctionIndices")}),
    Plain("configuration.modifyVnic", &libModifyvNIC, {S("mac"), A("vNICs")}),
    Plain("diagnostics.startTests", &libStartTests, {S("requestID"), B("stopOnError")}),
    Plain("diagnostics.cancelTests", &libCancelTests, {S("requestID")}),
    Plain("diagnostics.doQuickTest", &libPostDiagnostics, {S("requestID"), S("hbaWwn")})
        .test("QuickTest"),
    Plain("diagnostics.doPOSTest", &libSetDport, {S("requestID"), S("portWwn"), B("state")}),
    Special("diagnostics.doEchoTest", targetTest, &libPostDiagnostics, {TARGETS}).test("EchoTest"),
    Plain("diagnostics.doMemoryTest", &libPostDiagnostics, {S("requestID"), S("hbaWwn")})
        .test("MemoryTest"),
    Plain("diagnostics.doPCILoopbackTest", &libPostDiagnostics,
          {S("requestID"), S("hbaWwn"), S("portWwn"), S("frameCount"), S("dataPattern"),
           I("numCycles")})
        .test("PCILoopbackTest"),
    Plain("diagnostics.doLoopbackTest", &libPostDiagnostics, {LOOPBACK}).test("LoopbackTest"),
    Plain("diagnostics.doLEDTest", &libPostDiagnostics,
          {S("requestID"), S("hbaWwn"), S("portWwn"), I("ledBitmap"), I("command"), I("color"),
           I("frequency")})
        .test("LEDTest"),
    Special("diagnostics.doFCPingTest", targetTest, &libPostDiagnostics, {TARGETS})
        .test("FCPingTest"),
    Special("diagnostics.doFCTraceRoute", targetTest, &libPostDiagnostics, {TARGETS})
        .test("FCTraceTest"),
    Plain("diagnostics.doEthLoopbackTest", &libPostDiagnostics, {LOOPBACK}).test("EthLoopbackTest"),
    Plain("diagnostics.doQueueTest", &libPostDiagnostics,
          {S("requestID"), S("hbaWwn"), S("portWwn")})
        .test("QueueTest"),
    Plain("diagnostics.getOpticsPOM", &libGetOpticsPOM, {S("portWwn")}),
    Plain("diagnostics.getOpticsSFP", &libGetOpticsSFP, {S("indexStr")}),
    Special("diagnostics.getRequestID", getRequestID, nullptr),
    Plain("diagnostics.getDiagnosticsResults", &libGetDiagnosticsResults, {S("requestID")}),
    Plain("diagnostics.dPortEnable", &libSetDport, {S("requestID"), S("portWwn"), B("state")}),
    Plain("diagnostics.doDportTest", &libPostDiagnostics,
          {S("requestID"), S("hbaWwn"), S("portWwn"), S("frameCount"), S("dataPattern"),
           I("numCycles")})
        .test("DPortTest"),
    Plain("diagnostics.getDPortTestResults", &libGetDPortTestResult, {S("portWwn")})
        .handledBy("getDPortTestResult"),
    Plain("configuration.resetPortAuthentication", &libResetPortAuthentication, {S("pPortWwn")}),
    Plain("configuration.resetStatisticsForPortAuthentication", &libResetStatisticsForPortAuth,
          {S("wwn")})
        .handledBy("resetStatisticsForPortAuth"),
    Special("configuration.resetStatisticsForPorts", resetStatisticsForPorts,
            &libResetStatisticsForPort, {ARRAY}),
    Plain("configuration.resetStatisticsForPort", &libResetStatisticsForPort, {S("indexStr")}),
    Plain("configuration.resetStatisticsForLPort", &libResetStatisticsForLPort,
          {S("pwwn"), S("lwwn")})
        .zero(kVfId),
    Plain("configuration.resetStatisticsForVPort", &libResetStatisticsForVPort,
          {S("pwwn"), S("vwwn")})
        .zero(kVfId),
    Plain("configuration.resetStatisticsForRPort", &libResetStatisticsForRPort, {P3}).zero(kVfId),
    Plain("configuration.resetStatisticsForFcpim", &libResetStatisticsForFcpim, {P3}).zero(kVfId),
    Plain("configuration.resetStatisticsForIoc", &libResetStatisticsForIoc, {S("pwwn")}),
    Plain("configuration.resetStatisticsForFabric", &libResetStatisticsForFabric, {S("pwwn")})
        .zero(kVfId),
    Plain("configuration.resetStatisticsForQos", &libResetStatisticsForQos, {S("pPortWwn")}),
    Plain("configuration.resetFirmwareStatistics", &libResetFirmwareStatistics, {S("indexStr")}),
    Plain("configuration.resetTrunkingStatistics", &libResetTrunkingStatistics, {S("indexStr")}),
    Plain("configuration.resetLldpStatistics", &libResetLldpStatistics, {S("mac")}),
    Plain("configuration.resetIOCEthernetStatistics", &libResetIOCEthernetStatistics, {S("mac")}),
    Plain("configuration.resetEthernetPortStatistics", &libResetEthernetPortStatistics, {S("mac")}),
    Plain("configuration.resetvNICStatistics", &libResetvNICStatistics, {S("mac")}),
    Plain("configuration.resetFcoeStatistics", &libResetFcoeStatistics, {S("indexStr")}),
    Plain("configuration.resetvHBAStatistics", &libResetvHBAStatistics, {S("wwn")}),
    Plain("configuration.resetStatisticsForFcpimMod", &libResetStatisticsForFcpimMod,
          {S("indexStr")}),
};

#undef P3
#undef ADV_IO_AT
#undef LOOPBACK
#undef TARGETS

static_assert(sizeof kMethods / sizeof kMethods[0] == 123, "the tunnel serves 123 methods");

// ---------------------------------------------------------------------------
// What the rows share
// ---------------------------------------------------------------------------

const char* handlerName(const MethodRow& row) {
    if (row.handler != nullptr)
        return row.handler;
    const char* dot = std::strchr(row.name, '.');
    return dot != nullptr ? dot + 1 : row.name;
}

size_t paramCount(const MethodRow& row) {
    size_t n = 0;
    while (n < kMaxParams && row.params[n].kind != Kind::End)
        ++n;
    return n;
}

// The library symbol behind an entry-point pointer, for messages.
const char* entryName(const JsonReqFP* entry) {
    static const struct {
        const void* slot;
        const char* symbol;
    } kNames[] = {
#define ENTRY_POINT(kind, symbol, pointer) {&pointer, #symbol},
#include "gateway/EntryPoints.def"
#undef ENTRY_POINT
    };
    for (const auto& n : kNames)
        if (n.slot == entry)
            return n.symbol;
    return "?";
}

// Positional params: a JSON array (absent params count as none) of the
// row's length.
void checkCount(const MethodRow& row, const Json::Value& params) {
    if (!params.isNull() && !params.isArray())
        throw ErrorBadJsonArray();
    const size_t expected = paramCount(row), actual = params.size();
    if (actual != expected) {
        TVRN_LOG(LL_WARN, "No. of Params - Expected : %d, Actual : %d, function : %s ",
                 int(expected), int(actual), handlerName(row));
        throw ErrorParamMismatch();
    }
}

// The request the row makes of the params: each param under its member, in
// the type its kind says, then the constant members.
Json::Value buildRequest(const MethodRow& row, const Json::Value& params) {
    checkCount(row, params);
    Json::Value request(Json::objectValue);
    for (Json::ArrayIndex i = 0; i < params.size(); ++i) {
        const Param& p = row.params[i];
        const Json::Value& v = params[i];
        if (p.kind == Kind::Object && !v.isObject())
            throw ErrorBadJsonObject();
        if (p.kind == Kind::Array && !v.isArray())
            throw ErrorBadJsonArray();
        if (p.member == nullptr)
            continue;
        switch (p.kind) {
            case Kind::Text: request[p.member] = v.asString(); break;
            case Kind::Integer: request[p.member] = v.asInt(); break;
            case Kind::Boolean: request[p.member] = v.asBool(); break;
            case Kind::Object:
            case Kind::Array: request[p.member] = v; break;
            case Kind::End:
            case Kind::Unread: break;
        }
    }
    if (row.zeroed != nullptr)
        request[row.zeroed] = 0;
    if (row.function != nullptr)
        request["function"] = row.function;
    return request;
}

// The library's answer; no answer at all (no library, or a failed call) is
// an error, never a null result.
Json::Value call(JsonReqFP* entry, const Json::Value& request) {
    Json::Value answer = (*entry)(request);
    if (answer.isNull())
        throw std::runtime_error(std::string("No answer from the adapter library to ") +
                                 entryName(entry));
    return answer;
}

// The library's failure answer: an object with an "error" member.
bool isErrorAnswer(const Json::Value& answer) {
    return answer.isObject() && answer.isMember("error");
}

// Appends an answer to the result array, or makes a failure answer the
// whole result (the dispatcher then reports its error). False on failure.
bool appendAnswer(Json::Value& result, Json::Value answer) {
    if (isErrorAnswer(answer)) {
        result = std::move(answer);
        return false;
    }
    if (!result.isArray())
        result = Json::Value(Json::arrayValue);
    result.append(std::move(answer));
    return true;
}

bool sameKey(const Json::Value* value, const std::string& key) {
    return value != nullptr && value->isString() &&
           strcasecmp(value->asCString(), key.c_str()) == 0;
}

// ---------------------------------------------------------------------------
// The shapes
// ---------------------------------------------------------------------------

void positional(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    result = call(row.entry, buildRequest(row, params));
}

// An adapter or port named by a MAC (17 characters) or a WWN.
void macOrWwn(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    checkCount(row, params);
    const std::string key = params[0].asString();
    Json::Value request(Json::objectValue);
    request[key.size() == 17 ? "mac" : "wwn"] = key;
    result = call(row.entry, request);
}

// The params themselves are the request.
void passThrough(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    result = call(row.entry, params);
}

void getRequestID(const MethodRow&, const Json::Value&, Json::Value& result) {
    const int id = libGetRequestID();
    if (id < 0)
        throw std::runtime_error("No diagnostic request id from the adapter library");
    result = id;
}

// The maker and model of the hypervisor this host runs, as the CIM server
// knows them: the second and third identifying values of its computer system.
bool hypervisorIdentity(std::string& manufacturer, std::string& model) {
    Ref<CIM_ComputerSystem> query(create<CIM_ComputerSystem>(false));
    Instance_Enumerator e;
    if (cimom::enum_instances(ProviderDiscoveryMethods::kHypervisorNameSpace, query.ptr(), e) != 0)
        return false;
    TVRN_LOG(LL_DBG, "ComputerSystem Instance in vmware/esx2 ");
    for (; e; e++) {
        Ref<CIM_ComputerSystem> system(static_cast<CIM_ComputerSystem*>(e()));
        const Property<String>& cls = system->CreationClassName;
        TVRN_LOG(LL_DBG, "Creation class name - %s", cls.null ? "" : cls.value.c_str());
        if (cls.null || std::strcmp(cls.value.c_str(), "VMWARE_ESXComputerSystem") != 0)
            continue;
        const Property<Array<String>>& info = system->OtherIdentifyingInfo;
        if (info.null || info.value.size() < 3)
            return false;
        manufacturer = info.value[1].c_str();
        model = info.value[2].c_str();
        return true;
    }
    return false;
}

// The library's host record; a missing maker or model is taken from the
// hypervisor, and written both into the record and at the top of the result.
void getHost(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    result = call(row.entry, params);
    if (!jsonHas(result, "result", Json::objectValue))
        return;
    const Json::Value& host = result["result"];
    if (host.isMember("error"))
        return;
    if (jsonString(host, "hostManufacturer").size() > 0 && jsonString(host, "hostModel").size() > 0)
        return;
    std::string manufacturer, model;
    if (!hypervisorIdentity(manufacturer, model))
        return;
    for (Json::Value* target : {&result, &result["result"]}) {
        (*target)["hostManufacturer"] = manufacturer;
        (*target)["hostModel"] = model;
    }
}

// The adapters of getGlobalInfo's answer that are actually present (never
// more than it lists, whatever count it claims).
Json::ArrayIndex adapterCount(const Json::Value& info) {
    const int claimed = jsonInt(info, "numOfAdapters");
    TVRN_LOG(LL_DBG, "numOfAdapters=%d", claimed);
    return std::min<Json::ArrayIndex>(Json::ArrayIndex(std::max(claimed, 0)),
                                      jsonArray(info, "adapter").size());
}

// Every adapter's details, asked by MAC or WWN as its kind says.
void getAllHbasByHost(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    const Json::Value info = call(row.entry, params);
    if (isErrorAnswer(info)) {
        result = info;
        return;
    }
    const Json::Value& adapters = jsonArray(info, "adapter");
    for (Json::ArrayIndex i = 0, n = adapterCount(info); i < n; ++i) {
        const Json::Value& adapter = adapters[i];
        const bool byMac =
            jsonBool(adapter, "cna") || (!jsonBool(adapter, "fc") && !jsonBool(adapter, "fcoe") &&
                                         jsonBool(adapter, "ethPort"));
        const char* key = byMac ? "mac" : "wwn";
        Json::Value request(Json::objectValue);
        const Json::Value* value = jsonMember(adapter, key);
        request[key] = value != nullptr ? *value : Json::Value();
        if (!appendAnswer(result, call(byMac ? &libGetHbaByMac : &libGetHbaByWwn, request)))
            return;
    }
}

// The ports of the adapter named by params[0] (its MAC or WWN, any case).
void getAllPortsByHba(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    checkCount(row, params);
    const std::string key = params[0].asString();
    const Json::Value info = call(row.entry, params);
    if (isErrorAnswer(info)) {
        result = info;
        return;
    }
    const Json::Value& adapters = jsonArray(info, "adapter");
    const Json::Value* adapter = nullptr;
    for (Json::ArrayIndex i = 0, n = adapterCount(info); i < n && !key.empty() && !adapter; ++i)
        if (sameKey(jsonMember(adapters[i], "mac"), key) ||
            sameKey(jsonMember(adapters[i], "wwn"), key))
            adapter = &adapters[i];
    if (adapter == nullptr)
        throw std::runtime_error("No adapter with MAC or WWN \"" + key + "\"");

    // A port's kind picks the list its key comes from.
    static const struct {
        const char* flag;
        const char* member;
        const char* keys;
    } kPortKinds[] = {
        {"portHasFc", "wwn", "portWwn"},
        {"portHasEth", "mac", "portMac"},
        {"portHasFcoe", "mac", "fcoeMac"},
    };
    Json::ArrayIndex ports = 0;
    for (const auto& kind : kPortKinds)
        ports = std::max(ports, jsonArray(*adapter, kind.flag).size());
    ports = std::min<Json::ArrayIndex>(ports, std::max(jsonInt(*adapter, "numOfPorts"), 0));
    for (Json::ArrayIndex j = 0; j < ports; ++j) {
        for (const auto& kind : kPortKinds) {
            const Json::Value& flags = jsonArray(*adapter, kind.flag);
            if (j >= flags.size() || !flags[j].isBool() || !flags[j].asBool())
                continue;
            const Json::Value& keys = jsonArray(*adapter, kind.keys);
            Json::Value request(Json::objectValue);
            request[kind.member] = j < keys.size() ? keys[j] : Json::Value();
            if (!appendAnswer(result, call(&libGetPortByWwn, request)))
                return;
            break;
        }
    }
}

// One alias object: its "type" picks the entry point. False when the answer
// was a failure (it is then the result).
bool applyAlias(const Json::Value& alias, Json::Value& answer) {
    if (!alias.isObject())
        throw ErrorBadJsonObject();
    const String type = jsonString(alias, "type");
    JsonReqFP* entry = type == "Node"  ? &libSetAdapterAlias
                       : type == "CNA" ? &libSetPortAlias
                                       : nullptr;
    if (entry == nullptr)
        throw ErrorBadJsonObject();
    answer = call(entry, alias);
    return !isErrorAnswer(answer);
}

void setAlias(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    buildRequest(row, params);
    applyAlias(params[0], result);
}

void setAliases(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    buildRequest(row, params);
    for (const Json::Value& alias : params[0]) {
        Json::Value answer;
        if (!applyAlias(alias, answer)) {
            result = std::move(answer);
            return;
        }
        appendAnswer(result, std::move(answer));
    }
}

void setLunMaskData(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    Json::Value request = buildRequest(row, params);
    const Json::Value& mask = params[1];
    for (const char* list : {"removedLunMaskData", "addedLunMaskData"}) {
        const Json::Value* value = jsonMember(mask, list);
        if (value == nullptr || !value->isArray())
            throw ErrorBadJsonArray();
        request[list] = *value;
    }
    request["clearLunMaskData"] = mask["clearLunMaskData"].asBool();
    result = call(row.entry, request);
}

void setAdvIoProfile(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    Json::Value request = buildRequest(row, params);
    bool any = false;
    for (const char* list : {"addedAdvancedIoProfiles", "removedAdvancedIoProfiles"}) {
        const Json::Value* value = jsonMember(params[1], list);
        if (value == nullptr)
            continue;
        if (!value->isArray())
            throw ErrorBadJsonArray();
        request[list] = *value;
        any = true;
    }
    if (!any)
        throw ErrorBadJsonObject();
    result = call(row.entry, request);
}

// A test over several targets: one request per target, each made afresh
// (a key the target does not name is not sent).
// The first failing target ends the call as its error; otherwise the result
// is the last target's answer (null for no targets).
void targetTest(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    const Json::Value base = buildRequest(row, params);
    for (const Json::Value& target : params[2]) {
        if (!target.isObject())
            throw ErrorBadJsonObject();
        Json::Value request = base;
        const int vfID = jsonInt(target, "vfID", 0);
        request["vfID"] = vfID >= 0 ? vfID : 0;
        for (const char* member : {"portWwn", "localPortWwn", "remotePortWwn"})
            if (const Json::Value* key = jsonMember(target, member))
                request[member] = key->asString();
        result = call(row.entry, request);
        if (isErrorAnswer(result))
            return;
    }
}

// Each listed port's reset; a port whose reset fails is left out of the
// result, and the call fails only when none could be reset.
void resetStatisticsForPorts(const MethodRow& row, const Json::Value& params, Json::Value& result) {
    buildRequest(row, params);
    for (const Json::Value& port : params[0]) {
        Json::Value request(Json::objectValue);
        request["indexStr"] = port.asString();
        Json::Value answer;
        try {
            answer = (*row.entry)(request);
        } catch (const HbaAgentError& e) {
            TVRN_LOG(LL_ERR, "%s - libResetStatisticsForPort got User exception %d: %s",
                     request["indexStr"].asCString(), e.code, e.message.c_str());
            continue;
        }
        if (answer.isNull() || isErrorAnswer(answer)) {
            TVRN_LOG(LL_ERR, "%s - libResetStatisticsForPort failed",
                     request["indexStr"].asCString());
            continue;
        }
        appendAnswer(result, std::move(answer));
    }
    if (!result.isArray())
        throw std::runtime_error("Couldnt reset any of the port statistics");
}

}  // namespace

void ProviderDiscoveryMethods::registerMethods(JsonRpcManager& rpc) {
    TVRN_LOG(LL_DBG, "Entering: %s", "registerMethods");
    for (const MethodRow& row : kMethods) {
        const MethodRow* r = &row;
        rpc._registerMethod(
            row.name,
            [r](const Json::Value& params, Json::Value& result) { r->run(*r, params, result); },
            row.secret);
    }
}

}  // namespace CPTA
