// Simulated entry points: advanced I/O profiles.
#include "simulator/handlers/Requests.h"

namespace tvrnsim {

namespace {

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

const HandlerRow kRows[] = {
    {EP_setAdvIoProfile, setAdvIoProfile},
    {EP_clearAdvIoProfile, clearAdvIoProfile},
    {EP_getAdvIoProfile, getAdvIoProfile},
    {EP_resetDataForAdvIoProf, resetDataForAdvIoProf},
};

}  // namespace

Handler advIoProfileHandler(EntryId id) {
    return findHandler(kRows, id);
}

}  // namespace tvrnsim
