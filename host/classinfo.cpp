#include "host/classinfo.h"

#include <cstring>

#include "framework/Meta_Lookup.h"
#include "framework/Type_Info.h"
#include "host/mof.h"
#include "schema/Repository.h"

namespace tvrnhost {
namespace classinfo {

using namespace CPTA;

namespace {

// Flags that tell what a meta record is rather than qualify it.
const uint32 KIND_FLAGS = FLAG_PROPERTY | FLAG_REFERENCE | FLAG_METHOD | FLAG_CLASS;

// "[A, B (x), C] " from the flags, or nothing. `embedded` names the class of
// an EmbeddedInstance; a parameter always states In.
std::string qualifiers(uint32 flags, const Meta_Class* embedded = nullptr, bool parameter = false) {
    std::string s;
    for (int bit = 0; bit < 32; ++bit) {
        const uint32 flag = 1u << bit;
        std::string q;
        if (flags & flag & ~KIND_FLAGS) {
            q = flag_names[bit];
            if (flag == FLAG_EMBEDDED_INSTANCE && embedded)
                q += std::string(" (\"") + embedded->name + "\")";
        } else if (flag == FLAG_IN && parameter) {
            q = std::string(flag_names[bit]) + " (false)";
        } else {
            continue;
        }
        s += (s.empty() ? "[" : ", ") + q;
    }
    return s.empty() ? s : s + "] ";
}

std::string arrayMark(sint16 subscript) {
    if (subscript == 0)
        return "";
    return subscript < 0 ? "[]" : "[" + std::to_string(subscript) + "]";
}

template <class T>
T load(const void* p) {
    T v;
    std::memcpy(&v, p, sizeof v);
    return v;
}

// The value of a default stored as a T of the property's type (a string or
// date-time as its C string).
Value storedValue(int type, const void* p) {
    switch (type) {
        case BOOLEAN: return Value::boolean(load<boolean>(p));
        case UINT8: return Value::uint8(load<uint8>(p));
        case SINT8: return Value::sint8(load<sint8>(p));
        case UINT16: return Value::uint16(load<uint16>(p));
        case SINT16: return Value::sint16(load<sint16>(p));
        case UINT32: return Value::uint32(load<uint32>(p));
        case SINT32: return Value::sint32(load<sint32>(p));
        case UINT64: return Value::uint64(load<uint64>(p));
        case SINT64: return Value::sint64(load<sint64>(p));
        case REAL32: return Value::real32(load<real32>(p));
        case REAL64: return Value::real64(load<real64>(p));
        case CHAR16: return Value::char16(load<char16>(p).code);
        case STRING: return Value::string(load<const char*>(p));
        case DATETIME: {
            const char* text = load<const char*>(p);
            const auto dt = DateTime::parse(text);
            return dt ? Value::dateTime(*dt) : Value::null(Type::DateTime);
        }
    }
    return Value();
}

size_t storedSize(int type) {
    return type == STRING || type == DATETIME ? sizeof(const char*) : type_size(type);
}

// The property's default; a null value of its type when it has none.
Value defaultOf(const Meta_Property* mp) {
    const void* value = mp->value;
    const auto type = typeFromName(type_name(mp->type) ? type_name(mp->type) : "");
    if (!type)
        return Value();
    if (!value)
        return Value::null(*type, mp->subscript != 0);
    if (!mp->subscript)
        return storedValue(mp->type, value);
    // Every Meta_Value_Array<T> has the same layout: elements, then count.
    const auto* array = static_cast<const Meta_Value_Array<unsigned char>*>(value);
    std::vector<Value> elements;
    for (size_t i = 0; i < array->num_elements; ++i)
        elements.push_back(storedValue(mp->type, array->elements + i * storedSize(mp->type)));
    return Value::array(*type, elements);
}

// The type of a reference slot: an embedded instance or a path.
Type referenceType(const Meta_Feature* mf) {
    return mf->flags & (FLAG_EMBEDDED_INSTANCE | FLAG_EMBEDDED_OBJECT) ? Type::Instance
                                                                       : Type::Reference;
}

const char* typeName(int type) {
    const char* name = type_name(type);
    return name ? name : "void";
}

// A property, reference or parameter: "[qualifiers] type Name[] = default".
std::string declaration(const Meta_Feature* mf, bool parameter) {
    if (mf->flags & FLAG_REFERENCE) {
        const auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
        const char* cls = mr->meta_class ? mr->meta_class->name : "CIM_ManagedElement";
        const std::string type = mf->flags & (FLAG_EMBEDDED_INSTANCE | FLAG_EMBEDDED_OBJECT)
                                     ? std::string("string")
                                     : std::string(cls) + " REF";
        return qualifiers(mf->flags, mr->meta_class, parameter) + type + ' ' + mf->name +
               arrayMark(mr->subscript);
    }
    const auto* mp = reinterpret_cast<const Meta_Property*>(mf);
    std::string s = qualifiers(mf->flags, nullptr, parameter) + typeName(mp->type) + ' ' +
                    mf->name + arrayMark(mp->subscript);
    if (mp->value)
        s += " = " + mofValue(defaultOf(mp));
    return s;
}

// "[qualifiers] type Name([In] type A, ...)"; the return value is the
// parameter named return_value.
std::string methodDeclaration(const Meta_Method* mm) {
    std::string params;
    for (size_t i = 0; i < mm->num_meta_features; ++i) {
        const Meta_Feature* p = mm->meta_features[i];
        if (std::strcmp(p->name, "return_value") == 0)
            continue;
        params += (params.empty() ? "" : ", ") + declaration(p, true);
    }
    return qualifiers(mm->flags) + typeName(mm->return_type) + ' ' + mm->name + '(' + params + ')';
}

}  // namespace

std::vector<std::string> classNames(const Meta_Repository& repository) {
    std::vector<std::string> names;
    for (size_t i = 0; i < repository.num_meta_classes; ++i)
        names.push_back(repository.meta_classes[i]->name);
    return names;
}

std::string classMof(const Meta_Class& mc) {
    std::string s = qualifiers(mc.flags);
    if (!s.empty())
        s.back() = '\n';
    s += std::string("class ") + mc.name;
    if (const Meta_Class* super = super_meta_class_of(&mc))
        s += std::string(" : ") + super->name;
    s += " {\n";
    for (size_t i = 0; i < mc.num_meta_features; ++i) {
        const Meta_Feature* mf = mc.meta_features[i];
        s += "    ";
        s += mf->flags & FLAG_METHOD ? methodDeclaration(reinterpret_cast<const Meta_Method*>(mf))
                                     : declaration(mf, false);
        s += ";\n";
    }
    return s + "};\n";
}

ClassInfo classInfo(const Meta_Class& mc) {
    ClassInfo ci;
    ci.name = mc.name;
    if (const Meta_Class* super = super_meta_class_of(&mc))
        ci.superclass = super->name;
    for (size_t i = 0; i < mc.num_meta_features; ++i) {
        const Meta_Feature* mf = mc.meta_features[i];
        if (mf->flags & FLAG_PROPERTY) {
            ci.properties.push_back(
                {mf->name, defaultOf(reinterpret_cast<const Meta_Property*>(mf))});
        } else if (mf->flags & FLAG_REFERENCE) {
            const auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
            ci.properties.push_back({mf->name, Value::null(referenceType(mf), mr->subscript != 0)});
        } else if (mf->flags & FLAG_METHOD) {
            const auto* mm = reinterpret_cast<const Meta_Method*>(mf);
            MethodInfo m{mm->name, {}};
            for (size_t j = 0; j < mm->num_meta_features; ++j) {
                const Meta_Feature* p = mm->meta_features[j];
                if (!(p->flags & FLAG_IN) || std::strcmp(p->name, "return_value") == 0)
                    continue;
                if (p->flags & FLAG_REFERENCE) {
                    const auto* r = reinterpret_cast<const Meta_Reference*>(p);
                    m.parameters.push_back({p->name, referenceType(p), r->subscript != 0});
                } else {
                    const auto* pp = reinterpret_cast<const Meta_Property*>(p);
                    const auto type = typeFromName(type_name(pp->type) ? type_name(pp->type) : "");
                    if (type)
                        m.parameters.push_back({p->name, *type, pp->subscript != 0});
                }
            }
            ci.methods.push_back(std::move(m));
        }
    }
    return ci;
}

RepositoryClasses::RepositoryClasses(const Meta_Repository& repository) {
    for (size_t i = 0; i < repository.num_meta_classes; ++i) {
        ClassInfo ci = classInfo(*repository.meta_classes[i]);
        std::string key = toLower(ci.name);
        classes_.emplace(std::move(key), std::move(ci));
    }
}

const ClassInfo* RepositoryClasses::find(std::string_view className) const {
    auto it = classes_.find(toLower(className));
    return it == classes_.end() ? nullptr : &it->second;
}

std::vector<std::string> RepositoryCatalog::classNames() const {
    return classinfo::classNames(repository_);
}

std::optional<std::string> RepositoryCatalog::classMof(const std::string& name) const {
    const Meta_Class* mc = find_meta_class(&repository_, name.c_str());
    if (!mc)
        return std::nullopt;
    return classinfo::classMof(*mc);
}

const cli::ClassCatalog& moduleCatalog() {
    static const RepositoryCatalog catalog(schema_repository);
    return catalog;
}

}  // namespace classinfo
}  // namespace tvrnhost
