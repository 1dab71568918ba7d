// The repository against the MOF classes it is made from, read here by a small
// reader of its own so that a fault shared by the generator and its output
// cannot hide: every class, its superclass, its features in order with their
// kinds, keys and referenced classes, and each method's return type and
// parameters.
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

#include "framework/Type_Info.h"
#include "schema/Repository.h"

using namespace CPTA;

namespace {

bool same_word(const std::string& a, const char* b) {
    return strcasecmp(a.c_str(), b) == 0;
}

struct Feature {
    std::string name;
    char kind;  // 'P' property, 'R' reference, 'M' method
    bool key;
    std::string ref;             // referenced class of a reference ("Instance": any class)
    bool local;                  // declared or redeclared by the class itself
    std::string signature = "";  // of a method: "type(in out type[] Name, ...)"
};

// A class as declared (its own features), or with everything it inherits.
struct Class {
    std::string name, super;
    bool association = false, indication = false;
    std::vector<Feature> features;
};

// Reader for the MOF the class files use: qualifier lists, class declarations
// with an optional superclass, properties (arrays and defaults), references,
// methods with their parameters, and comments. A quoted string is one token
// that keeps its opening quote, so that it never reads as punctuation.
class Mof_Reader {
public:
    std::vector<Class> classes;

    explicit Mof_Reader(const std::string& path) : path_(path) {
        std::ifstream in(path);
        if (!in)
            fail("cannot be read");
        std::stringstream text;
        text << in.rdbuf();
        tokenize(text.str());
        while (pos_ < tokens_.size())
            classes.push_back(read_class());
    }

private:
    typedef std::map<std::string, std::string> Qualifiers;  // lower-case name: its value

    [[noreturn]] void fail(const std::string& what) const {
        throw std::runtime_error(path_ + ": " + what + " (token " + std::to_string(pos_) + ")");
    }

    static bool name_char(char c) {
        return std::isalnum((unsigned char)c) || std::strchr("_.+-", c);
    }

    void tokenize(const std::string& s) {
        for (size_t i = 0; i < s.size();) {
            char c = s[i];
            if (std::isspace((unsigned char)c)) {
                i++;
            } else if (s.compare(i, 2, "//") == 0) {
                i = s.find('\n', i);
            } else if (s.compare(i, 2, "/*") == 0) {
                if ((i = s.find("*/", i + 2)) == std::string::npos)
                    fail("unterminated comment");
                i += 2;
            } else if (c == '"') {
                std::string text = "\"";
                for (i++; i < s.size() && s[i] != '"'; i++)
                    text += s[i] == '\\' && i + 1 < s.size() ? s[++i] : s[i];
                if (i++ >= s.size())
                    fail("unterminated string");
                tokens_.push_back(text);
            } else if (name_char(c)) {
                size_t start = i;
                while (i < s.size() && name_char(s[i]))
                    i++;
                tokens_.push_back(s.substr(start, i - start));
            } else if (std::strchr("[](){},;:=", c)) {
                tokens_.push_back(std::string(1, c));
                i++;
            } else {
                fail(std::string("unexpected character '") + c + "'");
            }
        }
    }

    const std::string& next() {
        if (pos_ >= tokens_.size())
            fail("unexpected end of file");
        return tokens_[pos_++];
    }
    bool at(const char* text) const {
        return pos_ < tokens_.size() && same_word(tokens_[pos_], text);
    }
    // Reads `text` if it comes next.
    bool take(const char* text) { return at(text) && (next(), true); }
    void expect(const char* text) {
        if (!take(text))
            fail(std::string("expected '") + text + "', found '" + next() + "'");
    }
    std::string word() {
        const std::string& t = next();
        if (!(std::isalpha((unsigned char)t[0]) || t[0] == '_'))
            fail("expected a name, found '" + t + "'");
        return t;
    }
    // Skips to the bracket that closes the one just read and returns the
    // first token in between, unquoted (the value of a qualifier).
    std::string skip_to() {
        std::string first;
        for (int depth = 1;;) {
            const std::string& t = next();
            char p = t.size() == 1 ? t[0] : 0;
            if (p && std::strchr("([{", p)) {
                depth++;
            } else if (p && std::strchr(")]}", p) && --depth == 0) {
                return first;
            } else if (first.empty()) {
                first = t[0] == '"' ? t.substr(1) : t;
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
            std::transform(name.begin(), name.end(), name.begin(), ::tolower);
            q[name] = take("(") ? skip_to() : std::string();
        } while (take(","));
        expect("]");
        return q;
    }

    static bool has(const Qualifiers& q, const char* name) {
        return q.count(name) && !same_word(q.at(name), "false");
    }

    // [quals] type [REF] Name ["[" [N] "]"], as a property, reference or parameter.
    Feature read_typed_name() {
        Qualifiers q = read_qualifiers();
        std::string type = word();
        bool ref = take("REF");
        Feature f{word(), 'P', has(q, "key"), "", true, type};
        if (take("["))
            skip_to();
        if (ref)
            f.kind = 'R', f.ref = type;
        else if (q.count("embeddedinstance"))
            f.kind = 'R', f.ref = q.at("embeddedinstance");
        else if (has(q, "embeddedobject"))
            f.kind = 'R', f.ref = "Instance";
        return f;
    }

    // Parameters up to the closing ")": an [OUT] parameter is an input too
    // unless IN(false).
    std::string read_parameters() {
        std::string out;
        while (!take(")")) {
            Qualifiers q = read_qualifiers();
            const bool in = !q.count("in") || has(q, "in"), output = has(q, "out");
            std::string type = word();
            if (take("REF"))
                type += " REF";
            else if (q.count("embeddedinstance"))
                type = q.at("embeddedinstance") + " embedded";
            else if (has(q, "embeddedobject"))
                type = "Instance embedded";
            const std::string name = word();
            const bool array = take("[") && (skip_to(), true);
            out += std::string(out.empty() ? "" : ", ") + (in ? "in " : "") +
                   (output ? "out " : "") + type + (array ? "[] " : " ") + name;
            take(",");
        }
        return out;
    }

    Class read_class() {
        Class c;
        Qualifiers q = read_qualifiers();
        c.association = has(q, "association");
        c.indication = has(q, "indication");
        expect("class");
        c.name = word();
        if (take(":"))
            c.super = word();
        expect("{");
        while (!take("}")) {
            Feature f = read_typed_name();
            if (take("(")) {
                f.kind = 'M', f.key = false, f.ref.clear();
                f.signature += "(" + read_parameters() + ")";
            } else if (take("=")) {
                while (!at(";"))
                    next();
            }
            expect(";");
            if (f.kind != 'M')
                f.signature.clear();
            c.features.push_back(f);
        }
        expect(";");
        return c;
    }

    std::string path_;
    std::vector<std::string> tokens_;
    size_t pos_ = 0;
};

// "type(in out type[] Name, ...)" of a method record: parameters, then the
// return value.
std::string signature(const Meta_Method* m) {
    std::string s = std::string(type_name(m->return_type)) + "(";
    for (size_t k = 0; k + 1 < m->num_meta_features; k++) {
        const Meta_Feature* f = m->meta_features[k];
        s += std::string(k ? ", " : "") + (f->flags & FLAG_IN ? "in " : "") +
             (f->flags & FLAG_OUT ? "out " : "");
        bool array;
        if (f->flags & FLAG_REFERENCE) {
            auto r = reinterpret_cast<const Meta_Reference*>(f);
            s +=
                std::string(r->meta_class->name) +
                (f->flags & (FLAG_EMBEDDED_INSTANCE | FLAG_EMBEDDED_OBJECT) ? " embedded" : " REF");
            array = r->subscript != 0;
        } else {
            auto p = reinterpret_cast<const Meta_Property*>(f);
            s += type_name(p->type);
            array = p->subscript != 0;
        }
        s += std::string(array ? "[] " : " ") + f->name;
    }
    return s + ")";
}

Class from_repository(const Meta_Class* mc) {
    Class c;
    c.super = mc->super_meta_class ? mc->super_meta_class->name : "";
    c.association = mc->flags & FLAG_ASSOCIATION;
    c.indication = mc->flags & FLAG_INDICATION;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        uint32 kind = mf->flags & (FLAG_PROPERTY | FLAG_REFERENCE | FLAG_METHOD);
        Feature f{mf->name,
                  kind == FLAG_PROPERTY ? 'P'
                  : kind == FLAG_METHOD ? 'M'
                                        : '?',
                  (mf->flags & FLAG_KEY) != 0, "", mc->locals[i]};
        if (kind == FLAG_REFERENCE) {
            const Meta_Class* target = reinterpret_cast<const Meta_Reference*>(mf)->meta_class;
            f.kind = 'R', f.ref = target ? target->name : "(none)";
        }
        if (kind == FLAG_METHOD)
            f.signature = signature(reinterpret_cast<const Meta_Method*>(mf));
        c.features.push_back(f);
    }
    return c;
}

// Classes as the inputs determine them: the features of the superclass chain,
// root first, with each class's own declarations merged in (properties and
// references first, then methods). Without the DMTF classes, a superclass
// that no input declares is taken from the repository, so that the module
// classes' own declarations are still checked.
struct Inputs {
    std::map<std::string, const Class*> decls;
    std::map<std::string, const Meta_Class*> repository;
    bool inherit_from_repository;
    std::map<std::string, Class> flat;

    const Class& flatten(const std::string& name) {
        auto done = flat.find(name);
        if (done != flat.end())
            return done->second;
        const Class& decl = *decls.at(name);
        Class c;
        if (decls.count(decl.super))
            c = flatten(decl.super);
        else if (inherit_from_repository && repository.count(decl.super))
            c = from_repository(repository.at(decl.super));
        else if (!decl.super.empty())
            ADD_FAILURE() << name << ": superclass " << decl.super << " is declared nowhere";
        c.super = decl.super;
        c.association |= decl.association;
        c.indication |= decl.indication;
        for (Feature& f : c.features)
            f.local = false;
        for (bool methods : {false, true}) {
            for (const Feature& d : decl.features) {
                if ((d.kind == 'M') != methods)
                    continue;
                auto old = std::find_if(
                    c.features.begin(), c.features.end(),
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
        return flat[name] = c;
    }
};

std::string describe(const std::vector<Feature>& features, size_t i) {
    if (i >= features.size())
        return "nothing";
    const Feature& f = features[i];
    return f.name + (f.kind == 'M' ? " " + f.signature : "") +
           (f.kind == 'R' ? " -> " + f.ref : "") + (f.key ? " key" : "") +
           (f.local ? " (declared here)" : "");
}

}  // namespace

TEST(SchemaInputs, RepositoryHoldsWhatTheMofClassesDeclare) {
    const char* src = std::getenv("TVRN_SOURCE_DIR");
    const std::string schema = std::string(src ? src : TVRN_PROJECT_SOURCE_DIR) + "/schema/";
    std::string tavrin_mof = schema + "tavrin.mof";
    const char* env_mof = std::getenv("TVRN_CIM_SCHEMA_MOF");
    std::string cim_mof = env_mof && *env_mof ? env_mof : TVRN_CIM_SCHEMA_MOF;
    // Without the DMTF file, the DMTF classes as the module installs them.
    if (!std::ifstream(cim_mof).good())
        cim_mof = schema + "generated/dmtf_classes.mof";
    bool have_cim = std::ifstream(cim_mof).good();

    std::vector<Class> classes;
    try {
        if (have_cim)
            classes = Mof_Reader(cim_mof).classes;
        for (Class& c : Mof_Reader(tavrin_mof).classes)
            classes.push_back(c);
    } catch (const std::exception& e) {
        FAIL() << e.what();
    }

    // The same classes, by exact name; without the DMTF classes, the module's own.
    Inputs inputs{{}, {}, !have_cim, {}};
    std::set<std::string> declared, held;
    auto checked = [&](const std::string& name) {
        return have_cim || name.compare(0, 7, "TAVRIN_") == 0;
    };
    for (const Class& c : classes) {
        EXPECT_TRUE(inputs.decls.emplace(c.name, &c).second) << c.name << " is declared twice";
        if (checked(c.name))
            declared.insert(c.name);
    }
    for (size_t i = 0; i < schema_repository.num_meta_classes; i++) {
        const Meta_Class* mc = schema_repository.meta_classes[i];
        inputs.repository[mc->name] = mc;
        if (checked(mc->name))
            held.insert(mc->name);
    }
    EXPECT_EQ(declared, held) << "declared (left) and in the repository (right)";

    for (const auto& d : inputs.decls) {
        auto r = inputs.repository.find(d.first);
        if (r == inputs.repository.end())
            continue;
        SCOPED_TRACE(d.first);
        const Class& expected = inputs.flatten(d.first);
        Class actual = from_repository(r->second);
        EXPECT_EQ(actual.super, expected.super);
        EXPECT_EQ(actual.association, expected.association);
        EXPECT_EQ(actual.indication, expected.indication);
        std::string diff;
        for (size_t i = 0; i < std::max(expected.features.size(), actual.features.size()); i++) {
            std::string e = describe(expected.features, i), a = describe(actual.features, i);
            if (e != a)
                diff +=
                    "  feature " + std::to_string(i) + ": expected " + e + ", found " + a + "\n";
        }
        EXPECT_TRUE(diff.empty()) << diff;
        EXPECT_EQ(r->second->num_keys,
                  size_t(std::count_if(expected.features.begin(), expected.features.end(),
                                       [](const Feature& f) { return f.key; })));
    }

    if (!have_cim)
        GTEST_SKIP()
            << "DMTF classes not found at " << cim_mof
            << " (set TVRN_CIM_SCHEMA_MOF): only the TAVRIN_* classes were checked against "
               "tavrin.mof, with the features they inherit from CIM_* classes taken from "
               "the repository";
}
