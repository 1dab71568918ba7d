// Simulated entry points: statistics.
#include "simulator/handlers/Requests.h"

#include <array>
#include <sstream>

namespace tvrnsim {

namespace {

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

}  // namespace

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

namespace {

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

}  // namespace

Json::Value& lunHolder(Json::Value& rp, const Json::Value& req, const char* lunMember) {
    const long long lun = number(req, lunMember);
    for (const Json::Value& u : rp["lunList"])
        if (u["number"].isIntegral() && u["number"].asLargestInt() == lun)
            return rp["lunStatistics"][std::to_string(lun)];
    fail(kNotFound,
         "no LUN " + std::to_string(lun) + " on remote port " + rp["remotePortWwn"].asString());
}

namespace {

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

}  // namespace

Handler statisticsHandler(EntryId id) {
    for (const StatRow& row : kStatRows)
        if (row.id == id)
            return statistics;
    return nullptr;
}

}  // namespace tvrnsim
