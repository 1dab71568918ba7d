// Request members and look-ups shared by the handlers.
#include "simulator/handlers/Requests.h"

#include <cerrno>

namespace tvrnsim {

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

Json::Value& fcPortWrapper(Call& c, const std::string& k, FcPortRef* ref) {
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
Json::Value& anyPortWrapper(Call& c, const std::string& k, bool* isEth) {
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
Json::Value& logicalPort(Call& c, const std::string& p, const std::string& l, FcPortRef* base) {
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

}  // namespace tvrnsim
