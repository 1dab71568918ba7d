// The repository against the MOF classes it is made from, read here by a small
// reader of its own so that a fault shared by the generator and its output
// cannot hide: every class, its superclass, its features in order with their
// kinds, keys and referenced classes.
#include <gtest/gtest.h>

#include <strings.h>

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <map>
#include <set>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "schema/Repository.h"

#ifndef TVRN_CIM_SCHEMA_MOF
#error "TVRN_CIM_SCHEMA_MOF must name the DMTF class file"
#endif
#ifndef TVRN_PROJECT_SOURCE_DIR
#error "TVRN_PROJECT_SOURCE_DIR must name the source tree"
#endif

using namespace CPTA;

namespace {

bool same_word(const std::string& a, const char* b) { return strcasecmp(a.c_str(), b) == 0; }

struct Feature {
    std::string name;
    char kind;        // 'P' property, 'R' reference, 'M' method
    bool key;
    std::string ref;  // referenced class of a reference ("Instance": any class)
    bool local;       // declared or redeclared by the class itself
};

// A class as declared (its own features), or with everything it inherits.
struct Class {
    std::string name, super;
    bool association = false, indication = false;
    std::vector<Feature> features;
};

// ---------------------------------------------------------------------------
// Reader for the MOF the class files use: qualifier lists, class declarations
// with an optional superclass, properties (arrays and defaults), references,
// methods with their parameters, and comments.
class Mof_Reader {
public:
    Mof_Reader(const std::string& file, const std::string& text) : file_(file) { tokenize(text); }

    std::vector<Class> read() {
        std::vector<Class> classes;
        while (pos_ < tokens_.size())
            classes.push_back(read_class());
        return classes;
    }

private:
    struct Token {
        std::string text;
        bool quoted;
        int line;
    };
    typedef std::vector<std::pair<std::string, std::string>> Qualifiers;

    [[noreturn]] void fail(const std::string& what, int line) const {
        throw std::runtime_error(file_ + ":" + std::to_string(line) + ": " + what);
    }

    static bool name_char(char c) { return std::isalnum((unsigned char)c) || std::strchr("_.+-", c); }

    void tokenize(const std::string& s) {
        int line = 1;
        for (size_t i = 0; i < s.size();) {
            char c = s[i];
            if (std::isspace((unsigned char)c)) {
                line += c == '\n';
                i++;
            } else if (s.compare(i, 2, "//") == 0) {
                i = std::min(s.find('\n', i), s.size());
            } else if (s.compare(i, 2, "/*") == 0) {
                size_t end = s.find("*/", i + 2);
                if (end == std::string::npos)
                    fail("unterminated comment", line);
                line += std::count(s.begin() + i, s.begin() + end, '\n');
                i = end + 2;
            } else if (c == '"') {
                std::string text;
                for (i++; i < s.size() && s[i] != '"'; i++)
                    text += s[i] == '\\' && i + 1 < s.size() ? s[++i] : s[i];
                if (i++ >= s.size())
                    fail("unterminated string", line);
                tokens_.push_back({text, true, line});
            } else if (name_char(c)) {
                size_t start = i;
                while (i < s.size() && name_char(s[i]))
                    i++;
                tokens_.push_back({s.substr(start, i - start), false, line});
            } else if (std::strchr("[](){},;:=", c)) {
                tokens_.push_back({std::string(1, c), false, line});
                i++;
            } else {
                fail(std::string("unexpected character '") + c + "'", line);
            }
        }
    }

    const Token& next() {
        if (pos_ >= tokens_.size())
            fail("unexpected end of file", tokens_.empty() ? 1 : tokens_.back().line);
        return tokens_[pos_++];
    }
    bool at(const char* text) const {
        return pos_ < tokens_.size() && !tokens_[pos_].quoted && same_word(tokens_[pos_].text, text);
    }
    // Reads `text` if it comes next.
    bool take(const char* text) { return at(text) && (next(), true); }
    void expect(const char* text) {
        const Token& t = next();
        if (t.quoted || !same_word(t.text, text))
            fail(std::string("expected '") + text + "', found '" + t.text + "'", t.line);
    }
    std::string word() {
        const Token& t = next();
        if (t.quoted || !(std::isalpha((unsigned char)t.text[0]) || t.text[0] == '_'))
            fail("expected a name, found '" + t.text + "'", t.line);
        return t.text;
    }
    // Skips to the bracket that closes the one just read and returns the
    // first token in between (the value of a qualifier).
    std::string skip_to(char close) {
        std::string first;
        for (int depth = 1;;) {
            const Token& t = next();
            char p = t.quoted || t.text.size() != 1 ? 0 : t.text[0];
            if (p && std::strchr("([{", p)) {
                depth++;
            } else if (p && std::strchr(")]}", p) && --depth == 0) {
                if (p != close)
                    fail(std::string("expected '") + close + "', found '" + p + "'", t.line);
                return first;
            } else if (first.empty()) {
                first = t.text;
            }
        }
    }

    // [Name, Name ( value ), ...]: the name and the first token of the value.
    Qualifiers read_qualifiers() {
        Qualifiers q;
        if (!take("["))
            return q;
        do {
            std::string name = word();
            q.emplace_back(name, take("(") ? skip_to(')') : std::string());
        } while (take(","));
        expect("]");
        return q;
    }

    static const std::string* find(const Qualifiers& q, const char* name) {
        for (const auto& e : q)
            if (same_word(e.first, name))
                return &e.second;
        return nullptr;
    }
    static bool has(const Qualifiers& q, const char* name) {
        const std::string* value = find(q, name);
        return value && !same_word(*value, "false");
    }

    // [quals] type [REF] Name ["[" [N] "]"], as a property, reference or parameter.
    Feature read_typed_name() {
        Qualifiers q = read_qualifiers();
        std::string type = word();
        bool ref = take("REF");
        Feature f{word(), 'P', has(q, "Key"), "", true};
        if (take("["))
            skip_to(']');
        if (ref)
            f.kind = 'R', f.ref = type;
        else if (const std::string* c = find(q, "EmbeddedInstance"))
            f.kind = 'R', f.ref = *c;
        else if (has(q, "EmbeddedObject"))
            f.kind = 'R', f.ref = "Instance";
        return f;
    }

    Class read_class() {
        Class c;
        Qualifiers q = read_qualifiers();
        c.association = has(q, "Association");
        c.indication = has(q, "Indication");
        expect("class");
        c.name = word();
        if (take(":"))
            c.super = word();
        expect("{");
        while (!take("}")) {
            Feature f = read_typed_name();
            if (take("(")) {
                f.kind = 'M', f.key = false, f.ref.clear();
                while (!take(")")) {
                    read_typed_name();
                    if (!at(")"))
                        expect(",");
                }
            } else if (take("=")) {
                while (!at(";"))
                    next();
            }
            expect(";");
            c.features.push_back(f);
        }
        expect(";");
        return c;
    }

    std::string file_;
    std::vector<Token> tokens_;
    size_t pos_ = 0;
};

std::vector<Class> read_mof(const std::string& path) {
    std::ifstream in(path);
    if (!in)
        throw std::runtime_error(path + ": cannot be read");
    std::stringstream text;
    text << in.rdbuf();
    return Mof_Reader(path, text.str()).read();
}

// ---------------------------------------------------------------------------
// A class as the inputs determine it: the features of the superclass chain,
// root first, with the class's own declarations merged in.

Class from_repository(const Meta_Class* mc) {
    Class c;
    c.super = mc->super_meta_class ? mc->super_meta_class->name : "";
    c.association = mc->flags & FLAG_ASSOCIATION;
    c.indication = mc->flags & FLAG_INDICATION;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        Feature f{mf->name, '?', (mf->flags & FLAG_KEY) != 0, "", mc->locals[i]};
        switch (mf->flags & (FLAG_PROPERTY | FLAG_REFERENCE | FLAG_METHOD)) {
        case FLAG_PROPERTY: f.kind = 'P'; break;
        case FLAG_METHOD: f.kind = 'M'; break;
        case FLAG_REFERENCE: {
            const Meta_Class* target = reinterpret_cast<const Meta_Reference*>(mf)->meta_class;
            f.kind = 'R', f.ref = target ? target->name : "(none)";
        }
        }
        c.features.push_back(f);
    }
    return c;
}

class Flattener {
public:
    // Without the DMTF classes, a superclass that no input declares is taken
    // from the repository: the class's own declarations are still checked.
    Flattener(const std::map<std::string, const Class*>& decls,
              const std::map<std::string, const Meta_Class*>& repository, bool inherit_from_repository)
        : decls_(decls), repository_(repository), inherit_from_repository_(inherit_from_repository) {}

    const Class& flatten(const std::string& name) {
        auto done = flat_.find(name);
        if (done != flat_.end())
            return done->second;
        const Class& decl = *decls_.at(name);
        Class c;
        if (!decl.super.empty())
            c = inherited(decl);
        c.super = decl.super;
        c.association |= decl.association;
        c.indication |= decl.indication;
        for (Feature& f : c.features)
            f.local = false;
        // Properties and references first, then methods.
        for (bool methods : {false, true}) {
            for (const Feature& d : decl.features) {
                if ((d.kind == 'M') != methods)
                    continue;
                auto old = std::find_if(c.features.begin(), c.features.end(),
                                        [&](const Feature& f) { return same_word(f.name, d.name.c_str()); });
                if (old == c.features.end()) {
                    c.features.push_back(d);
                } else {
                    bool key = old->key;
                    *old = d;
                    old->key |= key;
                }
            }
        }
        return flat_[name] = c;
    }

private:
    Class inherited(const Class& decl) {
        if (decls_.count(decl.super))
            return flatten(decl.super);
        auto mc = repository_.find(decl.super);
        if (inherit_from_repository_ && mc != repository_.end())
            return from_repository(mc->second);
        ADD_FAILURE() << decl.name << ": superclass " << decl.super << " is declared nowhere";
        return Class();
    }

    const std::map<std::string, const Class*>& decls_;
    const std::map<std::string, const Meta_Class*>& repository_;
    bool inherit_from_repository_;
    std::map<std::string, Class> flat_;
};

std::string describe(const std::vector<Feature>& features, size_t i) {
    if (i >= features.size())
        return "nothing";
    const Feature& f = features[i];
    return f.name + (f.kind == 'M' ? "()" : "") + (f.kind == 'R' ? " -> " + f.ref : "") + (f.key ? " key" : "") +
           (f.local ? " (declared here)" : "");
}

// The positions at which two feature lists differ, or an empty string.
std::string differences(const std::vector<Feature>& expected, const std::vector<Feature>& actual) {
    std::string out;
    for (size_t i = 0; i < std::max(expected.size(), actual.size()); i++) {
        std::string e = describe(expected, i), a = describe(actual, i);
        if (e != a)
            out += "  feature " + std::to_string(i) + ": expected " + e + ", found " + a + "\n";
    }
    return out;
}

}  // namespace

TEST(SchemaInputs, RepositoryHoldsWhatTheMofClassesDeclare) {
    const char* src = std::getenv("TVRN_SOURCE_DIR");
    std::string tavrin_mof = std::string(src ? src : TVRN_PROJECT_SOURCE_DIR) + "/schema/tavrin.mof";
    const char* cim_mof = std::getenv("TVRN_CIM_SCHEMA_MOF");
    if (!cim_mof || !*cim_mof)
        cim_mof = TVRN_CIM_SCHEMA_MOF;
    bool have_cim = std::ifstream(cim_mof).good();

    std::vector<Class> classes;
    try {
        if (have_cim)
            classes = read_mof(cim_mof);
        for (Class& c : read_mof(tavrin_mof))
            classes.push_back(c);
    } catch (const std::exception& e) {
        FAIL() << e.what();
    }

    // The same classes, by exact name; without the DMTF classes, the module's own.
    std::map<std::string, const Class*> decls;
    std::set<std::string> declared, held;
    auto checked = [&](const std::string& name) { return have_cim || name.compare(0, 7, "TAVRIN_") == 0; };
    for (const Class& c : classes) {
        EXPECT_TRUE(decls.emplace(c.name, &c).second) << c.name << " is declared twice";
        if (checked(c.name))
            declared.insert(c.name);
    }
    std::map<std::string, const Meta_Class*> repository;
    for (size_t i = 0; i < __meta_repository.num_meta_classes; i++) {
        const Meta_Class* mc = __meta_repository.meta_classes[i];
        repository[mc->name] = mc;
        if (checked(mc->name))
            held.insert(mc->name);
    }
    EXPECT_EQ(declared, held) << "declared (left) and in the repository (right)";

    Flattener flattener(decls, repository, !have_cim);
    for (const auto& d : decls) {
        auto r = repository.find(d.first);
        if (r == repository.end())
            continue;
        SCOPED_TRACE(d.first);
        const Class& expected = flattener.flatten(d.first);
        Class actual = from_repository(r->second);
        EXPECT_EQ(actual.super, expected.super);
        EXPECT_EQ(actual.association, expected.association);
        EXPECT_EQ(actual.indication, expected.indication);
        std::string diff = differences(expected.features, actual.features);
        EXPECT_TRUE(diff.empty()) << expected.features.size() << " features expected, "
                                  << actual.features.size() << " found\n" << diff;
        EXPECT_EQ(r->second->num_keys,
                  size_t(std::count_if(expected.features.begin(), expected.features.end(),
                                       [](const Feature& f) { return f.key; })));
    }

    if (!have_cim)
        GTEST_SKIP() << "DMTF classes not found at " << cim_mof
                     << " (set TVRN_CIM_SCHEMA_MOF): only the TAVRIN_* classes were checked against "
                        "tavrin.mof, with the features they inherit from CIM_* classes taken from "
                        "the repository";
}
