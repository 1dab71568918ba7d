// What the host does with the class repository it is given, as a CIM server
// does with its own: new instances start with the class's defaults, and
// method arguments reach the provider as the declared parameters take them.
#include <limits>

#include "host/internal.h"

namespace tvrnhost {
namespace detail {

namespace {

template <class T>
const T* named(const std::vector<T>& items, std::string_view name) {
    for (const auto& item : items)
        if (equalsIgnoreCase(item.name, name))
            return &item;
    return nullptr;
}

template <class T>
bool fits(const Value& v) {
    using L = std::numeric_limits<T>;
    if (isSignedInteger(v.type())) {
        const std::int64_t x = v.asSint();
        return x >= 0 ? std::uint64_t(x) <= std::uint64_t(L::max())
                      : L::is_signed && x >= std::int64_t(L::min());
    }
    return v.asUint() <= std::uint64_t(L::max());
}

bool integerFits(const Value& v, Type t) {
    switch (t) {
        case Type::Uint8: return fits<std::uint8_t>(v);
        case Type::Sint8: return fits<std::int8_t>(v);
        case Type::Uint16: return fits<std::uint16_t>(v);
        case Type::Sint16: return fits<std::int16_t>(v);
        case Type::Uint32: return fits<std::uint32_t>(v);
        case Type::Sint32: return fits<std::int32_t>(v);
        case Type::Uint64: return fits<std::uint64_t>(v);
        case Type::Sint64: return fits<std::int64_t>(v);
        default: return false;
    }
}

// A scalar as type t: an integer as another integer type that holds it or
// as a real; text (what a CIM-XML client sends for any type) read as t.
std::optional<Value> scalarAs(const Value& v, Type t) {
    if (v.type() == t)
        return v;
    if (v.isNull())
        return Value::null(t);
    if (isInteger(v.type())) {
        const double real = isSignedInteger(v.type()) ? double(v.asSint()) : double(v.asUint());
        if (isInteger(t) && integerFits(v, t))
            return Value::integer(t, v.asUint());
        if (t == Type::Real32)
            return Value::real32(float(real));
        if (t == Type::Real64)
            return Value::real64(real);
        return std::nullopt;
    }
    if (v.type() != Type::String)
        return std::nullopt;
    const std::string& text = v.asString();
    try {
        switch (t) {
            case Type::DateTime: {
                const auto dt = DateTime::parse(text);
                return dt ? std::optional<Value>(Value::dateTime(*dt)) : std::nullopt;
            }
            case Type::Reference: return Value::reference(ObjectPath::parse(text));
            case Type::Instance: return std::nullopt;
            default: return parseValue(text, t);
        }
    } catch (const ParseError&) {
        return std::nullopt;
    }
}

std::optional<Value> as(const Value& v, Type t, bool array) {
    if (v.type() == t && v.isArray() == array)
        return v;
    if (v.isNull())
        return Value::null(t, array);
    if (!array || !v.isArray())
        return array || v.isArray() ? std::nullopt : scalarAs(v, t);
    std::vector<Value> elements;
    for (const auto& e : v.elements()) {
        auto x = scalarAs(e, t);
        if (!x)
            return std::nullopt;
        elements.push_back(std::move(*x));
    }
    return Value::array(t, std::move(elements));
}

}  // namespace

Instance HostImpl::newInstance(const ObjectPath& path) const {
    Instance inst(path);
    const bool defaults = opts.classes && opts.classDefaults;
    if (const ClassInfo* ci = defaults ? opts.classes->find(path.className()) : nullptr)
        for (const auto& p : ci->properties)
            inst.set(p.name, p.value);
    return inst;
}

Status HostImpl::typedArguments(const ObjectPath& target, const std::string& method,
                                PropertyVector& args) const {
    const ClassInfo* ci = opts.classes ? opts.classes->find(target.className()) : nullptr;
    const MethodInfo* m = ci ? named(ci->methods, method) : nullptr;
    if (!m)
        return Status{};  // the provider answers for what the host does not know
    for (auto& arg : args) {
        const ParameterInfo* p = named(m->parameters, arg.name);
        if (!p)
            continue;
        auto typed = as(arg.value, p->type, p->array);
        if (!typed)
            return Status{CMPI_RC_ERR_INVALID_PARAMETER, arg.name + ": " + arg.value.toString() +
                                                             " is not a " + typeName(p->type) +
                                                             (p->array ? " array" : "")};
        arg.value = std::move(*typed);
    }
    return Status{};
}

}  // namespace detail
}  // namespace tvrnhost
