#include "host/registration.h"

#include <cctype>
#include <fstream>
#include <sstream>

#include "host/value.h"

namespace tvrnhost {

namespace {

std::string_view trim(std::string_view s) {
    while (!s.empty() && std::isspace(static_cast<unsigned char>(s.front())))
        s.remove_prefix(1);
    while (!s.empty() && std::isspace(static_cast<unsigned char>(s.back())))
        s.remove_suffix(1);
    return s;
}

std::vector<std::string> words(std::string_view s) {
    std::vector<std::string> r;
    std::string cur;
    for (char c : s) {
        if (std::isspace(static_cast<unsigned char>(c)) || c == ',') {
            if (!cur.empty())
                r.push_back(std::move(cur));
            cur.clear();
        } else {
            cur += c;
        }
    }
    if (!cur.empty())
        r.push_back(std::move(cur));
    return r;
}

struct KindName {
    const char* name;
    MIKind kind;
};
const KindName kKindNames[] = {
    {"instance", kInstanceMI},
    {"association", kAssociationMI},
    {"method", kMethodMI},
    {"indication", kIndicationMI},
};

}  // namespace

std::vector<Registration> parseRegistrations(std::string_view text) {
    std::vector<Registration> regs;
    int lineNo = 0;
    auto fail = [&](const std::string& what) -> void {
        throw ParseError("line " + std::to_string(lineNo) + ": " + what);
    };
    auto finish = [&]() {
        if (regs.empty())
            return;
        const Registration& r = regs.back();
        lineNo = r.line;
        if (r.provider.empty())
            fail("[" + r.className + "] has no provider");
        if (r.location.empty())
            fail("[" + r.className + "] has no location");
        if (!r.kinds)
            fail("[" + r.className + "] has no type");
        if (r.namespaces.empty())
            fail("[" + r.className + "] has no namespace");
    };

    std::istringstream in{std::string(text)};
    std::string raw;
    while (std::getline(in, raw)) {
        ++lineNo;
        std::string_view line = raw;
        const size_t hash = line.find('#');
        if (hash != std::string_view::npos)
            line = line.substr(0, hash);
        line = trim(line);
        if (line.empty())
            continue;
        if (line.front() == '[') {
            if (line.back() != ']')
                fail("unterminated class header");
            const int here = lineNo;
            finish();
            lineNo = here;
            Registration r;
            r.className = std::string(trim(line.substr(1, line.size() - 2)));
            if (r.className.empty())
                fail("empty class name");
            r.line = lineNo;
            regs.push_back(std::move(r));
            continue;
        }
        const size_t colon = line.find(':');
        if (colon == std::string_view::npos)
            fail("expected 'key: value'");
        if (regs.empty())
            fail("entry before the first [Class] header");
        Registration& r = regs.back();
        const std::string key = toLower(trim(line.substr(0, colon)));
        const std::string_view value = trim(line.substr(colon + 1));
        if (key == "provider") {
            r.provider = std::string(value);
        } else if (key == "location") {
            r.location = std::string(value);
        } else if (key == "type") {
            for (const auto& w : words(value)) {
                bool known = false;
                for (const auto& k : kKindNames)
                    if (equalsIgnoreCase(w, k.name)) {
                        r.kinds |= k.kind;
                        known = true;
                    }
                if (!known)
                    fail("unknown provider type '" + w + "'");
            }
        } else if (key == "namespace") {
            for (auto& w : words(value))
                r.namespaces.push_back(std::move(w));
        } else {
            fail("unknown entry '" + key + "'");
        }
    }
    finish();
    return regs;
}

std::vector<Registration> readRegistrationFile(const std::string& path) {
    std::ifstream f(path);
    if (!f)
        throw ParseError(path + ": cannot open");
    std::stringstream ss;
    ss << f.rdbuf();
    try {
        return parseRegistrations(ss.str());
    } catch (const ParseError& e) {
        throw ParseError(path + ": " + e.what());
    }
}

}  // namespace tvrnhost
