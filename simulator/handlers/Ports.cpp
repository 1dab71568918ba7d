// Simulated entry points: ports.
#include "simulator/handlers/Requests.h"

namespace tvrnsim {

namespace {

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

const HandlerRow kRows[] = {
    {EP_getOpticsSFP, getOpticsSFP},
    {EP_getOpticsPOM, getOpticsPOM},
    {EP_getPortByWwn, getPortByWwn},
    {EP_getFcByFcWwn, getFcByFcWwn},
    {EP_getBootOverSanByPort, getBootOverSanByPort},
    {EP_getAdvPortDataByPort, getAdvPortDataByPort},
    {EP_setPortByWwn, setPortByWwn},
    {EP_setPortAuthentication, setPortAuthentication},
    {EP_getPortAuthentication, getPortAuthentication},
    {EP_getLldp, getLldp},
    {EP_getCee, getCee},
    {EP_getAllEthPortByEthMac, getAllEthPortByEthMac},
    {EP_getFcoeByPort, getFcoeByPort},
    {EP_getEthPortByEthMac, getEthPortByEthMac},
    {EP_setFcByFcWwn, setFcByFcWwn},
    {EP_setFcoeByPort, setFcoeByPort},
    {EP_setEthPort, setEthPort},
    {EP_clearLogsForPort, clearLogsForPort},
    {EP_resetPortAuthentication, resetPortAuthentication},
};

}  // namespace

Handler portHandler(EntryId id) {
    return findHandler(kRows, id);
}

}  // namespace tvrnsim
