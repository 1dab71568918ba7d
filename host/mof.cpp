#include "host/mof.h"

#include <cstdio>

namespace tvrnhost {

namespace {

// Escapes that MOF names; other control characters use \xHHHH (four digits,
// so that a following hex digit is not read as part of the escape).
const char* namedEscape(char c) {
    switch (c) {
        case '\b': return "\\b";
        case '\t': return "\\t";
        case '\n': return "\\n";
        case '\f': return "\\f";
        case '\r': return "\\r";
        case '"': return "\\\"";
        case '\'': return "\\'";
        case '\\': return "\\\\";
        default: return nullptr;
    }
}

// Appends one character of a literal quoted with `quote`: a byte of a
// string (bytes of UTF-8 sequences pass unchanged) or a char16 code.
void appendEscaped(std::string& out, unsigned code, char quote) {
    const char c = static_cast<char>(code);
    const char otherQuote = quote == '"' ? '\'' : '"';
    if (code < 0x80 && c != otherQuote) {
        if (const char* e = namedEscape(c)) {
            out += e;
            return;
        }
    }
    const bool printable = code < 0x80 ? code >= 0x20 && code != 0x7f : quote == '"';
    if (printable) {
        out += c;
        return;
    }
    char buf[8];
    std::snprintf(buf, sizeof buf, "\\x%04X", code);
    out += buf;
}

std::string properties(const Instance& inst, const char* first, const char* sep, const char* last);

void appendScalar(std::string& out, const Value& v) {
    switch (v.type()) {
        case Type::Boolean: out += v.asBool() ? "true" : "false"; break;
        case Type::Char16:
            out += '\'';
            appendEscaped(out, v.asChar16(), '\'');
            out += '\'';
            break;
        case Type::String: out += mofString(v.asString()); break;
        case Type::DateTime: out += mofString(v.asDateTime().text()); break;
        case Type::Reference: out += mofString(v.asReference().toString()); break;
        case Type::Instance: {
            const Instance& inst = v.asInstance();
            out += mofString("instance of " + inst.className() + " {" +
                             properties(inst, " ", " ", " ") + "};");
            break;
        }
        default: out += v.toString();  // integers and reals read the same in MOF
    }
}

void appendValue(std::string& out, const Value& v) {
    if (v.isNull()) {
        out += "NULL";
        return;
    }
    if (!v.isArray()) {
        appendScalar(out, v);
        return;
    }
    out += '{';
    const char* sep = "";
    for (const auto& e : v.elements()) {
        out += sep;
        sep = ", ";
        appendValue(out, e);
    }
    out += '}';
}

// The non-null properties as "<first><Name> = <value>;<sep>..." ending in
// `last` instead of the final `sep`; empty when there are none.
std::string properties(const Instance& inst, const char* first, const char* sep, const char* last) {
    std::string body;
    for (const auto& p : inst.properties()) {
        if (p.value.isNull())
            continue;
        body += body.empty() ? first : sep;
        body += p.name;
        body += " = ";
        appendValue(body, p.value);
        body += ';';
    }
    if (!body.empty())
        body += last;
    return body;
}

}  // namespace

std::string mofString(std::string_view s) {
    std::string out = "\"";
    for (char c : s)
        appendEscaped(out, static_cast<unsigned char>(c), '"');
    out += '"';
    return out;
}

std::string mofValue(const Value& v) {
    std::string out;
    appendValue(out, v);
    return out;
}

std::string mofInstance(const Instance& inst) {
    return "instance of " + inst.className() + " {\n" + properties(inst, "    ", "\n    ", "\n") +
           "};\n";
}

}  // namespace tvrnhost
