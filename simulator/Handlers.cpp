#include "simulator/Handlers.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <fstream>
#include <memory>
#include <sstream>

namespace tvrnsim {

Json::Value errorAnswer(int code, const std::string& message) {
    Json::Value r(Json::objectValue);
    r["error"]["name"] = "LibraryError";
    r["error"]["code"] = code;
    r["error"]["message"] = message;
    return r;
}

namespace {

// ---------------------------------------------------------------------------
// Request members

[[noreturn]] void fail(int code, const std::string& message) {
    throw RequestError{code, message};
}

std::string quoted(const char* name) {
    return std::string("\"") + name + "\"";
}

void requireObject(const Json::Value& req) {
    if (!req.isObject())
        fail(kBadRequest, "the request must be a JSON object");
}

bool has(const Json::Value& req, const char* name) {
    return req.isObject() && req.isMember(name);
}

const Json::Value& member(const Json::Value& req, const char* name) {
    requireObject(req);
    if (!req.isMember(name))
        fail(kBadRequest, "the request has no member " + quoted(name));
    return req[name];
}

std::string text(const Json::Value& req, const char* name) {
    const Json::Value& v = member(req, name);
    if (!v.isString())
        fail(kBadRequest, quoted(name) + " must be a string");
    return v.asString();
}

enum class Form { Wwn, Mac, Any };

std::string key(const Json::Value& req, const char* name, Form form) {
    std::string s = text(req, name);
    bool ok = form == Form::Wwn ? isWwn(s) : form == Form::Mac ? isMac(s) : (isWwn(s) || isMac(s));
    if (!ok) {
        const char* what = form == Form::Wwn   ? "a WWN"
                           : form == Form::Mac ? "a MAC address"
                                               : "a WWN or MAC address";
        fail(kBadKey, quoted(name) + " is not " + what + " in colon format: " + s);
    }
    return s;
}

// The key of a request that names its object by "wwn" or by "mac".
std::string wwnOrMacKey(const Json::Value& req) {
    if (has(req, "wwn"))
        return key(req, "wwn", Form::Wwn);
    if (!has(req, "mac"))
        fail(kBadRequest, "the request needs \"wwn\" or \"mac\"");
    return key(req, "mac", Form::Mac);
}

bool flag(const Json::Value& req, const char* name) {
    const Json::Value& v = member(req, name);
    if (!v.isBool())
        fail(kBadRequest, quoted(name) + " must be a boolean");
    return v.asBool();
}

// An integer, given as a JSON number or as decimal or 0x-prefixed text.
long long number(const Json::Value& req, const char* name) {
    const Json::Value& v = member(req, name);
    if (v.isIntegral())
        return v.asLargestInt();
    if (v.isString()) {
        const std::string s = v.asString();
        char* end = nullptr;
        errno = 0;
        long long n = std::strtoll(s.c_str(), &end, 0);
        if (!s.empty() && end && *end == '\0' && errno == 0)
            return n;
    }
    fail(kBadRequest, quoted(name) + " must be an integer");
}

const Json::Value& array(const Json::Value& req, const char* name) {
    const Json::Value& v = member(req, name);
    if (!v.isArray())
        fail(kBadRequest, quoted(name) + " must be a JSON array");
    return v;
}

const Json::Value& object(const Json::Value& req, const char* name) {
    const Json::Value& v = member(req, name);
    if (!v.isObject())
        fail(kBadRequest, quoted(name) + " must be a JSON object");
    return v;
}

// A diagnostic request id: text, or a number given as such.
std::string requestId(const Json::Value& req) {
    const Json::Value& v = member(req, "requestID");
    if (v.isString() && !v.asString().empty())
        return v.asString();
    if (v.isIntegral())
        return std::to_string(v.asLargestInt());
    fail(kBadRequest, "\"requestID\" must be a request id");
}

// Null or an object: the entry points that take no key.
void noKeyRequest(const Json::Value& req) {
    if (!req.isNull() && !req.isObject())
        fail(kBadRequest, "the request must be null or a JSON object");
}

bool sameKey(const std::string& a, const std::string& b) {
    return lowerCase(a) == lowerCase(b);
}

bool sameType(const Json::Value& a, const Json::Value& b) {
    if (a.isNumeric() && !a.isBool() && b.isNumeric() && !b.isBool())
        return true;
    return a.type() == b.type();
}

// The value without the simulator's own bookkeeping members.
Json::Value stripped(Json::Value v) {
    if (v.isObject()) {
        v.removeMember("statistics");
        v.removeMember("lunStatistics");
    }
    return v;
}

Json::Value ok() {
    Json::Value r(Json::objectValue);
    r["status"] = 0;
    return r;
}

// ---------------------------------------------------------------------------
// Look-ups

int adapterExact(Call& c, const std::string& k) {
    int a = c.st.model.findAdapter(k);
    if (a < 0)
        fail(kNotFound, "no adapter " + k);
    return a;
}

int adapterOwning(Call& c, const std::string& k) {
    int a = c.st.model.findOwner(k);
    if (a < 0)
        fail(kNotFound, "no adapter or port " + k);
    return a;
}

Json::Value& fcPortWrapper(Call& c, const std::string& k, FcPortRef* ref = nullptr) {
    FcPortRef r;
    if (!c.st.model.findFcPort(k, r))
        fail(kNotFound, "no FC port " + k);
    if (ref)
        *ref = r;
    return c.st.model.fcPort(r.a, r.p);
}

Json::Value& ethPortWrapper(Call& c, const std::string& k) {
    EthPortRef r;
    if (!c.st.model.findEthPort(k, r))
        fail(kNotFound, "no Ethernet port " + k);
    return c.st.model.ethPort(r.a, r.e);
}

// An FC or Ethernet port; `isEth` tells which.
Json::Value& anyPortWrapper(Call& c, const std::string& k, bool* isEth = nullptr) {
    FcPortRef f;
    if (c.st.model.findFcPort(k, f)) {
        if (isEth)
            *isEth = false;
        return c.st.model.fcPort(f.a, f.p);
    }
    EthPortRef e;
    if (c.st.model.findEthPort(k, e)) {
        if (isEth)
            *isEth = true;
        return c.st.model.ethPort(e.a, e.e);
    }
    fail(kNotFound, "no port " + k);
}

// The logical port `l` of physical port `p`: the port itself or one of its virtual ports.
Json::Value& logicalPort(Call& c, const std::string& p, const std::string& l,
                         FcPortRef* base = nullptr) {
    FcPortRef r;
    Json::Value& port = fcPortWrapper(c, p, &r);
    if (base)
        *base = r;
    if (sameKey(port["port"]["wwn"].asString(), l))
        return port;
    VPortRef v;
    if (c.st.model.findVPort(l, v) && v.a == r.a && v.p == r.p)
        return c.st.model.vport(v);
    fail(kNotFound, "no logical port " + l + " on port " + p);
}

Json::Value& remotePort(Call& c, const std::string& p, const std::string& l, const std::string& r) {
    FcPortRef base;
    logicalPort(c, p, l, &base);
    for (Json::Value& rp : c.st.model.fcPort(base.a, base.p)["remotePorts"])
        if (sameKey(rp["remotePortWwn"].asString(), r))
            return rp;
    fail(kNotFound, "no remote port " + r + " on port " + p);
}

// An object member of a wrapper, created with the given defaults on first use.
Json::Value& materialize(Json::Value& holder, const char* name, const Json::Value& defaults) {
    if (!holder[name].isObject())
        holder[name] = defaults;
    return holder[name];
}

// Copies the listed members of `given` into `target`, keeping member types.
void copyListed(Json::Value& target, const Json::Value& given, const Json::Value& names,
                const char* givenName) {
    for (const Json::Value& n : names) {
        if (!n.isString())
            fail(kBadRequest, "member names must be strings");
        const std::string name = n.asString();
        if (!given.isMember(name))
            fail(kBadRequest, quoted(givenName) + " has no member " + quoted(name.c_str()));
        if (target.isMember(name) && !sameType(target[name], given[name]))
            fail(kInvalidValue, quoted(name.c_str()) + " has the wrong JSON type");
    }
    for (const Json::Value& n : names)
        target[n.asString()] = given[n.asString()];
}

// ---------------------------------------------------------------------------
// Statistics

// Counter ids of each statistics group when the fixture lists none.
std::vector<int> defaultIds(const std::string& group, bool fcoe) {
    if (group == "port") {
        if (fcoe)
            return {1615, 1616, 1624, 1625, 1626, 1627, 1628};
        return {1402, 1403, 1409, 1410, 1411, 1412, 1416, 1421, 1422, 1423, 1424, 1425, 1426, 1428};
    }
    static const char* const groups[] = {
        "rport",    "vport", "lport",       "auth", "trunking", "vhba",     "vnic",
        "lldp",     "advIo", "iocEthernet", "qos",  "fcoe",     "fcpimMod", "ethernetPort",
        "fcpimIop", "fcpim", "fabric",      "ioc",  "firmware"};
    int base = 1700;
    for (const char* g : groups) {
        if (group == g)
            break;
        base += 100;
    }
    std::vector<int> ids;
    for (int i = 1; i <= 6; ++i)
        ids.push_back(base + i);
    return ids;
}

unsigned long counterValue(const std::string& seed, const std::string& group, int id) {
    unsigned long h = 2166136261ul;
    auto mix = [&h](const std::string& s) {
        for (unsigned char ch : s)
            h = (h ^ ch) * 16777619ul & 0xfffffffful;
    };
    mix(lowerCase(seed));
    mix(group);
    mix(std::to_string(id));
    return h % 100000;
}

Json::Value& statsGroup(Json::Value& holder, const std::string& group, const std::string& seed,
                        bool fcoe) {
    Json::Value& stats = holder["statistics"];
    if (!stats.isObject())
        stats = Json::Value(Json::objectValue);
    if (!stats.isMember(group)) {
        Json::Value list(Json::arrayValue);
        for (int id : defaultIds(group, fcoe)) {
            Json::Value e(Json::objectValue);
            e["id"] = id;
            e["value"] = std::to_string(counterValue(seed, group, id));
            list.append(e);
        }
        stats[group] = list;
    }
    return stats[group];
}

enum class Scope { Adapter, FcPort, LPortKey, EthPort, LPort, VPort, RPort, Lun };

struct StatRow {
    EntryId id;
    Scope scope;
    std::array<const char*, 4> keys;  // request members naming the object, outermost first
    const char* groups;               // comma-separated
    bool reset;
};

const StatRow kStatRows[] = {
    {EP_getPortStatistics, Scope::FcPort, {"indexStr"}, "port", false},
    {EP_getDynamicPortStatistics, Scope::FcPort, {"indexStr"}, "port", false},
    {EP_getDynamicRPortStatistics,
     Scope::RPort,
     {"pPortWwn", "lPortWwn", "rPortWwn"},
     "rport",
     false},
    {EP_getDynamicVPortStatistics, Scope::VPort, {"pPortWwn", "lPortWwn"}, "vport", false},
    {EP_getDynamicLogicalPortStatistics, Scope::LPort, {"pPortWwn", "lPortWwn"}, "lport", false},
    {EP_getDynamicPortAuthStatistics, Scope::FcPort, {"pPortWwn"}, "auth", false},
    {EP_getDynamicTrunkingStatistics, Scope::Adapter, {"indexStr"}, "trunking", false},
    {EP_getDynamicvHBAStatistics, Scope::LPortKey, {"wwn"}, "vhba", false},
    {EP_getDynamicvNICStatistics, Scope::EthPort, {"mac"}, "vnic", false},
    {EP_getDynamicvNICStatisticsForGraph, Scope::EthPort, {"mac"}, "vnic", false},
    {EP_getDynamicLldpStatistics, Scope::EthPort, {"mac"}, "lldp", false},
    {EP_getDynamicAdvancedIoDataAtPPort, Scope::FcPort, {"pPortWwn"}, "advIo", false},
    {EP_getDynamicAdvancedIoDataAtLPort, Scope::LPort, {"pPortWwn", "lPortWwn"}, "advIo", false},
    {EP_getDynamicAdvancedIoDataAtRPort,
     Scope::RPort,
     {"pPortWwn", "lPortWwn", "rPortWwn"},
     "advIo",
     false},
    {EP_getDynamicAdvancedIoDataAtLun,
     Scope::Lun,
     {"pPortWwn", "lPortWwn", "rPortWwn", "lunId"},
     "advIo",
     false},
    {EP_getDynamicIOCEthernetStatistics, Scope::EthPort, {"mac"}, "iocEthernet", false},
    {EP_getDynamicQosStatistics, Scope::FcPort, {"pPortWwn"}, "qos", false},
    {EP_getDynamicFcoeStatistics, Scope::FcPort, {"indexStr"}, "fcoe", false},
    {EP_getDynamicFcpimModStatistics, Scope::FcPort, {"indexStr"}, "fcpimMod", false},
    {EP_getDynamicEthernetPortStatistics, Scope::EthPort, {"mac"}, "ethernetPort", false},
    {EP_getDynamicFcpimIopStatistics,
     Scope::RPort,
     {"pPortWwn", "lPortWwn", "rPortWwn"},
     "fcpimIop",
     false},
    {EP_getDynamicFcpimStatistics,
     Scope::RPort,
     {"pPortWwn", "lPortWwn", "rPortWwn"},
     "fcpim",
     false},
    {EP_getDynamicFabricStatistics, Scope::FcPort, {"wwn"}, "fabric", false},
    {EP_getDynamicIocStatistics, Scope::Adapter, {"pwwn"}, "ioc", false},
    {EP_getDynamicFirmwareStatistics, Scope::Adapter, {"indexStr"}, "firmware", false},
    {EP_resetStatisticsForPortAuth, Scope::FcPort, {"wwn"}, "auth", true},
    {EP_resetStatisticsForPort, Scope::FcPort, {"indexStr"}, "port", true},
    {EP_resetStatisticsForLPort, Scope::LPort, {"pwwn", "lwwn"}, "lport", true},
    {EP_resetStatisticsForFcpim,
     Scope::RPort,
     {"pPortWwn", "lPortWwn", "rPortWwn"},
     "fcpim,fcpimIop",
     true},
    {EP_resetStatisticsForRPort, Scope::RPort, {"pPortWwn", "lPortWwn", "rPortWwn"}, "rport", true},
    {EP_resetStatisticsForVPort, Scope::VPort, {"pwwn", "vwwn"}, "vport", true},
    {EP_resetStatisticsForIoc, Scope::Adapter, {"pwwn"}, "ioc", true},
    {EP_resetTrunkingStatistics, Scope::Adapter, {"indexStr"}, "trunking", true},
    {EP_resetFirmwareStatistics, Scope::Adapter, {"indexStr"}, "firmware", true},
    {EP_resetStatisticsForQos, Scope::FcPort, {"pPortWwn"}, "qos", true},
    {EP_resetStatisticsForFabric, Scope::FcPort, {"pwwn"}, "fabric", true},
    {EP_resetLldpStatistics, Scope::EthPort, {"mac"}, "lldp", true},
    {EP_resetIOCEthernetStatistics, Scope::EthPort, {"mac"}, "iocEthernet", true},
    {EP_resetEthernetPortStatistics, Scope::EthPort, {"mac"}, "ethernetPort", true},
    {EP_resetvNICStatistics, Scope::EthPort, {"mac"}, "vnic", true},
    {EP_resetvHBAStatistics, Scope::LPortKey, {"wwn"}, "vhba", true},
    {EP_resetFcoeStatistics, Scope::FcPort, {"indexStr"}, "fcoe", true},
    {EP_resetStatisticsForFcpimMod, Scope::FcPort, {"indexStr"}, "fcpimMod", true},
};

// The object whose "statistics" a request names.
struct StatTarget {
    Json::Value* holder = nullptr;
    std::string seed;
    bool fcoe = false;
};

Json::Value& lunHolder(Json::Value& rp, const Json::Value& req, const char* lunMember) {
    const long long lun = number(req, lunMember);
    for (const Json::Value& u : rp["lunList"])
        if (u["number"].isIntegral() && u["number"].asLargestInt() == lun)
            return rp["lunStatistics"][std::to_string(lun)];
    fail(kNotFound,
         "no LUN " + std::to_string(lun) + " on remote port " + rp["remotePortWwn"].asString());
}

StatTarget resolve(Call& c, Scope scope, const std::array<const char*, 4>& keys) {
    const Json::Value& req = c.req;
    StatTarget t;
    switch (scope) {
        case Scope::Adapter: {
            std::string k = key(req, keys[0], Form::Any);
            t.holder = &c.st.model.adapter(adapterOwning(c, k));
            t.seed = k;
            break;
        }
        case Scope::FcPort: {
            std::string k = key(req, keys[0], Form::Any);
            t.holder = &fcPortWrapper(c, k);
            t.fcoe = (*t.holder)["port"]["isFCoE"].asBool();
            t.seed = k;
            break;
        }
        case Scope::LPortKey: {
            std::string k = key(req, keys[0], Form::Wwn);
            VPortRef v;
            t.holder = c.st.model.findVPort(k, v) ? &c.st.model.vport(v) : &fcPortWrapper(c, k);
            t.seed = k;
            break;
        }
        case Scope::EthPort: {
            std::string k = key(req, keys[0], Form::Mac);
            t.holder = &ethPortWrapper(c, k);
            t.seed = k;
            break;
        }
        case Scope::LPort:
        case Scope::VPort: {
            std::string p = key(req, keys[0], Form::Wwn), l = key(req, keys[1], Form::Wwn);
            t.holder = &logicalPort(c, p, l);
            if (scope == Scope::VPort && !t.holder->isMember("vportWwn"))
                fail(kNotFound, "no virtual port " + l);
            t.seed = l;
            break;
        }
        case Scope::RPort:
        case Scope::Lun: {
            std::string p = key(req, keys[0], Form::Wwn), l = key(req, keys[1], Form::Wwn);
            std::string r = key(req, keys[2], Form::Wwn);
            Json::Value& rp = remotePort(c, p, l, r);
            t.holder = scope == Scope::RPort ? &rp : &lunHolder(rp, req, keys[3]);
            t.seed = p + r +
                     (scope == Scope::Lun ? std::to_string(number(req, keys[3])) : std::string());
            break;
        }
    }
    return t;
}

Json::Value statistics(Call& c) {
    const StatRow* row = nullptr;
    for (const StatRow& r : kStatRows)
        if (r.id == c.id)
            row = &r;
    StatTarget t = resolve(c, row->scope, row->keys);
    std::stringstream groups(row->groups);
    std::string group;
    while (std::getline(groups, group, ',')) {
        if (group == "fcoe" && !t.fcoe)
            fail(kInvalidState, "not an FCoE port");
        Json::Value& list = statsGroup(*t.holder, group, t.seed, t.fcoe);
        if (!row->reset)
            return list;
        for (Json::Value& e : list)
            e["value"] = "0";
    }
    return ok();
}

// ---------------------------------------------------------------------------
// Start-up and discovery

Json::Value initHbaLib(Call& c) {
    const long long app = number(c.req, "appId");
    c.log(2, __FILE__, __LINE__,
          "library initialised for application " + std::to_string(app) + ": " +
              std::to_string(c.st.model.adapterCount()) + " adapter(s)");
    Json::Value r(Json::objectValue);
    r["result"] = c.st.initResult;
    return r;
}

Json::Value getAllAdaptersIndexString(Call& c) {
    noKeyRequest(c.req);
    Json::Value r(Json::objectValue);
    r["indexStrings"] = Json::Value(Json::arrayValue);
    for (int a = 0; a < c.st.model.adapterCount(); ++a)
        r["indexStrings"].append(c.st.model.adapterKey(a));
    return r;
}

Json::Value portIndices(Call& c) {
    Json::Value& ad = c.st.model.adapter(adapterExact(c, key(c.req, "indexStr", Form::Any)));
    const bool eth = c.id == EP_getEthPhyPortIndicesByAdapter;
    Json::Value r(Json::objectValue);
    r["indexStrings"] = Json::Value(Json::arrayValue);
    for (const Json::Value& p : ad[eth ? "ethPorts" : "fcPorts"])
        r["indexStrings"].append(eth ? p["ethData"]["mac"] : p["port"]["wwn"]);
    return r;
}

Json::Value hbaDetails(Call& c) {
    const std::string k = wwnOrMacKey(c.req);
    Json::Value& ad = c.st.model.adapter(adapterExact(c, k));
    Json::Value r(Json::objectValue);
    r["hbaData"] = ad["hbaData"];
    r["driver"] = ad["driver"];
    r["firmware"] = ad["firmware"];
    return r;
}

Json::Value adapterId(Call& c) {
    std::string k = key(c.req, "indexStr", Form::Any);
    int a = c.id == EP_getAdapterId ? c.st.model.findAdapter(k) : c.st.model.findOwner(k);
    Json::Value r(Json::objectValue);
    r["adapterId"] = static_cast<unsigned>(a + 1);  // 0: no such adapter
    return r;
}

Json::Value getHost(Call& c) {
    Json::Value r(Json::objectValue);
    r["result"] = c.st.model.host();
    return r;
}

Json::Value getServerTime(Call& c) {
    const Json::Value& fixed = c.st.model.root()["serverTime"];
    if (fixed.isObject())
        return fixed;
    Json::Value r(Json::objectValue);
    r["serverTime"] = static_cast<Json::Int64>(std::time(nullptr));
    return r;
}

Json::Value getDriverUpdateStatus(Call& c) {
    const Json::Value& fixed = c.st.model.root()["driverUpdateStatus"];
    if (fixed.isObject())
        return fixed;
    Json::Value r(Json::objectValue);
    r["status"] = 0;
    r["inProgress"] = false;
    r["log"] = Json::Value(Json::arrayValue);
    return r;
}

Json::Value getGlobalInfo(Call& c) {
    Model& m = c.st.model;
    Json::Value r(Json::objectValue);
    r["numOfAdapters"] = m.adapterCount();
    r["adapter"] = Json::Value(Json::arrayValue);
    for (const Json::Value& ad : m.adapters()) {
        const Json::Value& hba = ad["hbaData"];
        const Json::Value& fcs = ad["fcPorts"];
        const Json::Value& eths = ad["ethPorts"];
        const bool cna = hba.isMember("hbaMAC");
        Json::Value g(Json::objectValue);
        g["mac"] = hba.get("hbaMAC", "");
        g["wwn"] = hba.get("wwn", "");
        g["cna"] = cna;
        g["fc"] = !cna && fcs.size() > 0;
        g["fcoe"] = cna && fcs.size() > 0;
        g["ethPort"] = eths.size() > 0;
        const Json::ArrayIndex n = std::max(fcs.size(), eths.size());
        g["numOfPorts"] = n;
        for (const char* list :
             {"portHasFc", "portWwn", "portHasEth", "portMac", "portHasFcoe", "fcoeMac"})
            g[list] = Json::Value(Json::arrayValue);
        for (Json::ArrayIndex j = 0; j < n; ++j) {
            const bool hasFc = j < fcs.size(), hasEth = j < eths.size();
            g["portHasFc"].append(hasFc && !cna);
            g["portWwn"].append(hasFc ? fcs[j]["port"]["wwn"] : Json::Value(""));
            g["portHasEth"].append(hasEth);
            g["portMac"].append(hasEth ? eths[j]["ethData"]["mac"] : Json::Value(""));
            g["portHasFcoe"].append(hasFc && cna);
            g["fcoeMac"].append(hasFc ? fcs[j]["port"].get("fcoeMac", "") : Json::Value(""));
        }
        r["adapter"].append(g);
    }
    return r;
}

Json::Value getFlashInfo(Call& c) {
    Json::Value& ad = c.st.model.adapter(adapterExact(c, key(c.req, "indexStr", Form::Any)));
    Json::Value r = ad["flash"];
    r["firmwareVersion"] = ad["firmware"]["version"];
    r["biosVersion"] = ad["firmware"]["biosVersion"];
    return r;
}

// ---------------------------------------------------------------------------
// Ports

Json::Value getPortByWwn(Call& c) {
    const std::string k = wwnOrMacKey(c.req);
    return anyPortWrapper(c, k)["port"];
}

Json::Value setPortByWwn(Call& c) {
    bool isEth = false;
    Json::Value& w = anyPortWrapper(c, key(c.req, "indexStr", Form::Any), &isEth);
    const Json::Value& given = object(c.req, "port");
    const Json::Value& names = array(c.req, "propArray");
    Json::Value& port = w["port"];
    copyListed(port, given, names, "port");
    for (const Json::Value& n : names) {
        if (n.asString() != "portStatus")
            continue;
        const Json::Value state =
            port["portStatus"].asBool() ? w["enabledStatusValue"] : Json::Value(10);
        port["portStatusValue"] = state;
        if (isEth)
            w["ethData"]["ethPortStateMOFValue"] = state;
    }
    Json::Value r = ok();
    r["port"] = port;
    return r;
}

Json::Value getOpticsSFP(Call& c) {
    Json::Value& w = anyPortWrapper(c, key(c.req, "indexStr", Form::Any));
    if (!w["sfp"].isObject())
        fail(kNotFound, "no optic in port " + c.req["indexStr"].asString());
    return w["sfp"];
}

Json::Value getOpticsPOM(Call& c) {
    Json::Value& w = anyPortWrapper(c, key(c.req, "portWwn", Form::Any));
    if (!w["sfp"].isObject())
        fail(kNotFound, "no optic in port " + c.req["portWwn"].asString());
    Json::Value d(Json::objectValue);
    d["temperature"] = "34.5";
    d["voltage"] = "3.31";
    d["current"] = "6.8";
    d["txPower"] = "-2.3";
    d["rxPower"] = "-3.1";
    d["pomLevel"] = "Normal";
    return materialize(w, "pom", d);
}

Json::Value fcDefaults(const Json::Value& port) {
    Json::Value d(Json::objectValue);
    d["wwn"] = port["wwn"];
    d["nodeWwn"] = port["nodeWwn"];
    d["maxFrameSize"] = port["maxFrameSize"];
    d["configuredSpeed"] = 0;
    d["topology"] = "auto";
    d["qosEnabled"] = false;
    return d;
}

Json::Value getFcByFcWwn(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "wwn", Form::Wwn));
    return materialize(w, "fc", fcDefaults(w["port"]));
}

Json::Value setFcByFcWwn(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "portWwn", Form::Wwn));
    Json::Value& fc = materialize(w, "fc", fcDefaults(w["port"]));
    copyListed(fc, object(c.req, "fcPortData"), array(c.req, "paramsConfigured"), "fcPortData");
    Json::Value r = ok();
    r["fcPortData"] = fc;
    return r;
}

Json::Value& fcoeData(Call& c, const std::string& k) {
    Json::Value& w = fcPortWrapper(c, k);
    if (!w["port"]["isFCoE"].asBool())
        fail(kInvalidState, "not an FCoE port: " + k);
    Json::Value d(Json::objectValue);
    d["wwn"] = w["port"]["wwn"];
    d["fcoeMac"] = w["port"].get("fcoeMac", "");
    d["vlanId"] = 1002;
    d["fipState"] = "online";
    return materialize(w, "fcoe", d);
}

Json::Value getFcoeByPort(Call& c) {
    return fcoeData(c, key(c.req, "indexStr", Form::Any));
}

Json::Value setFcoeByPort(Call& c) {
    Json::Value& fcoe = fcoeData(c, key(c.req, "indexStr", Form::Any));
    copyListed(fcoe, object(c.req, "fcoePort"), array(c.req, "propArray"), "fcoePort");
    Json::Value r = ok();
    r["fcoePort"] = fcoe;
    return r;
}

Json::Value getBootOverSanByPort(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "indexStr", Form::Any));
    Json::Value d(Json::objectValue);
    d["bootEnabled"] = false;
    d["bootLunList"] = Json::Value(Json::arrayValue);
    return materialize(w, "bootOverSan", d);
}

Json::Value getAdvPortDataByPort(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "indexStr", Form::Any));
    Json::Value d(Json::objectValue);
    d["wwn"] = w["port"]["wwn"];
    d["trlEnabled"] = false;
    d["qosEnabled"] = false;
    d["maxVports"] = 255;
    d["numOfVports"] = w["vports"].size();
    Json::Value& adv = materialize(w, "advPortData", d);
    adv["numOfVports"] = w["vports"].size();
    return adv;
}

Json::Value authDefaults() {
    Json::Value d(Json::objectValue);
    d["authEnabled"] = false;
    d["algorithm"] = "MD5";
    d["groupName"] = "NULL";
    d["status"] = "disabled";
    return d;
}

Json::Value getPortAuthentication(Call& c) {
    return materialize(fcPortWrapper(c, key(c.req, "wwn", Form::Wwn)), "authentication",
                       authDefaults());
}

Json::Value setPortAuthentication(Call& c) {
    Json::Value& auth = materialize(fcPortWrapper(c, key(c.req, "pPortWwn", Form::Wwn)),
                                    "authentication", authDefaults());
    const Json::Value& given = object(c.req, "portAuth");
    for (const std::string& name : given.getMemberNames()) {
        if (auth.isMember(name) && !sameType(auth[name], given[name]))
            fail(kInvalidValue, quoted(name.c_str()) + " has the wrong JSON type");
    }
    for (const std::string& name : given.getMemberNames())
        auth[name] = given[name];
    Json::Value r = ok();
    r["portAuth"] = auth;
    return r;
}

Json::Value resetPortAuthentication(Call& c) {
    fcPortWrapper(c, key(c.req, "pPortWwn", Form::Wwn))["authentication"] = authDefaults();
    return ok();
}

Json::Value getEthPortByEthMac(Call& c) {
    Json::Value r(Json::objectValue);
    r["ethData"] = ethPortWrapper(c, key(c.req, "mac", Form::Mac))["ethData"];
    return r;
}

Json::Value getAllEthPortByEthMac(Call& c) {
    Json::Value& ad = c.st.model.adapter(adapterOwning(c, key(c.req, "mac", Form::Mac)));
    Json::Value r(Json::objectValue);
    r["ethPorts"] = Json::Value(Json::arrayValue);
    for (const Json::Value& e : ad["ethPorts"]) {
        Json::Value one(Json::objectValue);
        one["ethData"] = e["ethData"];
        r["ethPorts"].append(one);
    }
    return r;
}

Json::Value setEthPort(Call& c) {
    Json::Value& eth = ethPortWrapper(c, key(c.req, "mac", Form::Mac))["ethData"];
    copyListed(eth, object(c.req, "ethPort"), array(c.req, "propArray"), "ethPort");
    Json::Value r = ok();
    r["ethData"] = eth;
    return r;
}

Json::Value getLldp(Call& c) {
    Json::Value& w = ethPortWrapper(c, key(c.req, "mac", Form::Mac));
    Json::Value d(Json::objectValue);
    d["chassisId"] = w["ethData"]["mac"];
    d["portId"] = w["ethData"]["mac"];
    d["systemName"] = "";
    d["ttl"] = 120;
    return materialize(w, "lldp", d);
}

Json::Value getCee(Call& c) {
    Json::Value& w = ethPortWrapper(c, key(c.req, "mac", Form::Mac));
    Json::Value d(Json::objectValue);
    d["ceeState"] = "Linkup";
    d["pfcEnabled"] = true;
    d["priorityGroups"] = Json::Value(Json::arrayValue);
    return materialize(w, "cee", d);
}

Json::Value clearLogsForPort(Call& c) {
    Json::Value r = ok();
    r["cleared"] = array(c.req, "propArray").size();
    return r;
}

// ---------------------------------------------------------------------------
// Remote ports and LUNs

Json::Value getAllRemotePorts(Call& c) {
    std::string p = key(c.req, "pPortWwn", Form::Wwn), l = key(c.req, "lPortWwn", Form::Wwn);
    Json::Value& lport = logicalPort(c, p, l);
    Json::Value r(Json::arrayValue);
    if (lport.isMember("vportWwn"))
        return r;  // virtual ports see no remote ports here
    for (const Json::Value& rp : lport["remotePorts"]) {
        Json::Value s(Json::objectValue);
        s["remotePortWwn"] = rp["remotePortWwn"];
        if (rp.isMember("remoteNodeWwn"))
            s["remoteNodeWwn"] = rp["remoteNodeWwn"];
        s["isTarget"] = rp["deviceData"]["isTarget"];
        r.append(s);
    }
    return r;
}

Json::Value getCompleteRemotePort(Call& c) {
    return stripped(remotePort(c, key(c.req, "pPortWwn", Form::Wwn),
                               key(c.req, "lPortWwn", Form::Wwn),
                               key(c.req, "rPortWwn", Form::Wwn)));
}

Json::Value getAllLunsByRemotePort(Call& c) {
    Json::Value& rp =
        remotePort(c, key(c.req, "pPortWwn", Form::Wwn), key(c.req, "lPortWwn", Form::Wwn),
                   key(c.req, "rPortWwn", Form::Wwn));
    Json::Value r(Json::objectValue);
    r["lunList"] = rp.isMember("lunList") ? rp["lunList"] : Json::Value(Json::arrayValue);
    return r;
}

Json::Value lunMaskDefaults() {
    Json::Value d(Json::objectValue);
    d["lunMaskEnabled"] = false;
    d["lunMaskData"] = Json::Value(Json::arrayValue);
    return d;
}

Json::Value getLunMaskData(Call& c) {
    return materialize(fcPortWrapper(c, key(c.req, "indexStr", Form::Any)), "lunMask",
                       lunMaskDefaults());
}

// Adds the objects of `added` missing from `list` and removes those of `removed`.
void editList(Json::Value& list, const Json::Value* removed, const Json::Value* added) {
    for (const Json::Value* l : {removed, added})
        if (l)
            for (const Json::Value& e : *l)
                if (!e.isObject())
                    fail(kBadRequest, "list entries must be JSON objects");
    Json::Value next(Json::arrayValue);
    for (const Json::Value& e : list) {
        bool drop = false;
        if (removed)
            for (const Json::Value& x : *removed)
                drop = drop || x == e;
        if (!drop)
            next.append(e);
    }
    if (added)
        for (const Json::Value& x : *added) {
            bool present = false;
            for (const Json::Value& e : next)
                present = present || x == e;
            if (!present)
                next.append(x);
        }
    list = next;
}

Json::Value setLunMaskData(Call& c) {
    Json::Value& mask = materialize(fcPortWrapper(c, key(c.req, "indexStr", Form::Any)), "lunMask",
                                    lunMaskDefaults());
    const Json::Value* removed =
        has(c.req, "removedLunMaskData") ? &array(c.req, "removedLunMaskData") : nullptr;
    const Json::Value* added =
        has(c.req, "addedLunMaskData") ? &array(c.req, "addedLunMaskData") : nullptr;
    const bool clear = has(c.req, "clearLunMaskData") && flag(c.req, "clearLunMaskData");
    Json::Value list = clear ? Json::Value(Json::arrayValue) : mask["lunMaskData"];
    editList(list, removed, added);
    mask["lunMaskData"] = list;
    mask["lunMaskEnabled"] = list.size() > 0;
    Json::Value r = ok();
    r["lunMaskData"] = list;
    return r;
}

// ---------------------------------------------------------------------------
// Adapter configuration

Json::Value setAdapterState(Call& c) {
    Json::Value& ad = c.st.model.adapter(adapterExact(c, key(c.req, "indexStr", Form::Any)));
    const bool enable = flag(c.req, "enableState");
    ad["hbaData"]["hbaStatus"] = enable;
    Json::Value r = ok();
    r["hbaStatus"] = enable;
    return r;
}

Json::Value& advAdapterData(Json::Value& ad) {
    Json::Value& adv = ad["advAdapterData"];
    if (!adv.isMember("trunkingEnabled"))
        adv["trunkingEnabled"] = false;
    if (!adv.isMember("adapterMode"))
        adv["adapterMode"] = ad["hbaData"].isMember("hbaMAC") ? "CNA" : "HBA";
    return adv;
}

Json::Value getAdvAdapterData(Call& c) {
    return advAdapterData(c.st.model.adapter(adapterOwning(c, key(c.req, "indexStr", Form::Any))));
}

Json::Value setAdapterMode(Call& c) {
    Json::Value& adv =
        advAdapterData(c.st.model.adapter(adapterExact(c, key(c.req, "indexStr", Form::Any))));
    const Json::Value& mode = member(c.req, "adapterMode");
    if (!mode.isString() && !mode.isIntegral())
        fail(kBadRequest, "\"adapterMode\" must be text or an integer");
    adv["adapterMode"] = mode;
    Json::Value r = ok();
    r["adapterMode"] = mode;
    return r;
}

Json::Value setFcTrunkingState(Call& c) {
    Json::Value& ad = c.st.model.adapter(adapterExact(c, key(c.req, "indexStr", Form::Any)));
    const bool enable = flag(c.req, "enableState");
    if (enable && (ad["hbaData"].isMember("hbaMAC") || ad["fcPorts"].size() < 2))
        fail(kInvalidState, "trunking needs an FC HBA with two ports");
    advAdapterData(ad)["trunkingEnabled"] = enable;
    Json::Value r = ok();
    r["trunkingEnabled"] = enable;
    return r;
}

// The key of an alias object: "indexStr", "wwn" or "mac", whichever it has.
std::string aliasKey(Call& c) {
    for (const char* name : {"indexStr", "wwn", "mac"})
        if (has(c.req, name))
            return key(c.req, name, Form::Any);
    fail(kBadRequest, "the alias object needs \"indexStr\", \"wwn\" or \"mac\"");
}

Json::Value setAdapterAlias(Call& c) {
    std::string k = aliasKey(c);
    const std::string alias = text(c.req, "alias");
    c.st.model.adapter(adapterOwning(c, k))["hbaData"]["alias"] = alias;
    Json::Value r = ok();
    r["alias"] = alias;
    return r;
}

Json::Value setPortAlias(Call& c) {
    std::string k = aliasKey(c);
    const std::string alias = text(c.req, "alias");
    int a = c.st.model.findAdapter(k);
    if (a >= 0) {
        c.st.model.adapter(a)["hbaData"]["alias"] = alias;
    } else {
        bool isEth = false;
        Json::Value& w = anyPortWrapper(c, k, &isEth);
        (isEth ? w["ethData"] : w["port"])["alias"] = alias;
    }
    Json::Value r = ok();
    r["alias"] = alias;
    return r;
}

Json::Value getAdapterPciFnData(Call& c) {
    Json::Value& ad = c.st.model.adapter(adapterOwning(c, key(c.req, "indexStr", Form::Any)));
    Json::Value fns(Json::arrayValue);
    if (ad["pciFunctions"].size() > 0) {
        fns = ad["pciFunctions"];
    } else {
        int index = 0;
        for (const Json::Value& fp : ad["fcPorts"]) {
            Json::Value f(Json::objectValue);
            f["pciFunctionIndex"] = index++;
            f["type"] = fp["port"]["isFCoE"].asBool() ? "FCoE" : "FC";
            f["portIndex"] = fp["port"]["wwn"];
            fns.append(f);
        }
        for (const Json::Value& ep : ad["ethPorts"]) {
            Json::Value f(Json::objectValue);
            f["pciFunctionIndex"] = index++;
            f["type"] = "Ethernet";
            f["portIndex"] = ep["ethData"]["mac"];
            fns.append(f);
        }
    }
    for (const Json::Value& ep : ad["ethPorts"])
        for (const Json::Value& v : ep["vnics"])
            fns.append(v);
    Json::Value r(Json::objectValue);
    r["pciFunctions"] = fns;
    return r;
}

// ---------------------------------------------------------------------------
// Virtual ports and vNICs

Json::Value createVport(Call& c) {
    FcPortRef base;
    Json::Value& w = fcPortWrapper(c, key(c.req, "pwwn", Form::Wwn), &base);
    const std::string vwwn = key(c.req, "vwwn", Form::Wwn);
    const std::string nwwn = key(c.req, "nwwn", Form::Wwn);
    if (c.st.model.wwnInUse(vwwn))
        fail(kInvalidValue, "WWN already in use: " + vwwn);
    Json::Value v(Json::objectValue);
    v["vportWwn"] = vwwn;
    v["nodeWwn"] = nwwn;
    v["symbolicName"] =
        has(c.req, "symbolicName") ? Json::Value(text(c.req, "symbolicName")) : Json::Value("");
    v["vfId"] = has(c.req, "vfId") ? Json::Value(static_cast<Json::Int64>(number(c.req, "vfId")))
                                   : Json::Value(0);
    v["state"] = w["port"]["portStatusValue"].asInt() == 2 ? "Online" : "Offline";
    w["vports"].append(v);
    c.st.model.reindex();
    Json::Value r = ok();
    r["vport"] = v;
    return r;
}

Json::Value deleteVport(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "pwwn", Form::Wwn));
    const Json::Value& list = array(c.req, "vportArray");
    std::vector<std::string> gone;
    for (const Json::Value& e : list) {
        std::string k;
        if (e.isString())
            k = e.asString();
        for (const char* name : {"vportWwn", "vwwn", "wwn"})
            if (k.empty() && e.isObject() && e[name].isString())
                k = e[name].asString();
        if (!isWwn(k))
            fail(kBadKey, "\"vportArray\" entries must be virtual port WWNs in colon format");
        bool found = false;
        for (const Json::Value& v : w["vports"])
            found = found || sameKey(v["vportWwn"].asString(), k);
        if (!found)
            fail(kNotFound, "no virtual port " + k + " on port " + w["port"]["wwn"].asString());
        gone.push_back(lowerCase(k));
    }
    Json::Value kept(Json::arrayValue);
    for (const Json::Value& v : w["vports"])
        if (std::find(gone.begin(), gone.end(), lowerCase(v["vportWwn"].asString())) == gone.end())
            kept.append(v);
    w["vports"] = kept;
    c.st.model.reindex();
    Json::Value r = ok();
    r["deleted"] = static_cast<unsigned>(gone.size());
    return r;
}

Json::Value getAllVPorts(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "wwn", Form::Wwn));
    Json::Value r(Json::objectValue);
    r["vports"] = Json::Value(Json::arrayValue);
    for (const Json::Value& v : w["vports"])
        r["vports"].append(stripped(v));
    return r;
}

Json::Value getVPort(Call& c) {
    std::string p = key(c.req, "pPortWwn", Form::Wwn), l = key(c.req, "lPortWwn", Form::Wwn);
    Json::Value& v = logicalPort(c, p, l);
    if (!v.isMember("vportWwn"))
        fail(kNotFound, "no virtual port " + l);
    return stripped(v);
}

void checkBandwidth(long long minBw, long long maxBw) {
    if (minBw < 0 || maxBw > 100 || minBw > maxBw)
        fail(kInvalidValue, "bandwidth must satisfy 0 <= minBandwidth <= maxBandwidth <= 100");
}

Json::Value createvNIC(Call& c) {
    EthPortRef ref;
    const std::string mac = key(c.req, "mac", Form::Mac);
    if (!c.st.model.findEthPort(mac, ref))
        fail(kNotFound, "no Ethernet port " + mac);
    const long long minBw = number(c.req, "minBandwidth"), maxBw = number(c.req, "maxBandwidth");
    checkBandwidth(minBw, maxBw);
    Json::Value& ad = c.st.model.adapter(ref.a);
    int next = 0;
    for (const Json::Value& ep : ad["ethPorts"])
        for (const Json::Value& v : ep["vnics"])
            next = std::max(next, v["pciFunctionIndex"].asInt() + 1);
    next = std::max<int>(next, 16);
    Json::Value v(Json::objectValue);
    v["pciFunctionIndex"] = next;
    v["type"] = "vNIC";
    v["portIndex"] = mac;
    char vmac[24];
    std::snprintf(vmac, sizeof vmac, "02:%s:%02x", mac.substr(6, 11).c_str(), next & 0xff);
    v["mac"] = vmac;
    v["minBandwidth"] = static_cast<Json::Int64>(minBw);
    v["maxBandwidth"] = static_cast<Json::Int64>(maxBw);
    c.st.model.ethPort(ref.a, ref.e)["vnics"].append(v);
    Json::Value r = ok();
    r["vnic"] = v;
    return r;
}

Json::Value& vnicByIndex(Json::Value& ep, const Json::Value& index) {
    if (!index.isIntegral())
        fail(kBadRequest, "\"pciFunctionIndex\" must be an integer");
    for (Json::Value& v : ep["vnics"])
        if (v["pciFunctionIndex"].asLargestInt() == index.asLargestInt())
            return v;
    fail(kNotFound, "no vNIC with PCI function " + std::to_string(index.asLargestInt()));
}

Json::Value deletevNICs(Call& c) {
    Json::Value& ep = ethPortWrapper(c, key(c.req, "mac", Form::Mac));
    const Json::Value& list = array(c.req, "pciFunctionIndices");
    for (const Json::Value& i : list)
        vnicByIndex(ep, i);
    Json::Value kept(Json::arrayValue);
    for (const Json::Value& v : ep["vnics"]) {
        bool drop = false;
        for (const Json::Value& i : list)
            drop = drop || v["pciFunctionIndex"].asLargestInt() == i.asLargestInt();
        if (!drop)
            kept.append(v);
    }
    ep["vnics"] = kept;
    Json::Value r = ok();
    r["vnics"] = kept;
    return r;
}

Json::Value modifyvNIC(Call& c) {
    Json::Value& ep = ethPortWrapper(c, key(c.req, "mac", Form::Mac));
    const Json::Value& list = array(c.req, "vNICs");
    // Changes apply to a copy first so that a bad entry changes nothing.
    Json::Value work(Json::objectValue);
    work["vnics"] = ep["vnics"];
    for (const Json::Value& m : list) {
        if (!m.isObject())
            fail(kBadRequest, "\"vNICs\" entries must be JSON objects");
        Json::Value& v = vnicByIndex(work, m["pciFunctionIndex"]);
        long long minBw =
            has(m, "minBandwidth") ? number(m, "minBandwidth") : v["minBandwidth"].asLargestInt();
        long long maxBw =
            has(m, "maxBandwidth") ? number(m, "maxBandwidth") : v["maxBandwidth"].asLargestInt();
        checkBandwidth(minBw, maxBw);
        v["minBandwidth"] = static_cast<Json::Int64>(minBw);
        v["maxBandwidth"] = static_cast<Json::Int64>(maxBw);
    }
    ep["vnics"] = work["vnics"];
    Json::Value r = ok();
    r["vnics"] = ep["vnics"];
    return r;
}

// ---------------------------------------------------------------------------
// Advanced I/O profiles

Json::Value setAdvIoProfile(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "indexStr", Form::Any));
    const bool hasAdded = has(c.req, "addedAdvancedIoProfiles"),
               hasRemoved = has(c.req, "removedAdvancedIoProfiles");
    if (!hasAdded && !hasRemoved)
        fail(kBadRequest,
             "the request needs \"addedAdvancedIoProfiles\" or \"removedAdvancedIoProfiles\"");
    Json::Value list = w["advIoProfiles"];
    editList(list, hasRemoved ? &array(c.req, "removedAdvancedIoProfiles") : nullptr,
             hasAdded ? &array(c.req, "addedAdvancedIoProfiles") : nullptr);
    w["advIoProfiles"] = list;
    Json::Value r = ok();
    r["advancedIoProfiles"] = list;
    return r;
}

Json::Value getAdvIoProfile(Call& c) {
    Json::Value r(Json::objectValue);
    r["advancedIoProfiles"] = fcPortWrapper(c, key(c.req, "indexStr", Form::Any))["advIoProfiles"];
    return r;
}

Json::Value clearAdvIoProfile(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "indexStr", Form::Any));
    std::vector<std::pair<std::string, std::string>> scope;
    for (const char* name : {"lPortWwn", "rPortWwn"})
        if (has(c.req, name))
            scope.emplace_back(name, key(c.req, name, Form::Wwn));
    if (has(c.req, "lunId"))
        scope.emplace_back("lunId", std::to_string(number(c.req, "lunId")));
    Json::Value kept(Json::arrayValue);
    unsigned removed = 0;
    for (const Json::Value& p : w["advIoProfiles"]) {
        bool match = true;
        for (const auto& s : scope) {
            const Json::Value& v = p[s.first];
            std::string have = v.isIntegral() ? std::to_string(v.asLargestInt()) : v.asString();
            match = match && sameKey(have, s.second);
        }
        if (match)
            ++removed;
        else
            kept.append(p);
    }
    w["advIoProfiles"] = kept;
    Json::Value r = ok();
    r["removed"] = removed;
    return r;
}

Json::Value resetDataForAdvIoProf(Call& c) {
    const std::string p = key(c.req, "indexStr", Form::Wwn);
    Json::Value& w = fcPortWrapper(c, p);
    std::vector<Json::Value*> holders;
    if (!has(c.req, "lPortWwn")) {
        holders.push_back(&w);
    } else {
        const std::string l = key(c.req, "lPortWwn", Form::Wwn);
        if (!has(c.req, "rPortWwn")) {
            holders.push_back(&logicalPort(c, p, l));
        } else {
            Json::Value& rp = remotePort(c, p, l, key(c.req, "rPortWwn", Form::Wwn));
            if (!has(c.req, "lunId")) {
                holders.push_back(&rp);
            } else if (!has(c.req, "endLunRange")) {
                holders.push_back(&lunHolder(rp, c.req, "lunId"));
            } else {
                const long long first = number(c.req, "lunId"), last = number(c.req, "endLunRange");
                if (first > last)
                    fail(kInvalidValue, "\"lunId\" is after \"endLunRange\"");
                for (const Json::Value& u : rp["lunList"]) {
                    long long n = u["number"].asLargestInt();
                    if (u["number"].isIntegral() && n >= first && n <= last)
                        holders.push_back(&rp["lunStatistics"][std::to_string(n)]);
                }
            }
        }
    }
    for (Json::Value* h : holders)
        for (Json::Value& e : statsGroup(*h, "advIo", p, false))
            e["value"] = "0";
    return ok();
}

// ---------------------------------------------------------------------------
// Diagnostics

Json::Value outcome(const Json::Value& defaults, const Json::Value& holder, const char* test) {
    Json::Value r = defaults;
    const Json::Value& given = holder["diagnostics"][test];
    if (given.isObject())
        for (const std::string& name : given.getMemberNames())
            r[name] = given[name];
    return r;
}

Json::Value diagMemoryTest(Call& c) {
    Json::Value& ad = c.st.model.adapter(adapterExact(c, key(c.req, "hbaWwn", Form::Any)));
    Json::Value d(Json::objectValue);
    d["failed"] = false;
    d["status"] = 0;
    for (const char* n :
         {"address", "expected value", "actual value", "error status", "error address"})
        d[n] = 0;
    d["type"] = "march";
    d["output"] = "Memory test passed";
    return outcome(d, ad, "MemoryTest");
}

Json::Value loopback(Call& c, bool eth) {
    const std::string k = key(c.req, "portWwn", eth ? Form::Mac : Form::Any);
    Json::Value& w = eth ? ethPortWrapper(c, k) : anyPortWrapper(c, k);
    const long long frames = number(c.req, "frameCount");
    number(c.req, "mode");
    number(c.req, "dataPattern");
    if (!eth)
        number(c.req, "speed");
    if (frames < 0)
        fail(kInvalidValue, "\"frameCount\" must not be negative");
    Json::Value d(Json::objectValue);
    d["failed"] = false;
    d["outstandingFrames"] = 0;
    d["GoodFrameRcv"] = static_cast<Json::UInt64>(frames);
    d["transmitFrames"] = static_cast<Json::UInt64>(frames);
    d["BadFrameNo"] = 0;
    d["BadFrameInfo"] = 0;
    d["output"] = eth ? "Ethernet loopback test passed" : "Loopback test passed";
    return outcome(d, w, eth ? "EthLoopbackTest" : "LoopbackTest");
}

Json::Value diagLoopbackTest(Call& c) {
    return loopback(c, false);
}
Json::Value diagEthLoopbackTest(Call& c) {
    return loopback(c, true);
}

Json::Value diagPCILoopbackTest(Call& c) {
    Json::Value& w = anyPortWrapper(c, key(c.req, "portWwn", Form::Any));
    number(c.req, "frameCount");
    number(c.req, "dataPattern");
    Json::Value d(Json::objectValue);
    d["failed"] = false;
    d["output"] = "PCI loopback test passed";
    return outcome(d, w, "PCILoopbackTest");
}

const char* const kTestFunctions[] = {"QuickTest", "MemoryTest", "QueueTest",    "PCILoopbackTest",
                                      "DPortTest", "LEDTest",    "LoopbackTest", "EthLoopbackTest",
                                      "EchoTest",  "FCPingTest", "FCTraceTest"};

Json::Value postDiagnostics(Call& c) {
    const std::string function = text(c.req, "function");
    if (std::none_of(std::begin(kTestFunctions), std::end(kTestFunctions),
                     [&](const char* f) { return function == f; }))
        fail(kInvalidValue, "unknown test function " + function);
    const std::string id = requestId(c.req);
    if (has(c.req, "hbaWwn"))
        adapterExact(c, key(c.req, "hbaWwn", Form::Any));
    if (has(c.req, "portWwn"))
        anyPortWrapper(c, key(c.req, "portWwn", Form::Any));
    for (const char* name : {"localPortWwn", "remotePortWwn"})
        if (has(c.req, name))
            key(c.req, name, Form::Wwn);
    DiagRequest& dr = c.st.diagRequests[id];
    if (dr.state != "posted")
        fail(kInvalidState, "tests of request " + id + " were already started");
    Json::Value t(Json::objectValue);
    t["function"] = function;
    t["request"] = c.req;
    dr.tests.append(t);
    Json::Value r = ok();
    r["requestID"] = id;
    r["function"] = function;
    r["testIndex"] = dr.tests.size() - 1;
    return r;
}

DiagRequest& diagRequest(Call& c, const std::string& id) {
    auto it = c.st.diagRequests.find(id);
    if (it == c.st.diagRequests.end())
        fail(kNotFound, "no diagnostic request " + id);
    DiagRequest& dr = it->second;
    if (dr.state == "running" &&
        std::chrono::steady_clock::now() - dr.started >= std::chrono::milliseconds(dr.durationMs))
        dr.state = "completed";
    return dr;
}

Json::Value startTests(Call& c) {
    const std::string id = requestId(c.req);
    const bool stopOnError = flag(c.req, "stopOnError");
    DiagRequest& dr = diagRequest(c, id);
    if (dr.state != "posted")
        fail(kInvalidState, "tests of request " + id + " were already started");
    dr.stopOnError = stopOnError;
    for (const Json::Value& t : dr.tests) {
        const std::string function = t["function"].asString();
        const Json::Value& req = t["request"];
        Json::Value d(Json::objectValue);
        d["function"] = function;
        d["failed"] = false;
        d["status"] = 0;
        d["output"] = function + " passed";
        Json::Value res = d;
        FcPortRef f;
        EthPortRef e;
        const std::string port = req.get("portWwn", "").asString();
        if (c.st.model.findFcPort(port, f))
            res = outcome(d, c.st.model.fcPort(f.a, f.p), function.c_str());
        else if (c.st.model.findEthPort(port, e))
            res = outcome(d, c.st.model.ethPort(e.a, e.e), function.c_str());
        else if (c.st.model.findAdapter(req.get("hbaWwn", "").asString()) >= 0)
            res = outcome(d, c.st.model.adapter(c.st.model.findAdapter(req["hbaWwn"].asString())),
                          function.c_str());
        dr.results.append(res);
        if (stopOnError && res["failed"].asBool())
            break;
    }
    dr.started = std::chrono::steady_clock::now();
    dr.durationMs = c.st.model.root().get("diagnosticDurationMs", 0).asInt();
    dr.state = dr.durationMs > 0 ? "running" : "completed";
    Json::Value r = ok();
    r["requestID"] = id;
    r["state"] = dr.state;
    return r;
}

Json::Value getDiagnosticsResults(Call& c) {
    const std::string id = requestId(c.req);
    DiagRequest& dr = diagRequest(c, id);
    Json::Value r(Json::objectValue);
    r["requestID"] = id;
    r["state"] = dr.state;
    r["stopOnError"] = dr.stopOnError;
    r["results"] = dr.state == "completed" ? dr.results : Json::Value(Json::arrayValue);
    return r;
}

Json::Value cancelTests(Call& c) {
    const std::string id = requestId(c.req);
    DiagRequest& dr = diagRequest(c, id);
    if (dr.state == "completed")
        fail(kInvalidState, "tests of request " + id + " have completed");
    dr.state = "cancelled";
    Json::Value r = ok();
    r["requestID"] = id;
    r["state"] = dr.state;
    return r;
}

Json::Value setDport(Call& c) {
    const std::string id = requestId(c.req);
    Json::Value& w = fcPortWrapper(c, key(c.req, "portWwn", Form::Wwn));
    const bool state = flag(c.req, "state");
    w["dport"]["enabled"] = state;
    Json::Value r = ok();
    r["requestID"] = id;
    r["dportEnabled"] = state;
    return r;
}

Json::Value getDPortTestResult(Call& c) {
    Json::Value& w = fcPortWrapper(c, key(c.req, "portWwn", Form::Wwn));
    const bool enabled = w["dport"]["enabled"].asBool();
    Json::Value r(Json::objectValue);
    r["portWwn"] = w["port"]["wwn"];
    r["dportEnabled"] = enabled;
    if (w["dportResult"].isObject()) {
        r["result"] = w["dportResult"];
    } else {
        r["result"]["status"] = enabled ? "passed" : "not run";
    }
    return r;
}

// ---------------------------------------------------------------------------
// Flash update

Json::Value adapterUpdateFlash(Call& c) {
    const std::string k = key(c.req, "indexStr", Form::Any);
    Json::Value& ad = c.st.model.adapter(adapterExact(c, k));
    const std::string file = text(c.req, "file");
    Json::Value r(Json::objectValue);
    std::ifstream in(file, std::ios::binary);
    if (!in) {
        r["status"] = 2;
        r["message"] = "cannot open " + file + ": " + std::strerror(errno);
        return r;
    }
    std::string content(64 * 1024, '\0');
    in.read(&content[0], static_cast<std::streamsize>(content.size()));
    content.resize(static_cast<size_t>(in.gcount()));

    // A JSON image names its version (and may ask for a failure); any other
    // file is named after the version it carries: fw-3.2.7.bin flashes fw-3.2.7.
    Json::Value image;
    Json::CharReaderBuilder builder;
    std::unique_ptr<Json::CharReader> reader(builder.newCharReader());
    std::string version, bios;
    int status = 0;
    std::string message = "Flash update successful";
    if (reader->parse(content.data(), content.data() + content.size(), &image, nullptr) &&
        image.isObject()) {
        version = image.get("version", "").asString();
        bios = image.get("biosVersion", "").asString();
        status = image.get("status", 0).asInt();
        message = image.get("message", status == 0 ? message : "flash update failed").asString();
    } else {
        std::string base = file.substr(
            file.find_last_of('/') == std::string::npos ? 0 : file.find_last_of('/') + 1);
        version = base.substr(0, base.find_last_of('.'));
    }
    if (status == 0 && version.empty()) {
        status = 3;
        message = "no firmware version in " + file;
    }
    r["status"] = status;
    r["message"] = message;
    if (status != 0)
        return r;
    ad["firmware"]["version"] = version;
    if (!bios.empty())
        ad["firmware"]["biosVersion"] = bios;
    ad["flash"]["flashStatus"] = true;
    r["firmwareVersion"] = version;
    c.log(2, __FILE__, __LINE__,
          "adapter " + k + " flashed with firmware " + version + " from " + file);
    return r;
}

// ---------------------------------------------------------------------------

struct HandlerRow {
    EntryId id;
    Handler handler;
};

const HandlerRow kHandlers[] = {
    {EP_getHost, getHost},
    {EP_getHbaByWwn, hbaDetails},
    {EP_getHbaByMac, hbaDetails},
    {EP_getServerTime, getServerTime},
    {EP_setAdapterState, setAdapterState},
    {EP_getOpticsSFP, getOpticsSFP},
    {EP_getDiagnosticsResults, getDiagnosticsResults},
    {EP_getOpticsPOM, getOpticsPOM},
    {EP_getPortByWwn, getPortByWwn},
    {EP_getFcByFcWwn, getFcByFcWwn},
    {EP_getBootOverSanByPort, getBootOverSanByPort},
    {EP_getAdvPortDataByPort, getAdvPortDataByPort},
    {EP_setPortByWwn, setPortByWwn},
    {EP_setPortAuthentication, setPortAuthentication},
    {EP_getPortAuthentication, getPortAuthentication},
    {EP_getAllVPorts, getAllVPorts},
    {EP_getLldp, getLldp},
    {EP_getCee, getCee},
    {EP_getAllLunsByRemotePort, getAllLunsByRemotePort},
    {EP_getVPort, getVPort},
    {EP_getDriverUpdateStatus, getDriverUpdateStatus},
    {EP_getAllEthPortByEthMac, getAllEthPortByEthMac},
    {EP_getFcoeByPort, getFcoeByPort},
    {EP_getEthPortByEthMac, getEthPortByEthMac},
    {EP_getAllRemotePorts, getAllRemotePorts},
    {EP_getCompleteRemotePort, getCompleteRemotePort},
    {EP_getAdvAdapterData, getAdvAdapterData},
    {EP_getAdapterPciFnData, getAdapterPciFnData},
    {EP_getLunMaskData, getLunMaskData},
    {EP_setLunMaskData, setLunMaskData},
    {EP_setFcByFcWwn, setFcByFcWwn},
    {EP_setFcoeByPort, setFcoeByPort},
    {EP_setAdapterAlias, setAdapterAlias},
    {EP_setPortAlias, setPortAlias},
    {EP_setFcTrunkingState, setFcTrunkingState},
    {EP_createVport, createVport},
    {EP_deleteVport, deleteVport},
    {EP_setEthPort, setEthPort},
    {EP_clearLogsForPort, clearLogsForPort},
    {EP_setAdapterMode, setAdapterMode},
    {EP_getDPortTestResult, getDPortTestResult},
    {EP_setDport, setDport},
    {EP_createvNIC, createvNIC},
    {EP_deletevNICs, deletevNICs},
    {EP_modifyvNIC, modifyvNIC},
    {EP_setAdvIoProfile, setAdvIoProfile},
    {EP_clearAdvIoProfile, clearAdvIoProfile},
    {EP_getAdvIoProfile, getAdvIoProfile},
    {EP_resetDataForAdvIoProf, resetDataForAdvIoProf},
    {EP_resetPortAuthentication, resetPortAuthentication},
    {EP_startTests, startTests},
    {EP_cancelTests, cancelTests},
    {EP_postDiagnostics, postDiagnostics},
    {EP_getGlobalInfo, getGlobalInfo},
    {EP_init_hba_lib, initHbaLib},
    {EP_getAllAdaptersIndexString, getAllAdaptersIndexString},
    {EP_getEthPhyPortIndicesByAdapter, portIndices},
    {EP_getFcPhyPortIndicesByAdapter, portIndices},
    {EP_diagEthLoopbackTest, diagEthLoopbackTest},
    {EP_diagLoopbackTest, diagLoopbackTest},
    {EP_diagMemoryTest, diagMemoryTest},
    {EP_diagPCILoopbackTest, diagPCILoopbackTest},
    {EP_getFlashInfo, getFlashInfo},
    {EP_adapterUpdateFlash, adapterUpdateFlash},
    {EP_getAdapterIdByPort, adapterId},
    {EP_getAdapterId, adapterId},
};

}  // namespace

Handler handlerFor(EntryId id) {
    for (const HandlerRow& row : kHandlers)
        if (row.id == id)
            return row.handler;
    for (const StatRow& row : kStatRows)
        if (row.id == id)
            return statistics;
    return nullptr;
}

}  // namespace tvrnsim
