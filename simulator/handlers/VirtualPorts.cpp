// Simulated entry points: virtual ports and vnics.
#include "simulator/handlers/Requests.h"

#include <algorithm>
#include <cstdio>

namespace tvrnsim {

namespace {

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

const HandlerRow kRows[] = {
    {EP_getAllVPorts, getAllVPorts}, {EP_getVPort, getVPort},     {EP_createVport, createVport},
    {EP_deleteVport, deleteVport},   {EP_createvNIC, createvNIC}, {EP_deletevNICs, deletevNICs},
    {EP_modifyvNIC, modifyvNIC},
};

}  // namespace

Handler virtualPortHandler(EntryId id) {
    return findHandler(kRows, id);
}

}  // namespace tvrnsim
