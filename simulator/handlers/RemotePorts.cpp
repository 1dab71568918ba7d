// Simulated entry points: remote ports and luns.
#include "simulator/handlers/Requests.h"

namespace tvrnsim {

namespace {

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

const HandlerRow kRows[] = {
    {EP_getAllLunsByRemotePort, getAllLunsByRemotePort},
    {EP_getAllRemotePorts, getAllRemotePorts},
    {EP_getCompleteRemotePort, getCompleteRemotePort},
    {EP_getLunMaskData, getLunMaskData},
    {EP_setLunMaskData, setLunMaskData},
};

}  // namespace

Handler remotePortHandler(EntryId id) {
    return findHandler(kRows, id);
}

}  // namespace tvrnsim
