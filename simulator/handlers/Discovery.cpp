// Simulated entry points: start-up and discovery.
#include "simulator/handlers/Requests.h"

#include <algorithm>
#include <ctime>

namespace tvrnsim {

namespace {

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

const HandlerRow kRows[] = {
    {EP_getHost, getHost},
    {EP_getHbaByWwn, hbaDetails},
    {EP_getHbaByMac, hbaDetails},
    {EP_getServerTime, getServerTime},
    {EP_getDriverUpdateStatus, getDriverUpdateStatus},
    {EP_getGlobalInfo, getGlobalInfo},
    {EP_init_hba_lib, initHbaLib},
    {EP_getAllAdaptersIndexString, getAllAdaptersIndexString},
    {EP_getEthPhyPortIndicesByAdapter, portIndices},
    {EP_getFcPhyPortIndicesByAdapter, portIndices},
    {EP_getFlashInfo, getFlashInfo},
    {EP_getAdapterIdByPort, adapterId},
    {EP_getAdapterId, adapterId},
};

}  // namespace

Handler discoveryHandler(EntryId id) {
    return findHandler(kRows, id);
}

}  // namespace tvrnsim
