#include "simulator/Model.h"

#include <algorithm>
#include <cctype>
#include <cstdio>

namespace tvrnsim {

std::string lowerCase(std::string s) {
    for (char& c : s)
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return s;
}

bool isColonKey(const std::string& s, int pairs) {
    if (s.size() != static_cast<size_t>(pairs * 3 - 1))
        return false;
    for (size_t i = 0; i < s.size(); ++i) {
        if (i % 3 == 2) {
            if (s[i] != ':')
                return false;
        } else if (!std::isxdigit(static_cast<unsigned char>(s[i]))) {
            return false;
        }
    }
    return true;
}

namespace {

[[noreturn]] void fail(const std::string& where, const std::string& what) {
    throw FixtureError(where + ": " + what);
}

std::string at(const std::string& path, const char* member) {
    return path + "." + member;
}
std::string at(const std::string& path, Json::ArrayIndex i) {
    return path + "[" + std::to_string(i) + "]";
}

// The member as an object (created empty when absent).
Json::Value& objectMember(Json::Value& parent, const char* name, const std::string& path) {
    if (!parent.isMember(name))
        parent[name] = Json::Value(Json::objectValue);
    Json::Value& v = parent[name];
    if (!v.isObject())
        fail(at(path, name), "must be a JSON object");
    return v;
}

Json::Value& arrayMember(Json::Value& parent, const char* name, const std::string& path) {
    if (!parent.isMember(name))
        parent[name] = Json::Value(Json::arrayValue);
    Json::Value& v = parent[name];
    if (!v.isArray())
        fail(at(path, name), "must be a JSON array");
    return v;
}

void setDefault(Json::Value& obj, const char* name, const Json::Value& value) {
    if (!obj.isMember(name))
        obj[name] = value;
}

std::string keyMember(const Json::Value& obj, const char* name, const std::string& path, int pairs,
                      bool required = true) {
    if (!obj.isMember(name)) {
        if (required)
            fail(at(path, name), "is missing");
        return std::string();
    }
    const Json::Value& v = obj[name];
    if (!v.isString() || !isColonKey(v.asString(), pairs))
        fail(at(path, name), pairs == 8
                                 ? "must be a WWN in colon format (xx:xx:xx:xx:xx:xx:xx:xx)"
                                 : "must be a MAC address in colon format (xx:xx:xx:xx:xx:xx)");
    return v.asString();
}

void checkStatistics(Json::Value& holder, const std::string& path) {
    Json::Value& stats = objectMember(holder, "statistics", path);
    for (const std::string& group : stats.getMemberNames()) {
        const Json::Value& list = stats[group];
        std::string where = at(at(path, "statistics"), group.c_str());
        if (!list.isArray())
            fail(where, "must be an array of {\"id\", \"value\"}");
        for (Json::ArrayIndex i = 0; i < list.size(); ++i) {
            const Json::Value& e = list[i];
            if (!e.isObject() || !e["id"].isIntegral() || !e["value"].isString())
                fail(at(where, i), "must be {\"id\": integer, \"value\": decimal text}");
        }
    }
}

void normalizeRemotePort(Json::Value& rp, const std::string& path) {
    if (!rp.isObject())
        fail(path, "must be a JSON object");
    keyMember(rp, "remotePortWwn", path, 8);
    keyMember(rp, "remoteNodeWwn", path, 8, false);
    Json::Value& dev = objectMember(rp, "deviceData", path);
    setDefault(dev, "isTarget", false);
    if (!dev["isTarget"].isBool())
        fail(at(at(path, "deviceData"), "isTarget"), "must be a boolean");
    setDefault(dev, "type", dev["isTarget"].asBool() ? "Disk" : "Initiator");
    setDefault(dev, "stateMofValue", 2);
    if (rp.isMember("lunList")) {
        const Json::Value& luns = rp["lunList"];
        if (!luns.isArray())
            fail(at(path, "lunList"), "must be a JSON array");
        for (Json::ArrayIndex i = 0; i < luns.size(); ++i)
            if (!luns[i].isObject())
                fail(at(at(path, "lunList"), i), "must be a JSON object");
    }
    checkStatistics(rp, path);
    objectMember(rp, "lunStatistics", path);
}

void normalizeFcPort(Json::Value& fp, const Json::Value& hba, bool cna, const std::string& path) {
    if (!fp.isObject())
        fail(path, "must be a JSON object");
    Json::Value& port = objectMember(fp, "port", path);
    const std::string ppath = at(path, "port");
    std::string wwn = keyMember(port, "wwn", ppath, 8);
    keyMember(port, "nodeWwn", ppath, 8, false);
    setDefault(port, "nodeWwn", "20" + wwn.substr(2));
    setDefault(port, "PortSymbolicName", "");
    setDefault(port, "operatingSpeed", 8);
    Json::Value speeds(Json::arrayValue);
    speeds.append(16);
    speeds.append(8);
    speeds.append(4);
    setDefault(port, "supportedPortSpeeds", speeds);
    setDefault(port, "portTypeMOFValue", 10);
    setDefault(port, "maxFrameSize", 2112);
    setDefault(port, "portStatus", true);
    if (!port["portStatus"].isBool())
        fail(at(ppath, "portStatus"), "must be a boolean");
    setDefault(port, "portStatusValue", port["portStatus"].asBool() ? 2 : 10);
    // Only FCoE ports carry "isFCoE"; callers test for the member.
    if (cna)
        setDefault(port, "isFCoE", true);
    setDefault(port, "isMezz", hba["isMezz"]);
    setDefault(port, "beaconState", false);
    if (port.isMember("fcoeMac"))
        keyMember(port, "fcoeMac", ppath, 6);
    // What the port reports again once it is enabled after a disable.
    setDefault(fp, "enabledStatusValue",
               port["portStatus"].asBool() ? port["portStatusValue"] : Json::Value(2));

    if (fp.isMember("sfp") && !fp["sfp"].isObject())
        fail(at(path, "sfp"), "must be a JSON object");
    for (const char* name : {"pom", "fc", "fcoe", "bootOverSan", "advPortData", "authentication",
                             "lunMask", "diagnostics", "dportResult", "dport"})
        if (fp.isMember(name))
            objectMember(fp, name, path);
    Json::Value& rps = arrayMember(fp, "remotePorts", path);
    for (Json::ArrayIndex i = 0; i < rps.size(); ++i)
        normalizeRemotePort(rps[i], at(at(path, "remotePorts"), i));
    Json::Value& vps = arrayMember(fp, "vports", path);
    for (Json::ArrayIndex i = 0; i < vps.size(); ++i) {
        std::string vpath = at(at(path, "vports"), i);
        if (!vps[i].isObject())
            fail(vpath, "must be a JSON object");
        keyMember(vps[i], "vportWwn", vpath, 8);
        checkStatistics(vps[i], vpath);
    }
    arrayMember(fp, "advIoProfiles", path);
    checkStatistics(fp, path);
}

void normalizeEthPort(Json::Value& ep, const Json::Value& hba, const std::string& path) {
    if (!ep.isObject())
        fail(path, "must be a JSON object");
    Json::Value& eth = objectMember(ep, "ethData", path);
    std::string mac = keyMember(eth, "mac", at(path, "ethData"), 6);
    setDefault(eth, "ethPortStateMOFValue", 2);
    Json::Value& port = objectMember(ep, "port", path);
    setDefault(port, "mac", mac);
    setDefault(port, "portStatus", true);
    if (!port["portStatus"].isBool())
        fail(at(at(path, "port"), "portStatus"), "must be a boolean");
    setDefault(port, "portStatusValue", eth["ethPortStateMOFValue"]);
    setDefault(port, "isEth", true);
    setDefault(port, "isMezz", hba["isMezz"]);
    setDefault(port, "beaconState", false);
    setDefault(ep, "enabledStatusValue",
               port["portStatus"].asBool() ? eth["ethPortStateMOFValue"] : Json::Value(2));
    if (ep.isMember("sfp") && !ep["sfp"].isObject())
        fail(at(path, "sfp"), "must be a JSON object");
    for (const char* name : {"lldp", "cee", "diagnostics"})
        if (ep.isMember(name))
            objectMember(ep, name, path);
    Json::Value& vnics = arrayMember(ep, "vnics", path);
    for (Json::ArrayIndex i = 0; i < vnics.size(); ++i)
        if (!vnics[i].isObject())
            fail(at(at(path, "vnics"), i), "must be a JSON object");
    checkStatistics(ep, path);
}

void normalizeAdapter(Json::Value& ad, const std::string& path) {
    if (!ad.isObject())
        fail(path, "must be a JSON object");
    Json::Value& hba = objectMember(ad, "hbaData", path);
    const std::string hpath = at(path, "hbaData");
    if (!hba["model"].isString())
        fail(at(hpath, "model"), "must be a string");
    std::string mac = keyMember(hba, "hbaMAC", hpath, 6, false);
    std::string wwn = keyMember(hba, "wwn", hpath, 8, false);
    bool cna = !mac.empty();
    if (!cna && wwn.empty())
        fail(hpath, "needs \"wwn\" (FC HBA) or \"hbaMAC\" (CNA)");
    setDefault(hba, "isCNA", cna);
    setDefault(hba, "isMezz", false);
    setDefault(hba, "hbaStatus", true);
    if (!hba["isMezz"].isBool() || !hba["hbaStatus"].isBool() || !hba["isCNA"].isBool())
        fail(hpath, "\"isCNA\", \"isMezz\" and \"hbaStatus\" must be booleans");

    Json::Value& fcPorts = arrayMember(ad, "fcPorts", path);
    for (Json::ArrayIndex i = 0; i < fcPorts.size(); ++i)
        normalizeFcPort(fcPorts[i], hba, cna, at(at(path, "fcPorts"), i));
    Json::Value& ethPorts = arrayMember(ad, "ethPorts", path);
    for (Json::ArrayIndex i = 0; i < ethPorts.size(); ++i)
        normalizeEthPort(ethPorts[i], hba, at(at(path, "ethPorts"), i));
    if (!cna && ethPorts.size() > 0)
        fail(path, "Ethernet ports need a CNA (\"hbaData\".\"hbaMAC\")");

    setDefault(hba, "hasEthPort", ethPorts.size() > 0);
    setDefault(hba, "portCount", std::max(fcPorts.size(), ethPorts.size()));

    if (!ad.isMember("driver")) {
        Json::Value drv(Json::objectValue);
        if (!wwn.empty() || fcPorts.size() > 0) {
            drv["storageDriverName"] = "tvfc";
            drv["storageDriverVersion"] = "3.2.1.0";
        }
        if (cna) {
            drv["networkDriverName"] = "tna";
            drv["networkDriverVersion"] = "3.2.1.0";
        }
        ad["driver"] = drv;
    }
    objectMember(ad, "driver", path);
    Json::Value& fw = objectMember(ad, "firmware", path);
    setDefault(fw, "version", "3.2.1.0");
    setDefault(fw, "biosVersion", "3.2.1.0");
    Json::Value& flash = objectMember(ad, "flash", path);
    setDefault(flash, "flashStatus", true);
    objectMember(ad, "advAdapterData", path);
    objectMember(ad, "diagnostics", path);
    arrayMember(ad, "pciFunctions", path);
    checkStatistics(ad, path);
}

}  // namespace

void Model::clear() {
    root_ = Json::Value(Json::objectValue);
    root_["host"] = Json::Value(Json::objectValue);
    root_["adapters"] = Json::Value(Json::arrayValue);
    root_["events"] = Json::Value(Json::arrayValue);
    reindex();
}

void Model::load(const Json::Value& fixture) {
    if (!fixture.isObject())
        throw FixtureError("the fixture must be a JSON object");
    Json::Value r(Json::objectValue);
    for (const std::string& name : fixture.getMemberNames())
        if (name != "generate")
            r[name] = fixture[name];
    objectMember(r, "host", "fixture");
    Json::Value& adapters = arrayMember(r, "adapters", "fixture");
    if (fixture.isMember("generate")) {
        Json::Value generated = generateAdapters(fixture["generate"]);
        for (Json::ArrayIndex i = 0; i < generated.size(); ++i)
            adapters.append(generated[i]);
    }
    for (Json::ArrayIndex i = 0; i < adapters.size(); ++i)
        normalizeAdapter(adapters[i], at("adapters", i));
    for (const char* name : {"serverTime", "driverUpdateStatus"})
        if (r.isMember(name))
            objectMember(r, name, "fixture");
    if (r.isMember("diagnosticDurationMs") &&
        (!r["diagnosticDurationMs"].isInt() || r["diagnosticDurationMs"].asInt() < 0 ||
         r["diagnosticDurationMs"].asInt() > 3600000))
        fail("fixture.diagnosticDurationMs", "must be a number of milliseconds");
    Json::Value& events = arrayMember(r, "events", "fixture");
    for (Json::ArrayIndex i = 0; i < events.size(); ++i)
        if (!events[i].isObject() && !events[i].isString())
            fail(at("events", i), "must be an event object or an event text");

    Model next;
    next.root_ = std::move(r);
    next.reindex();
    *this = std::move(next);
}

std::string Model::adapterKey(int a) const {
    const Json::Value& hba = root_["adapters"][Json::ArrayIndex(a)]["hbaData"];
    return hba.isMember("hbaMAC") ? hba["hbaMAC"].asString() : hba["wwn"].asString();
}

void Model::reindex() {
    adapters_.clear();
    fcPorts_.clear();
    fcoeMacs_.clear();
    ethPorts_.clear();
    vports_.clear();
    auto claim = [](auto& map, const std::string& key, auto value, const std::string& where) {
        if (!map.emplace(lowerCase(key), value).second)
            fail(where, "duplicate key " + key);
    };
    const Json::Value& ads = root_["adapters"];
    for (int a = 0; a < static_cast<int>(ads.size()); ++a) {
        const Json::Value& ad = ads[Json::ArrayIndex(a)];
        std::string where = at("adapters", Json::ArrayIndex(a));
        const Json::Value& hba = ad["hbaData"];
        if (hba.isMember("hbaMAC"))
            claim(adapters_, hba["hbaMAC"].asString(), a, where);
        if (hba.isMember("wwn"))
            claim(adapters_, hba["wwn"].asString(), a, where);
        const Json::Value& fps = ad["fcPorts"];
        for (int p = 0; p < static_cast<int>(fps.size()); ++p) {
            const Json::Value& fp = fps[Json::ArrayIndex(p)];
            claim(fcPorts_, fp["port"]["wwn"].asString(), FcPortRef{a, p}, where);
            if (fp["port"].isMember("fcoeMac"))
                claim(fcoeMacs_, fp["port"]["fcoeMac"].asString(), FcPortRef{a, p}, where);
            const Json::Value& vps = fp["vports"];
            for (int v = 0; v < static_cast<int>(vps.size()); ++v)
                claim(vports_, vps[Json::ArrayIndex(v)]["vportWwn"].asString(), VPortRef{a, p, v},
                      where);
        }
        const Json::Value& eps = ad["ethPorts"];
        for (int e = 0; e < static_cast<int>(eps.size()); ++e)
            claim(ethPorts_, eps[Json::ArrayIndex(e)]["ethData"]["mac"].asString(),
                  EthPortRef{a, e}, where);
    }
}

int Model::findAdapter(const std::string& key) const {
    auto it = adapters_.find(lowerCase(key));
    return it == adapters_.end() ? -1 : it->second;
}

int Model::findOwner(const std::string& key) const {
    int a = findAdapter(key);
    if (a >= 0)
        return a;
    FcPortRef f;
    if (findFcPort(key, f))
        return f.a;
    EthPortRef e;
    if (findEthPort(key, e))
        return e.a;
    VPortRef v;
    if (findVPort(key, v))
        return v.a;
    return -1;
}

bool Model::findFcPort(const std::string& key, FcPortRef& out) const {
    std::string k = lowerCase(key);
    auto it = fcPorts_.find(k);
    if (it != fcPorts_.end()) {
        out = it->second;
        return true;
    }
    it = fcoeMacs_.find(k);
    if (it == fcoeMacs_.end())
        return false;
    out = it->second;
    return true;
}

bool Model::findEthPort(const std::string& key, EthPortRef& out) const {
    auto it = ethPorts_.find(lowerCase(key));
    if (it == ethPorts_.end())
        return false;
    out = it->second;
    return true;
}

bool Model::findVPort(const std::string& key, VPortRef& out) const {
    auto it = vports_.find(lowerCase(key));
    if (it == vports_.end())
        return false;
    out = it->second;
    return true;
}

bool Model::wwnInUse(const std::string& key) const {
    std::string k = lowerCase(key);
    if (adapters_.count(k) || fcPorts_.count(k) || vports_.count(k))
        return true;
    for (const Json::Value& ad : root_["adapters"])
        for (const Json::Value& fp : ad["fcPorts"])
            for (const Json::Value& rp : fp["remotePorts"])
                if (lowerCase(rp["remotePortWwn"].asString()) == k)
                    return true;
    return false;
}

// ---------------------------------------------------------------------------
// Generated hosts

namespace {

const unsigned long long kMaxGenerated = 250000;

unsigned param(const Json::Value& g, const char* name, unsigned dflt, unsigned max) {
    if (!g.isMember(name))
        return dflt;
    const Json::Value& v = g[name];
    if (!v.isUInt() || v.asUInt() > max)
        fail(at("generate", name), "must be an integer from 0 to " + std::to_string(max));
    return v.asUInt();
}

std::string hex(std::initializer_list<unsigned> bytes) {
    std::string s;
    char b[4];
    for (unsigned x : bytes) {
        std::snprintf(b, sizeof b, "%02x", x & 0xffu);
        if (!s.empty())
            s += ':';
        s += b;
    }
    return s;
}

Json::Value statsList(std::initializer_list<std::pair<int, unsigned long>> items) {
    Json::Value list(Json::arrayValue);
    for (const auto& it : items) {
        Json::Value e;
        e["id"] = it.first;
        e["value"] = std::to_string(it.second);
        list.append(e);
    }
    return list;
}

}  // namespace

Json::Value generateAdapters(const Json::Value& g) {
    if (!g.isObject())
        fail("generate", "must be a JSON object");
    const unsigned fcHbas = param(g, "fcHbas", 0, 4096);
    const unsigned cnas = param(g, "cnas", 0, 4096);
    const unsigned ports = param(g, "portsPerAdapter", 2, 255);
    const unsigned targets = param(g, "targetsPerPort", 0, 65535);
    const unsigned luns = param(g, "lunsPerTarget", 0, 16384);
    const unsigned tapes = param(g, "tapeTargetsPerPort", 0, 65535);
    const unsigned initiators = param(g, "initiatorsPerPort", 0, 65535);
    if (tapes > targets)
        fail("generate.tapeTargetsPerPort", "cannot exceed targetsPerPort");
    if (fcHbas + cnas > 4096)
        fail("generate", "at most 4096 adapters");
    // Ten times the large SAN of the fixtures; beyond, a host would take
    // gigabytes to describe.
    const unsigned long long perPort = 1ull + targets * (1ull + luns) + initiators;
    if ((fcHbas + cnas) * ports * perPort > kMaxGenerated)
        fail("generate",
             "at most " + std::to_string(kMaxGenerated) + " ports, remote ports and LUNs in all");

    Json::Value out(Json::arrayValue);
    for (unsigned a = 0; a < fcHbas + cnas; ++a) {
        const bool cna = a >= fcHbas;
        const unsigned hi = a >> 8, lo = a & 0xff;
        Json::Value ad(Json::objectValue);
        Json::Value& hba = ad["hbaData"];
        hba["model"] = cna ? "Tavrin-1020" : "Tavrin-825";
        hba["wwn"] = hex({0x20, 0, 0, 0x05, 0x33, hi, lo, 0});
        if (cna)
            hba["hbaMAC"] = hex({0, 0x05, 0x33, hi, lo, 0});
        char serial[32];
        std::snprintf(serial, sizeof serial, "GEN%05u", a + 1);
        hba["serialNumber"] = serial;
        hba["partNum"] = cna ? "PN1020" : "PN825";
        hba["oemSerialNum"] = "";
        hba["fruNum"] = cna ? "FRU1020" : "FRU825";
        hba["oem"] = "TVRN";
        ad["firmware"]["version"] = "3.2.1.0";
        ad["firmware"]["biosVersion"] = "3.2.1.0";
        for (unsigned p = 0; p < ports; ++p) {
            Json::Value fp(Json::objectValue);
            Json::Value& port = fp["port"];
            port["wwn"] = hex({0x10, 0, 0, 0x05, 0x33, hi, lo, p + 1});
            port["nodeWwn"] = hex({0x20, 0, 0, 0x05, 0x33, hi, lo, p + 1});
            port["PortSymbolicName"] =
                std::string("GEN") + std::to_string(a + 1) + " port " + std::to_string(p);
            if (cna)
                port["fcoeMac"] = hex({0x0e, 0xfc, 0, hi, lo, p + 1});
            fp["sfp"]["vendorName"] = "OPTICO          ";
            fp["sfp"]["vendorPart"] = "OPT-16G-SW      ";
            fp["sfp"]["serialNo"] =
                std::string("GS") + std::to_string(a + 1) + "P" + std::to_string(p);
            fp["sfp"]["revision"] = "A   ";
            fp["sfp"]["extendedID"] = "SFP+";
            fp["sfp"]["speed"] = "16 Gbps";
            if (cna)
                fp["statistics"]["port"] = statsList({{1615, 0},
                                                      {1616, a},
                                                      {1624, p},
                                                      {1625, 0},
                                                      {1626, a + p},
                                                      {1627, 0},
                                                      {1628, 1}});
            else
                fp["statistics"]["port"] = statsList({{1402, 1000ul * (a + 1)},
                                                      {1403, 4000ul * (a + 1)},
                                                      {1409, 900ul * (a + 1)},
                                                      {1410, 3600ul * (a + 1)},
                                                      {1416, p},
                                                      {1421, a}});
            Json::Value& rps = fp["remotePorts"];
            rps = Json::Value(Json::arrayValue);
            for (unsigned t = 0; t < targets + initiators; ++t) {
                Json::Value rp(Json::objectValue);
                const bool initiator = t >= targets;
                const bool tape = !initiator && t >= targets - tapes;
                rp["remotePortWwn"] =
                    hex({initiator ? 0x21u : 0x50u, 0x0a, hi, lo, p, 0, t >> 8, t & 0xff});
                rp["remoteNodeWwn"] =
                    hex({initiator ? 0x20u : 0x50u, 0x0b, hi, lo, p, 0, t >> 8, t & 0xff});
                rp["deviceData"]["isTarget"] = !initiator;
                rp["deviceData"]["type"] = initiator ? "Initiator" : (tape ? "Tape" : "Disk");
                rp["deviceData"]["stateMofValue"] = 2;
                if (!initiator) {
                    Json::Value& list = rp["lunList"];
                    list = Json::Value(Json::arrayValue);
                    for (unsigned n = 0; n < luns; ++n) {
                        Json::Value lun(Json::objectValue);
                        lun["number"] = n;
                        lun["vendor"] = tape ? "TAPECO  " : "ACME    ";
                        lun["productID"] = tape ? "LTO-8           " : "DISK-X          ";
                        char sn[64];
                        std::snprintf(sn, sizeof sn, "G%u-%u-%u-%u", a + 1, p, t, n);
                        lun["productSerialNumber"] = sn;
                        if (!tape) {
                            char naa[40];
                            std::snprintf(naa, sizeof naa, "600a0b80%04x%02x%02x%04x%08x",
                                          a & 0xffff, p & 0xff, 0u, t & 0xffff, n);
                            lun["lunDescription"] = naa;
                            lun["lunDescIdType"] = 3;
                        }
                        list.append(lun);
                    }
                }
                rps.append(rp);
            }
            ad["fcPorts"].append(fp);
            if (cna) {
                Json::Value ep(Json::objectValue);
                ep["ethData"]["mac"] = hex({0, 0x05, 0x33, hi, lo, p + 1});
                ep["ethData"]["ethDev"] = "eth" + std::to_string(a * ports + p);
                ep["ethData"]["mtu"] = 1500;
                ep["sfp"]["transceiver"] = "10G_BASE-SR";
                ep["sfp"]["vendorName"] = "OPTICO          ";
                ep["sfp"]["serialNo"] =
                    std::string("GE") + std::to_string(a + 1) + "P" + std::to_string(p);
                ad["ethPorts"].append(ep);
            }
        }
        out.append(ad);
    }
    return out;
}

}  // namespace tvrnsim
