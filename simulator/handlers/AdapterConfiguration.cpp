// Simulated entry points: adapter configuration.
#include "simulator/handlers/Requests.h"

namespace tvrnsim {

namespace {

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

const HandlerRow kRows[] = {
    {EP_setAdapterState, setAdapterState},
    {EP_getAdvAdapterData, getAdvAdapterData},
    {EP_getAdapterPciFnData, getAdapterPciFnData},
    {EP_setAdapterAlias, setAdapterAlias},
    {EP_setPortAlias, setPortAlias},
    {EP_setFcTrunkingState, setFcTrunkingState},
    {EP_setAdapterMode, setAdapterMode},
};

}  // namespace

Handler adapterConfigurationHandler(EntryId id) {
    return findHandler(kRows, id);
}

}  // namespace tvrnsim
