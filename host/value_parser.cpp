// The parser of the text forms of host/value.h: value literals, object
// paths and instances.
#include "host/value.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>

namespace tvrnhost {

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
    const int bits = integerBits(t);
    if (isSignedInteger(t)) {
        const std::uint64_t max =
            bits == 64 ? std::uint64_t(INT64_MAX) : (std::uint64_t(1) << (bits - 1)) - 1;
        if (mag > max + (neg ? 1 : 0))
            fail("out of range for " + std::string(typeName(t)) + ": " + tok);
        return Value::integer(t, neg ? (~mag + 1) : mag);
    }
    const std::uint64_t max = bits == 64 ? UINT64_MAX : (std::uint64_t(1) << bits) - 1;
    if ((neg && mag != 0) || mag > max)
        fail("out of range for " + std::string(typeName(t)) + ": " + tok);
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
