#include "host/value.h"

#include <sys/time.h>
#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <ctime>
#include <ostream>

namespace tvrnhost {

// ---------------------------------------------------------------------------
// Types
// ---------------------------------------------------------------------------
namespace {

struct TypeInfo {
    Type type;
    const char* name;
    int bits;  // width of integer types, 0 otherwise
    bool isSigned;
};

const TypeInfo kTypes[] = {
    {Type::Boolean, "boolean", 0, false}, {Type::Uint8, "uint8", 8, false},
    {Type::Sint8, "sint8", 8, true},      {Type::Uint16, "uint16", 16, false},
    {Type::Sint16, "sint16", 16, true},   {Type::Uint32, "uint32", 32, false},
    {Type::Sint32, "sint32", 32, true},   {Type::Uint64, "uint64", 64, false},
    {Type::Sint64, "sint64", 64, true},   {Type::Real32, "real32", 0, false},
    {Type::Real64, "real64", 0, false},   {Type::Char16, "char16", 0, false},
    {Type::String, "string", 0, false},   {Type::DateTime, "datetime", 0, false},
    {Type::Reference, "ref", 0, false},   {Type::Instance, "instance", 0, false},
};

const TypeInfo& info(Type t) {
    return kTypes[static_cast<int>(t)];
}

}  // namespace

const char* typeName(Type t) {
    return info(t).name;
}

std::optional<Type> typeFromName(std::string_view name) {
    for (const auto& ti : kTypes)
        if (equalsIgnoreCase(name, ti.name))
            return ti.type;
    return std::nullopt;
}

bool isSignedInteger(Type t) {
    return info(t).bits && info(t).isSigned;
}
bool isUnsignedInteger(Type t) {
    return info(t).bits && !info(t).isSigned;
}
int integerBits(Type t) {
    return info(t).bits;
}

bool isInteger(Type t) {
    return info(t).bits != 0;
}

bool equalsIgnoreCase(std::string_view a, std::string_view b) {
    return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) {
               return std::tolower(static_cast<unsigned char>(x)) ==
                      std::tolower(static_cast<unsigned char>(y));
           });
}

std::string toLower(std::string_view s) {
    std::string r(s);
    for (auto& c : r)
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return r;
}

// ---------------------------------------------------------------------------
// DateTime
// ---------------------------------------------------------------------------
namespace {

bool digitsAt(std::string_view s, size_t pos, size_t n, std::uint64_t& out) {
    out = 0;
    for (size_t i = pos; i < pos + n; ++i) {
        if (!std::isdigit(static_cast<unsigned char>(s[i])))
            return false;
        out = out * 10 + static_cast<std::uint64_t>(s[i] - '0');
    }
    return true;
}

constexpr std::uint64_t kUsecPerSec = 1000000;

std::uint64_t daysInMonth(std::uint64_t year, std::uint64_t month) {
    static const std::uint64_t days[] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    const bool leap = (year % 4 == 0 && year % 100 != 0) || year % 400 == 0;
    return month == 2 && leap ? 29 : days[month - 1];
}

}  // namespace

DateTime::DateTime() : text_("00000000000000.000000:000") {}

std::optional<DateTime> DateTime::parse(std::string_view s) {
    if (s.size() != 25 || s[14] != '.')
        return std::nullopt;
    const char sep = s[21];
    if (sep != ':' && sep != '+' && sep != '-')
        return std::nullopt;
    std::uint64_t f[8];
    const size_t pos[8] = {0, 8, 10, 12, 15, 22, 4, 6};
    const size_t len[8] = {8, 2, 2, 2, 6, 3, 2, 2};
    for (int i = 0; i < 6; ++i)
        if (!digitsAt(s, pos[i], len[i], f[i]))
            return std::nullopt;
    if (f[1] > 23 || f[2] > 59 || f[3] > 59)
        return std::nullopt;
    if (sep == ':') {
        if (f[5] != 0)
            return std::nullopt;
    } else {
        std::uint64_t month, day;
        digitsAt(s, 4, 2, month);
        digitsAt(s, 6, 2, day);
        digitsAt(s, 0, 4, f[6]);
        if (month < 1 || month > 12 || day < 1 || day > daysInMonth(f[6], month))
            return std::nullopt;
    }
    return DateTime(std::string(s));
}

DateTime DateTime::fromBinary(std::uint64_t usec, bool interval) {
    char buf[64];
    const unsigned long micro = static_cast<unsigned long>(usec % kUsecPerSec);
    std::uint64_t secs = usec / kUsecPerSec;
    if (interval) {
        const unsigned long s = secs % 60, m = (secs / 60) % 60, h = (secs / 3600) % 24;
        const unsigned long long d = secs / 86400;
        std::snprintf(buf, sizeof buf, "%08llu%02lu%02lu%02lu.%06lu:000", d % 100000000ULL, h, m, s,
                      micro);
    } else {
        std::time_t t = static_cast<std::time_t>(secs);
        std::tm tm{};
        gmtime_r(&t, &tm);
        std::snprintf(buf, sizeof buf, "%04d%02d%02d%02d%02d%02d.%06lu+000",
                      (tm.tm_year + 1900) % 10000, tm.tm_mon + 1, tm.tm_mday, tm.tm_hour, tm.tm_min,
                      tm.tm_sec, micro);
    }
    return DateTime(buf);
}

DateTime DateTime::now() {
    timeval tv{};
    gettimeofday(&tv, nullptr);
    return fromBinary(static_cast<std::uint64_t>(tv.tv_sec) * kUsecPerSec +
                          static_cast<std::uint64_t>(tv.tv_usec),
                      false);
}

std::uint64_t DateTime::toBinary() const {
    std::uint64_t micro, a, h, m, s, off;
    digitsAt(text_, 15, 6, micro);
    digitsAt(text_, 8, 2, h);
    digitsAt(text_, 10, 2, m);
    digitsAt(text_, 12, 2, s);
    if (isInterval()) {
        digitsAt(text_, 0, 8, a);
        return (((a * 24 + h) * 60 + m) * 60 + s) * kUsecPerSec + micro;
    }
    std::uint64_t year, month, day;
    digitsAt(text_, 0, 4, year);
    digitsAt(text_, 4, 2, month);
    digitsAt(text_, 6, 2, day);
    digitsAt(text_, 22, 3, off);
    std::tm tm{};
    tm.tm_year = static_cast<int>(year) - 1900;
    tm.tm_mon = static_cast<int>(month) - 1;
    tm.tm_mday = static_cast<int>(day);
    tm.tm_hour = static_cast<int>(h);
    tm.tm_min = static_cast<int>(m);
    tm.tm_sec = static_cast<int>(s);
    std::int64_t secs = static_cast<std::int64_t>(timegm(&tm));
    // The text is local time at the given offset east of UTC.
    secs -= (text_[21] == '-' ? -1 : 1) * static_cast<std::int64_t>(off) * 60;
    if (secs < 0)
        return 0;
    return static_cast<std::uint64_t>(secs) * kUsecPerSec + micro;
}

// ---------------------------------------------------------------------------
// Value
// ---------------------------------------------------------------------------
Value Value::null(Type t, bool array) {
    Value v;
    v.type_ = t;
    v.array_ = array;
    v.null_ = true;
    return v;
}

Value Value::boolean(bool b) {
    Value v = null(Type::Boolean);
    v.null_ = false;
    v.bits_ = b ? 1 : 0;
    return v;
}

Value Value::integer(Type t, std::uint64_t bits) {
    const TypeInfo& ti = info(t);
    if (!ti.bits)
        throw std::invalid_argument("not an integer type");
    Value v = null(t);
    v.null_ = false;
    if (ti.bits < 64) {
        const std::uint64_t mask = (std::uint64_t(1) << ti.bits) - 1;
        bits &= mask;
        if (ti.isSigned && (bits >> (ti.bits - 1)) != 0)
            bits |= ~mask;  // sign-extend
    }
    v.bits_ = bits;
    return v;
}

Value Value::real32(float f) {
    Value v = null(Type::Real32);
    v.null_ = false;
    v.real_ = f;
    return v;
}

Value Value::real64(double d) {
    Value v = null(Type::Real64);
    v.null_ = false;
    v.real_ = d;
    return v;
}

Value Value::char16(std::uint16_t c) {
    Value v = null(Type::Char16);
    v.null_ = false;
    v.bits_ = c;
    return v;
}

Value Value::string(std::string s) {
    Value v = null(Type::String);
    v.null_ = false;
    v.str_ = std::move(s);
    return v;
}

Value Value::dateTime(DateTime d) {
    Value v = null(Type::DateTime);
    v.null_ = false;
    v.dt_ = std::move(d);
    return v;
}

Value Value::reference(ObjectPath p) {
    Value v = null(Type::Reference);
    v.null_ = false;
    v.ref_ = std::make_shared<const ObjectPath>(std::move(p));
    return v;
}

Value Value::instance(Instance i) {
    Value v = null(Type::Instance);
    v.null_ = false;
    v.inst_ = std::make_shared<const Instance>(std::move(i));
    return v;
}

Value Value::array(Type element, std::vector<Value> elements) {
    for (const auto& e : elements)
        if (e.type_ != element || e.array_)
            throw std::invalid_argument("array element of another type");
    Value v = null(element, true);
    v.null_ = false;
    v.elems_ = std::move(elements);
    return v;
}

const ObjectPath& Value::asReference() const {
    static const ObjectPath empty;
    return ref_ ? *ref_ : empty;
}

const Instance& Value::asInstance() const {
    static const Instance empty;
    return inst_ ? *inst_ : empty;
}

bool Value::operator==(const Value& o) const {
    if (type_ != o.type_ || array_ != o.array_ || null_ != o.null_)
        return false;
    if (null_)
        return true;
    if (array_)
        return elems_ == o.elems_;
    switch (type_) {
        case Type::Real32: return static_cast<float>(real_) == static_cast<float>(o.real_);
        case Type::Real64: return real_ == o.real_;
        case Type::String: return str_ == o.str_;
        case Type::DateTime: return dt_ == o.dt_;
        case Type::Reference: return asReference() == o.asReference();
        case Type::Instance: return asInstance() == o.asInstance();
        default: return bits_ == o.bits_;
    }
}

bool Property::operator==(const Property& o) const {
    return equalsIgnoreCase(name, o.name) && value == o.value;
}

const Value* findProperty(const PropertyVector& v, std::string_view name) {
    for (const auto& p : v)
        if (equalsIgnoreCase(p.name, name))
            return &p.value;
    return nullptr;
}

void setProperty(PropertyVector& v, std::string name, Value value) {
    for (auto& p : v)
        if (equalsIgnoreCase(p.name, name)) {
            p.value = std::move(value);
            return;
        }
    v.push_back(Property{std::move(name), std::move(value)});
}

namespace {

// Property sets are equal regardless of order.
bool sameProperties(const PropertyVector& a, const PropertyVector& b) {
    if (a.size() != b.size())
        return false;
    for (const auto& p : a) {
        const Value* q = findProperty(b, p.name);
        if (!q || *q != p.value)
            return false;
    }
    return true;
}

std::vector<const Property*> sortedByName(const PropertyVector& v) {
    std::vector<const Property*> r;
    for (const auto& p : v)
        r.push_back(&p);
    std::stable_sort(r.begin(), r.end(), [](const Property* a, const Property* b) {
        return toLower(a->name) < toLower(b->name);
    });
    return r;
}

}  // namespace

// ---------------------------------------------------------------------------
// Printing
// ---------------------------------------------------------------------------
namespace {

void appendQuoted(std::string& out, std::string_view s) {
    out += '"';
    for (char c : s) {
        switch (c) {
            case '"': out += "\\\""; break;
            case '\\': out += "\\\\"; break;
            case '\n': out += "\\n"; break;
            case '\t': out += "\\t"; break;
            case '\r': out += "\\r"; break;
            default:
                if (static_cast<unsigned char>(c) < 0x20) {
                    char buf[8];
                    std::snprintf(buf, sizeof buf, "\\x%02x", static_cast<unsigned char>(c));
                    out += buf;
                } else {
                    out += c;
                }
        }
    }
    out += '"';
}

template <class F>
void appendReal(std::string& out, F f) {
    if (std::isnan(f)) {
        out += "NaN";
        return;
    }
    if (std::isinf(f)) {
        out += f < 0 ? "-INF" : "INF";
        return;
    }
    char buf[64];
    auto r = std::to_chars(buf, buf + sizeof buf, f);
    std::string_view s(buf, static_cast<size_t>(r.ptr - buf));
    out += s;
    if (s.find_first_of(".e") == std::string_view::npos)
        out += ".0";
}

void appendInstanceBody(std::string& out, const Instance& inst, int indent);

void appendScalar(std::string& out, const Value& v, int indent) {
    switch (v.type()) {
        case Type::Boolean: out += v.asBool() ? "TRUE" : "FALSE"; break;
        case Type::Real32: appendReal(out, static_cast<float>(v.asReal())); break;
        case Type::Real64: appendReal(out, v.asReal()); break;
        case Type::Char16: {
            const std::uint16_t c = v.asChar16();
            if (c >= 0x20 && c < 0x7f && c != '\'' && c != '\\') {
                out += '\'';
                out += static_cast<char>(c);
                out += '\'';
            } else {
                char buf[16];
                std::snprintf(buf, sizeof buf, "'\\u%04x'", c);
                out += buf;
            }
            break;
        }
        case Type::String: appendQuoted(out, v.asString()); break;
        case Type::DateTime: appendQuoted(out, v.asDateTime().text()); break;
        case Type::Reference: appendQuoted(out, v.asReference().toString()); break;
        case Type::Instance:
            out += "instance ";
            appendInstanceBody(out, v.asInstance(), indent);
            break;
        default:
            out +=
                isSignedInteger(v.type()) ? std::to_string(v.asSint()) : std::to_string(v.asUint());
    }
}

void appendValue(std::string& out, const Value& v, int indent) {
    if (v.isNull()) {
        out += "NULL";
        return;
    }
    if (!v.isArray()) {
        appendScalar(out, v, indent);
        return;
    }
    out += '{';
    bool first = true;
    for (const auto& e : v.elements()) {
        if (!first)
            out += ", ";
        first = false;
        appendValue(out, e, indent);
    }
    out += '}';
}

void appendDeclarations(std::string& out, const PropertyVector& props, int indent) {
    const std::string pad(static_cast<size_t>(indent), ' ');
    for (const Property* p : sortedByName(props)) {
        out += pad;
        out += typeName(p->value.type());
        if (p->value.isArray())
            out += "[]";
        out += ' ';
        out += p->name;
        out += " = ";
        appendValue(out, p->value, indent);
        out += ";\n";
    }
}

// "<path> {\n<declarations>}" with the closing brace at `indent - 4`.
void appendInstanceBody(std::string& out, const Instance& inst, int indent) {
    out += inst.path().toString();
    out += " {\n";
    appendDeclarations(out, inst.properties(), indent + 4);
    out += std::string(static_cast<size_t>(indent), ' ');
    out += '}';
}

}  // namespace

std::string Value::toString() const {
    std::string s;
    appendValue(s, *this, 0);
    return s;
}

// ---------------------------------------------------------------------------
// ObjectPath
// ---------------------------------------------------------------------------
ObjectPath& ObjectPath::addKey(std::string name, Value v) {
    setProperty(keys_, std::move(name), std::move(v));
    return *this;
}

std::string ObjectPath::toString() const {
    std::string s;
    if (!host_.empty()) {
        s += "//";
        s += host_;
        s += '/';
    }
    if (!ns_.empty()) {
        s += ns_;
        s += ':';
    }
    s += class_;
    char sep = '.';
    for (const Property* k : sortedByName(keys_)) {
        s += sep;
        sep = ',';
        s += k->name;
        s += '=';
        appendValue(s, k->value, 0);
    }
    return s;
}

bool ObjectPath::operator==(const ObjectPath& o) const {
    return equalsIgnoreCase(host_, o.host_) && equalsIgnoreCase(ns_, o.ns_) &&
           equalsIgnoreCase(class_, o.class_) && sameProperties(keys_, o.keys_);
}

namespace {

bool sameKeyValue(const Value& a, const Value& b) {
    if (a.isNull() || b.isNull() || a.isArray() || b.isArray())
        return a == b;
    if (isInteger(a.type()) && isInteger(b.type())) {
        const bool aNeg = isSignedInteger(a.type()) && a.asSint() < 0;
        const bool bNeg = isSignedInteger(b.type()) && b.asSint() < 0;
        return aNeg == bNeg && a.asUint() == b.asUint();
    }
    if (a.type() == Type::Reference && b.type() == Type::Reference)
        return a.asReference().identifies(b.asReference());
    return a == b;
}

}  // namespace

bool ObjectPath::identifies(const ObjectPath& o) const {
    if (!equalsIgnoreCase(class_, o.class_))
        return false;
    if (!ns_.empty() && !o.ns_.empty() && !equalsIgnoreCase(ns_, o.ns_))
        return false;
    if (keys_.size() != o.keys_.size())
        return false;
    for (const auto& k : keys_) {
        const Value* v = o.key(k.name);
        if (!v || !sameKeyValue(k.value, *v))
            return false;
    }
    return true;
}

// ---------------------------------------------------------------------------
// Instance
// ---------------------------------------------------------------------------
Instance& Instance::set(std::string name, Value v) {
    setProperty(props_, std::move(name), std::move(v));
    return *this;
}

Instance& Instance::setKey(std::string name, Value v) {
    path_.addKey(name, v);
    return set(std::move(name), std::move(v));
}

bool Instance::remove(std::string_view name) {
    auto it = std::find_if(props_.begin(), props_.end(),
                           [&](const Property& p) { return equalsIgnoreCase(p.name, name); });
    if (it == props_.end())
        return false;
    props_.erase(it);
    return true;
}

std::string Instance::toString() const {
    std::string s = "instance ";
    appendInstanceBody(s, *this, 0);
    s += '\n';
    return s;
}

bool Instance::operator==(const Instance& o) const {
    return path_ == o.path_ && sameProperties(props_, o.props_);
}

std::string declarations(const PropertyVector& props, int indent) {
    std::string s;
    appendDeclarations(s, props, indent);
    return s;
}

std::ostream& operator<<(std::ostream& os, const Value& v) {
    return os << v.toString();
}
std::ostream& operator<<(std::ostream& os, const ObjectPath& p) {
    return os << p.toString();
}
std::ostream& operator<<(std::ostream& os, const Instance& i) {
    return os << i.toString();
}

}  // namespace tvrnhost
