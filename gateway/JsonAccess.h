// Reading members of library answers without exceptions, and building the
// simple requests.
//
// The adapter library answers with JSON of its own making, so a member may be
// absent or of an unexpected type. Json::Value's own accessors throw on a type
// mismatch (and isMember/operator[] throw when the value is an array or a
// scalar). These helpers treat a member of the wrong type exactly like a
// missing one and never throw: the caller gets its fallback.
//
// Numbers follow jsoncpp's notion of representability: jsonInt accepts any
// number that fits an int exactly (an int, an unsigned or an integral real),
// jsonUInt any that fits an unsigned. Booleans are not numbers and numbers are
// not booleans.
#ifndef CPTA_GATEWAY_JSONACCESS_H
#define CPTA_GATEWAY_JSONACCESS_H

#include <json/json.h>

#include "framework/String.h"

namespace CPTA {

// The member `name` of `v`, or null when `v` is not an object or has no such member.
inline const Json::Value* jsonMember(const Json::Value& v, const char* name) {
    if (!v.isObject() || name == nullptr)
        return nullptr;
    return v.find(name, name + std::char_traits<char>::length(name));
}

// Whether `v` itself is of the given type, in the sense described above:
// intValue / uintValue mean "fits an int / unsigned", realValue means any number.
inline bool jsonIsType(const Json::Value& v, Json::ValueType type) {
    switch (type) {
        case Json::nullValue: return v.isNull();
        case Json::intValue: return v.isInt();
        case Json::uintValue: return v.isUInt();
        case Json::realValue: return v.isNumeric() && !v.isBool();
        case Json::stringValue: return v.isString();
        case Json::booleanValue: return v.isBool();
        case Json::arrayValue: return v.isArray();
        case Json::objectValue: return v.isObject();
    }
    return false;
}

// Whether `v` has a member `name` of the given type.
inline bool jsonHas(const Json::Value& v, const char* name, Json::ValueType type) {
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr && jsonIsType(*m, type);
}

// The text of `v` when it is a string, else `fallback`.
inline String jsonAsString(const Json::Value& v, const char* fallback = "") {
    const char* begin = nullptr;
    const char* end = nullptr;
    if (v.isString() && v.getString(&begin, &end))
        return String(begin, size_t(end - begin));
    return String(fallback);
}

// The text of member `name`, or `fallback` when missing or not a string.
inline String jsonString(const Json::Value& v, const char* name, const char* fallback = "") {
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr ? jsonAsString(*m, fallback) : String(fallback);
}

inline int jsonInt(const Json::Value& v, const char* name, int fallback = 0) {
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr && m->isInt() ? m->asInt() : fallback;
}

inline unsigned int jsonUInt(const Json::Value& v, const char* name, unsigned int fallback = 0) {
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr && m->isUInt() ? m->asUInt() : fallback;
}

inline Json::Int64 jsonInt64(const Json::Value& v, const char* name, Json::Int64 fallback = 0) {
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr && m->isInt64() ? m->asInt64() : fallback;
}

inline Json::UInt64 jsonUInt64(const Json::Value& v, const char* name, Json::UInt64 fallback = 0) {
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr && m->isUInt64() ? m->asUInt64() : fallback;
}

inline double jsonReal(const Json::Value& v, const char* name, double fallback = 0.0) {
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr && m->isNumeric() && !m->isBool() ? m->asDouble() : fallback;
}

inline bool jsonBool(const Json::Value& v, const char* name, bool fallback = false) {
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr && m->isBool() ? m->asBool() : fallback;
}

// Member `name` when it is an array, else a shared empty array (safe to iterate).
inline const Json::Value& jsonArray(const Json::Value& v, const char* name) {
    static const Json::Value empty(Json::arrayValue);
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr && m->isArray() ? *m : empty;
}

// Member `name` when it is an object, else a shared empty object.
inline const Json::Value& jsonObject(const Json::Value& v, const char* name) {
    static const Json::Value empty(Json::objectValue);
    const Json::Value* m = jsonMember(v, name);
    return m != nullptr && m->isObject() ? *m : empty;
}

// ---- building requests ------------------------------------------------------

// A JSON string holding the text (which may hold NUL characters).
inline Json::Value jsonText(const String& text) {
    return Json::Value(text.c_str(), text.c_str() + text.size());
}

// A request with one member.
inline Json::Value keyRequest(const char* member, const String& key) {
    Json::Value request(Json::objectValue);
    request[member] = jsonText(key);
    return request;
}

}  // namespace CPTA

#endif
