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

bool same_word(const std::string& a, const char* b) {
    return strcasecmp(a.c_str(), b) == 0;
}

// ---------------------------------------------------------------------------
// Reader for the MOF the class files use: qualifier lists, class declarations
// with an optional superclass, properties (arrays and defaults), references,
// methods with their parameters, and comments.

struct Feature_Decl {
    std::string name;
    char kind;         // 'P' property, 'R' reference, 'M' method
    bool key;
    std::string ref;   // referenced class of a reference ("Instance": any class)
};

struct Class_Decl {
    std::string name, super;
    bool association = false, indication = false;
    std::vector<Feature_Decl> features;  // declaration order
};

struct Token {
    std::string text;
    bool quoted;
    int line;
};

class Mof_Reader {
public:
    Mof_Reader(const std::string& file, const std::string& text) : file_(file) {
        tokenize(text);
    }

    std::vector<Class_Decl> read() {
        std::vector<Class_Decl> classes;
        while (pos_ < tokens_.size())
            classes.push_back(read_class());
        return classes;
    }

private:
    typedef std::vector<std::pair<std::string, std::string>> Qualifiers;

    [[noreturn]] void fail(const std::string& what, int line) const {
        throw std::runtime_error(file_ + ":" + std::to_string(line) + ": " + what);
    }

    void tokenize(const std::string& s) {
        int line = 1;
        for (size_t i = 0; i < s.size();) {
            char c = s[i];
            if (c == '\n') {
                line++, i++;
            } else if (std::isspace((unsigned char)c)) {
                i++;
            } else if (s.compare(i, 2, "//") == 0) {
                i = s.find('\n', i);
                if (i == std::string::npos)
                    i = s.size();
            } else if (s.compare(i, 2, "/*") == 0) {
                size_t end = s.find("*/", i + 2);
                if (end == std::string::npos)
                    fail("unterminated comment", line);
                for (; i < end + 2; i++)
                    line += s[i] == '\n';
            } else if (c == '"') {
                std::string text;
                for (i++; i < s.size() && s[i] != '"'; i++) {
                    if (s[i] == '\\' && i + 1 < s.size())
                        i++;
                    text += s[i];
                }
                if (i++ >= s.size())
                    fail("unterminated string", line);
                tokens_.push_back({text, true, line});
            } else if (std::isalnum((unsigned char)c) || std::strchr("_.+-", c)) {
                size_t start = i;
                while (i < s.size() && (std::isalnum((unsigned char)s[i]) || std::strchr("_.+-", s[i])))
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
        if (!at("["))
            return q;
        next();
        do {
            std::string name = word();
            std::string value;
            if (at("(")) {
                next();
                value = skip_to(')');
            }
            q.emplace_back(name, value);
        } while (at(",") && (next(), true));
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
    Feature_Decl read_typed_name(const Qualifiers& q) {
        Feature_Decl f;
        std::string type = word();
        bool ref = at("REF") && (next(), true);
        f.name = word();
        if (at("[")) {
            next();
            skip_to(']');
        }
        f.kind = 'P';
        f.key = has(q, "Key");
        if (ref) {
            f.kind = 'R', f.ref = type;
        } else if (const std::string* c = find(q, "EmbeddedInstance")) {
            f.kind = 'R', f.ref = *c;
        } else if (has(q, "EmbeddedObject")) {
            f.kind = 'R', f.ref = "Instance";
        }
        return f;
    }

    Class_Decl read_class() {
        Class_Decl c;
        Qualifiers q = read_qualifiers();
        c.association = has(q, "Association");
        c.indication = has(q, "Indication");
        expect("class");
        c.name = word();
        if (at(":")) {
            next();
            c.super = word();
        }
        expect("{");
        while (!at("}")) {
            Feature_Decl f = read_typed_name(read_qualifiers());
            if (at("(")) {
                next();
                f.kind = 'M', f.key = false, f.ref.clear();
                while (!at(")")) {
                    read_typed_name(read_qualifiers());
                    if (!at(")"))
                        expect(",");
                }
                next();
            } else if (at("=")) {
                while (!at(";"))
                    next();
            }
            expect(";");
            c.features.push_back(f);
        }
        expect("}");
        expect(";");
        return c;
    }

    std::string file_;
    std::vector<Token> tokens_;
    size_t pos_ = 0;
};

std::vector<Class_Decl> read_mof(const std::string& path) {
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

struct Feature {
    std::string name;
    char kind;
    bool key;
    std::string ref;
    bool local;  // declared or redeclared by the class itself
};

struct Flat_Class {
    std::string super;
    bool association = false, indication = false;
    std::vector<Feature> features;
};

std::string describe(const Feature& f) {
    std::string s = f.name;
    if (f.kind == 'M')
        s += "()";
    if (f.kind == 'R')
        s += " -> " + f.ref;
    if (f.key)
        s += " key";
    if (f.local)
        s += " (declared here)";
    return s;
}

const uint32 KIND_BITS = FLAG_PROPERTY | FLAG_REFERENCE | FLAG_METHOD;

Flat_Class from_repository(const Meta_Class* mc) {
    Flat_Class c;
    c.super = mc->super_meta_class ? mc->super_meta_class->name : "";
    c.association = mc->flags & FLAG_ASSOCIATION;
    c.indication = mc->flags & FLAG_INDICATION;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        Feature f{mf->name, '?', (mf->flags & FLAG_KEY) != 0, "", mc->locals[i]};
        switch (mf->flags & KIND_BITS) {
        case FLAG_PROPERTY: f.kind = 'P'; break;
        case FLAG_METHOD: f.kind = 'M'; break;
        case FLAG_REFERENCE: {
            f.kind = 'R';
            const Meta_Class* target = reinterpret_cast<const Meta_Reference*>(mf)->meta_class;
            f.ref = target ? target->name : "(none)";
            break;
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
    Flattener(const std::map<std::string, const Class_Decl*>& decls,
              const std::map<std::string, const Meta_Class*>& repository, bool inherit_from_repository)
        : decls_(decls), repository_(repository), inherit_from_repository_(inherit_from_repository) {}

    const Flat_Class& flatten(const std::string& name) {
        auto done = flat_.find(name);
        if (done != flat_.end())
            return done->second;
        const Class_Decl& decl = *decls_.at(name);
        Flat_Class c;
        if (!decl.super.empty())
            c = inherited(decl);
        c.super = decl.super;
        c.association |= decl.association;
        c.indication |= decl.indication;
        for (Feature& f : c.features)
            f.local = false;
        for (int methods = 0; methods < 2; methods++) {
            for (const Feature_Decl& d : decl.features) {
                if ((d.kind == 'M') != bool(methods))
                    continue;
                Feature own{d.name, d.kind, d.key, d.ref, true};
                Feature* old = nullptr;
                for (Feature& f : c.features)
                    if (same_word(f.name, d.name.c_str()))
                        old = &f;
                if (old) {
                    own.key |= old->key;
                    *old = own;
                } else {
                    c.features.push_back(own);
                }
            }
        }
        return flat_[name] = c;
    }

private:
    Flat_Class inherited(const Class_Decl& decl) {
        if (decls_.count(decl.super))
            return flatten(decl.super);
        auto mc = repository_.find(decl.super);
        if (inherit_from_repository_ && mc != repository_.end())
            return from_repository(mc->second);
        ADD_FAILURE() << decl.name << ": superclass " << decl.super << " is declared nowhere";
        return Flat_Class();
    }

    const std::map<std::string, const Class_Decl*>& decls_;
    const std::map<std::string, const Meta_Class*>& repository_;
    bool inherit_from_repository_;
    std::map<std::string, Flat_Class> flat_;
};

// The positions at which two feature lists differ, or an empty string.
std::string differences(const std::vector<Feature>& expected, const std::vector<Feature>& actual) {
    std::string out;
    for (size_t i = 0; i < std::max(expected.size(), actual.size()); i++) {
        std::string e = i < expected.size() ? describe(expected[i]) : "nothing";
        std::string a = i < actual.size() ? describe(actual[i]) : "nothing";
        if (e != a)
            out += "  feature " + std::to_string(i) + ": expected " + e + ", found " + a + "\n";
    }
    return out;
}

std::string join(const std::set<std::string>& names) {
    std::string out;
    for (const std::string& n : names)
        out += (out.empty() ? "" : ", ") + n;
    return out.empty() ? "none" : out;
}

}  // namespace

TEST(SchemaInputs, RepositoryHoldsWhatTheMofClassesDeclare) {
    const char* src = std::getenv("TVRN_SOURCE_DIR");
    std::string tavrin_mof = std::string(src ? src : TVRN_PROJECT_SOURCE_DIR) + "/schema/tavrin.mof";
    const char* cim_mof = std::getenv("TVRN_CIM_SCHEMA_MOF");
    if (!cim_mof || !*cim_mof)
        cim_mof = TVRN_CIM_SCHEMA_MOF;
    bool have_cim = std::ifstream(cim_mof).good();

    std::vector<Class_Decl> classes;
    try {
        if (have_cim)
            classes = read_mof(cim_mof);
        for (Class_Decl& c : read_mof(tavrin_mof))
            classes.push_back(c);
    } catch (const std::exception& e) {
        FAIL() << e.what();
    }

    std::map<std::string, const Class_Decl*> decls;
    for (const Class_Decl& c : classes)
        EXPECT_TRUE(decls.emplace(c.name, &c).second) << c.name << " is declared twice";
    std::map<std::string, const Meta_Class*> repository;
    for (size_t i = 0; i < __meta_repository.num_meta_classes; i++) {
        const Meta_Class* mc = __meta_repository.meta_classes[i];
        repository[mc->name] = mc;
    }

    // The same classes, by exact name; without the DMTF classes, the module's own.
    std::set<std::string> missing, extra;
    for (const auto& d : decls)
        if (!repository.count(d.first))
            missing.insert(d.first);
    for (const auto& r : repository)
        if (!decls.count(r.first) && (have_cim || std::strncmp(r.first.c_str(), "TAVRIN_", 7) == 0))
            extra.insert(r.first);
    EXPECT_TRUE(missing.empty() && extra.empty())
        << "declared but not in the repository: " << join(missing)
        << "\nin the repository but declared nowhere: " << join(extra);

    Flattener flattener(decls, repository, !have_cim);
    for (const auto& d : decls) {
        auto r = repository.find(d.first);
        if (r == repository.end())
            continue;
        SCOPED_TRACE(d.first);
        const Meta_Class* mc = r->second;
        const Flat_Class& expected = flattener.flatten(d.first);
        Flat_Class actual = from_repository(mc);

        EXPECT_EQ(actual.super, expected.super);
        EXPECT_EQ(actual.association, expected.association);
        EXPECT_EQ(actual.indication, expected.indication);
        std::string diff = differences(expected.features, actual.features);
        EXPECT_TRUE(diff.empty()) << expected.features.size() << " features expected, "
                                  << actual.features.size() << " found\n" << diff;
        size_t keys = 0;
        for (const Feature& f : expected.features)
            keys += f.key;
        EXPECT_EQ(mc->num_keys, keys);
    }

    if (!have_cim)
        GTEST_SKIP() << "DMTF classes not found at " << cim_mof
                     << " (set TVRN_CIM_SCHEMA_MOF): only the TAVRIN_* classes were checked against "
                        "tavrin.mof, with the features they inherit from CIM_* classes taken from "
                        "the repository";
}
