#include "host/value.h"

#include <sys/time.h>
#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <limits>
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
        if (month < 1 || month > 12 || day < 1 || day > 31)
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

// ---------------------------------------------------------------------------
// Parsing
// ---------------------------------------------------------------------------
namespace {

bool isIdentStart(char c) {
    return std::isalpha(static_cast<unsigned char>(c)) || c == '_';
}
bool isIdentChar(char c) {
    return std::isalnum(static_cast<unsigned char>(c)) || c == '_';
}

class Parser {
public:
    explicit Parser(std::string_view s) : s_(s) {}

    [[noreturn]] void fail(const std::string& what) const {
        size_t line = 1;
        for (size_t i = 0; i < pos_ && i < s_.size(); ++i)
            line += s_[i] == '\n';
        throw ParseError("line " + std::to_string(line) + ": " + what);
    }

    bool atEnd() const { return pos_ >= s_.size(); }
    char peek() const { return atEnd() ? '\0' : s_[pos_]; }

    void skipSpace(bool comments = false) {
        for (;;) {
            while (!atEnd() && std::isspace(static_cast<unsigned char>(s_[pos_])))
                ++pos_;
            if (comments && (peek() == '#' || s_.substr(pos_, 2) == "//")) {
                while (!atEnd() && s_[pos_] != '\n')
                    ++pos_;
                continue;
            }
            return;
        }
    }

    void expect(char c) {
        skipSpace();
        if (peek() != c)
            fail(std::string("expected '") + c + "'");
        ++pos_;
    }

    bool accept(char c) {
        skipSpace();
        if (peek() != c)
            return false;
        ++pos_;
        return true;
    }

    std::string identifier() {
        skipSpace();
        if (!isIdentStart(peek()))
            fail("expected a name");
        const size_t b = pos_;
        while (!atEnd() && isIdentChar(s_[pos_]))
            ++pos_;
        return std::string(s_.substr(b, pos_ - b));
    }

    // True and consumed when the next word is `w` (case-insensitive).
    bool acceptWord(std::string_view w) {
        skipSpace();
        if (s_.size() - pos_ < w.size() || !equalsIgnoreCase(s_.substr(pos_, w.size()), w))
            return false;
        if (pos_ + w.size() < s_.size() && isIdentChar(s_[pos_ + w.size()]))
            return false;
        pos_ += w.size();
        return true;
    }

    std::string quoted(char q = '"') {
        skipSpace();
        if (peek() != q)
            fail(std::string("expected ") + q);
        ++pos_;
        std::string r;
        for (;;) {
            if (atEnd())
                fail("unterminated quoted text");
            char c = s_[pos_++];
            if (c == q)
                return r;
            if (c != '\\') {
                r += c;
                continue;
            }
            if (atEnd())
                fail("unterminated escape");
            c = s_[pos_++];
            switch (c) {
                case 'n': r += '\n'; break;
                case 't': r += '\t'; break;
                case 'r': r += '\r'; break;
                case 'x':
                case 'u': {
                    const size_t n = c == 'x' ? 2 : 4;
                    if (s_.size() - pos_ < n)
                        fail("bad escape");
                    unsigned v = 0;
                    auto res = std::from_chars(s_.data() + pos_, s_.data() + pos_ + n, v, 16);
                    if (res.ptr != s_.data() + pos_ + n)
                        fail("bad escape");
                    pos_ += n;
                    if (c == 'x' || v < 0x80) {
                        r += static_cast<char>(v);
                    } else {  // UTF-8
                        if (v < 0x800) {
                            r += static_cast<char>(0xC0 | (v >> 6));
                        } else {
                            r += static_cast<char>(0xE0 | (v >> 12));
                            r += static_cast<char>(0x80 | ((v >> 6) & 0x3F));
                        }
                        r += static_cast<char>(0x80 | (v & 0x3F));
                    }
                    break;
                }
                default: r += c;
            }
        }
    }

    // A run of characters that can make up a number or a bare word.
    std::string token(std::string_view stops) {
        skipSpace();
        const size_t b = pos_;
        while (!atEnd() && stops.find(s_[pos_]) == std::string_view::npos &&
               !std::isspace(static_cast<unsigned char>(s_[pos_])))
            ++pos_;
        if (b == pos_)
            fail("expected a value");
        return std::string(s_.substr(b, pos_ - b));
    }

    // Raw text up to (not including) `stop` outside double quotes.
    std::string rawUntil(char stop) {
        skipSpace();
        const size_t b = pos_;
        bool inQuote = false;
        while (!atEnd()) {
            const char c = s_[pos_];
            if (inQuote && c == '\\') {
                pos_ += 2;
                continue;
            }
            if (c == '"')
                inQuote = !inQuote;
            else if (!inQuote && c == stop)
                break;
            ++pos_;
        }
        if (atEnd())
            fail(std::string("expected '") + stop + "'");
        std::string r(s_.substr(b, pos_ - b));
        while (!r.empty() && std::isspace(static_cast<unsigned char>(r.back())))
            r.pop_back();
        return r;
    }

    std::string rest() {
        skipSpace();
        std::string r(s_.substr(pos_));
        pos_ = s_.size();
        while (!r.empty() && std::isspace(static_cast<unsigned char>(r.back())))
            r.pop_back();
        return r;
    }

    size_t pos() const { return pos_; }
    void setPos(size_t p) { pos_ = p; }

    Value typedValue(Type t, bool array);
    Value guessedValue(bool topLevel);
    Instance instanceBody();  // after the word "instance"

private:
    Value typedScalar(Type t);
    Value integerFrom(const std::string& tok, Type t);
    Value realFrom(const std::string& tok, Type t);

    std::string_view s_;
    size_t pos_ = 0;
};

const char kValueStops[] = ",;}{";

bool parseUnsigned(std::string_view tok, std::uint64_t& out) {
    int base = 10;
    if (tok.size() > 2 && tok[0] == '0' && (tok[1] == 'x' || tok[1] == 'X')) {
        base = 16;
        tok.remove_prefix(2);
    }
    if (tok.empty())
        return false;
    auto r = std::from_chars(tok.data(), tok.data() + tok.size(), out, base);
    return r.ec == std::errc() && r.ptr == tok.data() + tok.size();
}

bool looksInteger(std::string_view tok) {
    if (!tok.empty() && (tok[0] == '-' || tok[0] == '+'))
        tok.remove_prefix(1);
    std::uint64_t v;
    return parseUnsigned(tok, v);
}

bool looksReal(std::string_view tok) {
    if (tok == "NaN" || tok == "INF" || tok == "-INF")
        return true;
    if (tok.find_first_of(".eE") == std::string_view::npos)
        return false;
    char* end = nullptr;
    std::string t(tok);
    std::strtod(t.c_str(), &end);
    return end && *end == '\0' && !t.empty();
}

Value Parser::integerFrom(const std::string& tok, Type t) {
    std::string_view v = tok;
    bool neg = false;
    if (!v.empty() && (v[0] == '-' || v[0] == '+')) {
        neg = v[0] == '-';
        v.remove_prefix(1);
    }
    std::uint64_t mag;
    if (!parseUnsigned(v, mag))
        fail("not an integer: " + tok);
    const TypeInfo& ti = info(t);
    if (ti.isSigned) {
        const std::uint64_t max =
            ti.bits == 64 ? std::uint64_t(INT64_MAX) : (std::uint64_t(1) << (ti.bits - 1)) - 1;
        if (mag > max + (neg ? 1 : 0))
            fail("out of range for " + std::string(ti.name) + ": " + tok);
        return Value::integer(t, neg ? (~mag + 1) : mag);
    }
    const std::uint64_t max = ti.bits == 64 ? UINT64_MAX : (std::uint64_t(1) << ti.bits) - 1;
    if ((neg && mag != 0) || mag > max)
        fail("out of range for " + std::string(ti.name) + ": " + tok);
    return Value::integer(t, mag);
}

Value Parser::realFrom(const std::string& tok, Type t) {
    double d;
    if (tok == "NaN")
        d = std::numeric_limits<double>::quiet_NaN();
    else if (tok == "INF")
        d = std::numeric_limits<double>::infinity();
    else if (tok == "-INF")
        d = -std::numeric_limits<double>::infinity();
    else {
        char* end = nullptr;
        d = std::strtod(tok.c_str(), &end);
        if (!end || *end != '\0')
            fail("not a real number: " + tok);
    }
    return t == Type::Real32 ? Value::real32(static_cast<float>(d)) : Value::real64(d);
}

Value Parser::typedScalar(Type t) {
    skipSpace();
    if (acceptWord("NULL"))
        return Value::null(t);
    switch (t) {
        case Type::Boolean:
            if (acceptWord("TRUE"))
                return Value::boolean(true);
            if (acceptWord("FALSE"))
                return Value::boolean(false);
            fail("expected TRUE or FALSE");
        case Type::Real32:
        case Type::Real64: return realFrom(token(kValueStops), t);
        case Type::Char16: {
            const std::string s = quoted('\'');
            // Decode one UTF-8 character.
            const auto* u = reinterpret_cast<const unsigned char*>(s.data());
            if (s.size() == 1 && u[0] < 0x80)
                return Value::char16(u[0]);
            if (s.size() == 2 && (u[0] & 0xE0) == 0xC0)
                return Value::char16(
                    static_cast<std::uint16_t>(((u[0] & 0x1F) << 6) | (u[1] & 0x3F)));
            if (s.size() == 3 && (u[0] & 0xF0) == 0xE0)
                return Value::char16(static_cast<std::uint16_t>(
                    ((u[0] & 0x0F) << 12) | ((u[1] & 0x3F) << 6) | (u[2] & 0x3F)));
            fail("expected one character");
        }
        case Type::String: return Value::string(quoted());
        case Type::DateTime: {
            const std::string s = quoted();
            auto dt = DateTime::parse(s);
            if (!dt)
                fail("not a date-time: " + s);
            return Value::dateTime(*dt);
        }
        case Type::Reference: {
            const std::string s = quoted();
            try {
                return Value::reference(ObjectPath::parse(s));
            } catch (const ParseError& e) {
                fail(std::string("bad reference: ") + e.what());
            }
        }
        case Type::Instance:
            if (!acceptWord("instance"))
                fail("expected an embedded instance");
            return Value::instance(instanceBody());
        default: return integerFrom(token(kValueStops), t);
    }
}

Value Parser::typedValue(Type t, bool array) {
    if (!array)
        return typedScalar(t);
    if (acceptWord("NULL"))
        return Value::null(t, true);
    expect('{');
    std::vector<Value> elems;
    if (!accept('}')) {
        do
            elems.push_back(typedScalar(t));
        while (accept(','));
        expect('}');
    }
    return Value::array(t, std::move(elems));
}

Value Parser::guessedValue(bool topLevel) {
    skipSpace();
    // Explicit "type:" or "type[]:" prefix.
    {
        const size_t save = pos_;
        if (isIdentStart(peek())) {
            std::string word = identifier();
            bool array = false;
            if (peek() == '[' && pos_ + 1 < s_.size() && s_[pos_ + 1] == ']') {
                pos_ += 2;
                array = true;
            }
            auto t = typeFromName(word);
            if (t && peek() == ':') {
                ++pos_;
                return typedValue(*t, array);
            }
        }
        pos_ = save;
    }
    if (acceptWord("NULL"))
        return Value();
    if (acceptWord("TRUE"))
        return Value::boolean(true);
    if (acceptWord("FALSE"))
        return Value::boolean(false);
    if (peek() == '"') {
        const std::string s = quoted();
        try {
            ObjectPath p = ObjectPath::parse(s);
            if (!p.keys().empty())
                return Value::reference(std::move(p));
        } catch (const ParseError&) {
        }
        return Value::string(s);
    }
    if (accept('{')) {
        std::vector<Value> elems;
        if (!accept('}')) {
            do
                elems.push_back(guessedValue(false));
            while (accept(','));
            expect('}');
        }
        std::optional<Type> t;
        for (const auto& e : elems) {
            if (e.isArray())
                fail("nested arrays are not allowed");
            if (e.isNull())
                continue;
            if (t && *t != e.type())
                fail("array elements of different types");
            t = e.type();
        }
        const Type et = t.value_or(Type::String);
        for (auto& e : elems)
            if (e.isNull())
                e = Value::null(et);
        return Value::array(et, std::move(elems));
    }
    const size_t save = pos_;
    const std::string tok = token(kValueStops);
    if (looksInteger(tok))
        return integerFrom(tok, tok[0] == '-' ? Type::Sint64 : Type::Uint64);
    if (looksReal(tok))
        return realFrom(tok, Type::Real64);
    if (topLevel) {  // a bare word: the whole text
        pos_ = save;
        return Value::string(rest());
    }
    return Value::string(tok);
}

Instance Parser::instanceBody() {
    const std::string pathText = rawUntil('{');
    Instance inst;
    try {
        inst.setPath(ObjectPath::parse(pathText));
    } catch (const ParseError& e) {
        fail(std::string("bad instance path: ") + e.what());
    }
    expect('{');
    for (;;) {
        skipSpace(true);
        if (accept('}'))
            break;
        const std::string tname = identifier();
        auto t = typeFromName(tname);
        if (!t)
            fail("unknown type: " + tname);
        bool array = false;
        if (accept('[')) {
            expect(']');
            array = true;
        }
        std::string name = identifier();
        expect('=');
        Value v = typedValue(*t, array);
        expect(';');
        if (inst.get(name))
            fail("property given twice: " + name);
        inst.set(std::move(name), std::move(v));
    }
    return inst;
}

}  // namespace

ObjectPath ObjectPath::parse(std::string_view text) {
    while (!text.empty() && std::isspace(static_cast<unsigned char>(text.front())))
        text.remove_prefix(1);
    while (!text.empty() && std::isspace(static_cast<unsigned char>(text.back())))
        text.remove_suffix(1);
    ObjectPath p;
    if (text.substr(0, 2) == "//") {
        text.remove_prefix(2);
        const size_t slash = text.find('/');
        if (slash == std::string_view::npos || slash == 0)
            throw ParseError("object path: host without namespace");
        p.host_ = std::string(text.substr(0, slash));
        text.remove_prefix(slash + 1);
    }
    // A namespace ends at the first ':' that precedes the key part.
    const size_t stop = text.find_first_of(".\"=");
    const size_t colon = text.substr(0, stop).find(':');
    if (colon != std::string_view::npos) {
        p.ns_ = std::string(text.substr(0, colon));
        text.remove_prefix(colon + 1);
        if (p.ns_.empty())
            throw ParseError("object path: empty namespace");
    } else if (!p.host_.empty()) {
        throw ParseError("object path: host without namespace");
    }
    const size_t dot = text.find('.');
    p.class_ = std::string(text.substr(0, dot));
    if (p.class_.empty() || !isIdentStart(p.class_[0]) ||
        !std::all_of(p.class_.begin(), p.class_.end(), isIdentChar))
        throw ParseError("object path: bad class name '" + p.class_ + "'");
    if (dot == std::string_view::npos)
        return p;

    Parser ps(text.substr(dot + 1));
    do {
        std::string name = ps.identifier();
        ps.expect('=');
        ps.skipSpace();
        Value v;
        if (ps.peek() == '"') {
            v = ps.guessedValue(false);
        } else if (ps.peek() == '\'') {
            v = ps.typedValue(Type::Char16, false);
        } else {
            const std::string tok = ps.token(",");
            if (equalsIgnoreCase(tok, "TRUE") || equalsIgnoreCase(tok, "FALSE"))
                v = Value::boolean(equalsIgnoreCase(tok, "TRUE"));
            else if (looksInteger(tok) || looksReal(tok)) {
                Parser num(tok);
                v = num.guessedValue(false);
            } else
                throw ParseError("object path: bad value of key " + name + ": " + tok);
        }
        if (p.key(name))
            throw ParseError("object path: key given twice: " + name);
        p.keys_.push_back(Property{std::move(name), std::move(v)});
    } while (ps.accept(','));
    ps.skipSpace();
    if (!ps.atEnd())
        throw ParseError("object path: unexpected text after the keys");
    return p;
}

std::vector<Instance> parseInstances(std::string_view text) {
    Parser ps(text);
    std::vector<Instance> r;
    for (;;) {
        ps.skipSpace(true);
        if (ps.atEnd())
            return r;
        if (!ps.acceptWord("instance"))
            ps.fail("expected 'instance'");
        r.push_back(ps.instanceBody());
        ps.accept(';');
    }
}

Value parseValue(std::string_view text, std::optional<Type> type, bool array) {
    Parser ps(text);
    Value v = type ? ps.typedValue(*type, array) : ps.guessedValue(true);
    ps.skipSpace();
    if (!ps.atEnd())
        ps.fail("unexpected text after the value");
    return v;
}

}  // namespace tvrnhost
