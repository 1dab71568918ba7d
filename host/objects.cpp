// The encapsulated CMPI objects of the host (strings, arrays, instances,
// object paths, arguments, enumerations, date-times, contexts, results,
// select expressions), their memory arenas, and the conversions between CMPI
// data and host values.
#include <cstring>
#include <new>

#include "host/internal.h"

namespace tvrnhost {
namespace detail {

std::atomic<std::size_t> Encap::live{0};

// ---------------------------------------------------------------------------
// Arena
// ---------------------------------------------------------------------------
Arena::Arena() {
    head_.prev = head_.next = &head_;
}

Arena::~Arena() {
    freeAll();
}

void Arena::adopt(Node* n) {
    std::lock_guard<std::mutex> g(m_);
    n->owner = this;
    n->seq = nextSeq_++;
    n->prev = head_.prev;
    n->next = &head_;
    head_.prev->next = n;
    head_.prev = n;
}

void Arena::disown(Node* n) {
    std::lock_guard<std::mutex> g(m_);
    n->prev->next = n->next;
    n->next->prev = n->prev;
    n->prev = n->next = nullptr;
    n->owner = nullptr;
}

std::uint64_t Arena::lastSeq() {
    std::lock_guard<std::mutex> g(m_);
    return head_.prev == &head_ ? 0 : head_.prev->seq;
}

void Arena::freeAfter(std::uint64_t seq) {
    // Freeing a node may free its children (other arenas), never this one's
    // nodes, so unlink under the lock and delete outside it.
    for (;;) {
        Node* n;
        {
            std::lock_guard<std::mutex> g(m_);
            n = head_.prev;
            if (n == &head_ || n->seq <= seq)
                return;
            n->prev->next = &head_;
            head_.prev = n->prev;
            n->owner = nullptr;
        }
        delete n;
    }
}

void Arena::freeAll() {
    freeAfter(0);
}

void destroy(Node* n) {
    if (n->owner)
        n->owner->disown(n);
    delete n;
}

ThreadState& threadState() {
    thread_local ThreadState state;
    return state;
}

// ---------------------------------------------------------------------------
// Conversions
// ---------------------------------------------------------------------------
namespace {

struct TypePair {
    Type host;
    CMPIType cmpi;
};
const TypePair kTypePairs[] = {
    {Type::Boolean, CMPI_boolean},   {Type::Uint8, CMPI_uint8},       {Type::Sint8, CMPI_sint8},
    {Type::Uint16, CMPI_uint16},     {Type::Sint16, CMPI_sint16},     {Type::Uint32, CMPI_uint32},
    {Type::Sint32, CMPI_sint32},     {Type::Uint64, CMPI_uint64},     {Type::Sint64, CMPI_sint64},
    {Type::Real32, CMPI_real32},     {Type::Real64, CMPI_real64},     {Type::Char16, CMPI_char16},
    {Type::String, CMPI_string},     {Type::DateTime, CMPI_dateTime}, {Type::Reference, CMPI_ref},
    {Type::Instance, CMPI_instance},
};

// Providers commonly pass the address of a plain variable of the member's
// type (CMSetProperty(i, "N", &u16, CMPI_uint16)) rather than of a whole
// CMPIValue, so only that many bytes are read, without alignment demands.
template <class T>
T read(const void* p) {
    T v;
    std::memcpy(&v, p, sizeof v);
    return v;
}

std::uint64_t integerBits(const void* v, Type t) {
    switch (t) {
        case Type::Uint8: return read<CMPIUint8>(v);
        case Type::Sint8:
            return static_cast<std::uint64_t>(static_cast<std::int64_t>(read<CMPISint8>(v)));
        case Type::Uint16: return read<CMPIUint16>(v);
        case Type::Sint16:
            return static_cast<std::uint64_t>(static_cast<std::int64_t>(read<CMPISint16>(v)));
        case Type::Uint32: return read<CMPIUint32>(v);
        case Type::Sint32:
            return static_cast<std::uint64_t>(static_cast<std::int64_t>(read<CMPISint32>(v)));
        case Type::Uint64: return read<CMPIUint64>(v);
        default: return static_cast<std::uint64_t>(read<CMPISint64>(v));
    }
}

void setIntegerBits(CMPIValue& v, Type t, std::uint64_t bits) {
    switch (t) {
        case Type::Uint8: v.uint8 = static_cast<CMPIUint8>(bits); break;
        case Type::Sint8: v.sint8 = static_cast<CMPISint8>(bits); break;
        case Type::Uint16: v.uint16 = static_cast<CMPIUint16>(bits); break;
        case Type::Sint16: v.sint16 = static_cast<CMPISint16>(bits); break;
        case Type::Uint32: v.uint32 = static_cast<CMPIUint32>(bits); break;
        case Type::Sint32: v.sint32 = static_cast<CMPISint32>(bits); break;
        case Type::Uint64: v.uint64 = bits; break;
        default: v.sint64 = static_cast<CMPISint64>(bits);
    }
}

CMPIrc scalarFromCMPI(const void* v, Type t, Value& out) {
    switch (t) {
        case Type::Boolean: out = Value::boolean(read<CMPIBoolean>(v) != 0); break;
        case Type::Real32: out = Value::real32(read<CMPIReal32>(v)); break;
        case Type::Real64: out = Value::real64(read<CMPIReal64>(v)); break;
        case Type::Char16: out = Value::char16(read<CMPIChar16>(v)); break;
        case Type::String: {
            auto* s = read<const CMPIString*>(v);
            out = s ? Value::string(readString(s)) : Value::null(Type::String);
            break;
        }
        case Type::DateTime: {
            auto* h = read<const CMPIDateTime*>(v);
            if (!h) {
                out = Value::null(t);
                break;
            }
            auto* d = objectOf<DateTimeObj>(h);
            if (!d)
                return CMPI_RC_ERR_INVALID_HANDLE;
            out = Value::dateTime(d->dt);
            break;
        }
        case Type::Reference: {
            auto* h = read<const CMPIObjectPath*>(v);
            if (!h) {
                out = Value::null(t);
                break;
            }
            auto* p = objectOf<PathObj>(h);
            if (!p)
                return CMPI_RC_ERR_INVALID_HANDLE;
            out = Value::reference(p->path);
            break;
        }
        case Type::Instance: {
            auto* h = read<const CMPIInstance*>(v);
            if (!h) {
                out = Value::null(t);
                break;
            }
            auto* i = objectOf<InstanceObj>(h);
            if (!i)
                return CMPI_RC_ERR_INVALID_HANDLE;
            out = Value::instance(i->inst);
            break;
        }
        default: out = Value::integer(t, integerBits(v, t));
    }
    return CMPI_RC_OK;
}

}  // namespace

CMPIType cmpiType(Type t, bool array) {
    for (const auto& p : kTypePairs)
        if (p.host == t)
            return static_cast<CMPIType>(array ? (p.cmpi | CMPI_ARRAY) : p.cmpi);
    return CMPI_null;
}

std::optional<Type> hostType(CMPIType t) {
    const CMPIType scalar = static_cast<CMPIType>(t & ~CMPI_ARRAY);
    if (scalar == CMPI_chars)
        return Type::String;
    for (const auto& p : kTypePairs)
        if (p.cmpi == scalar)
            return p.host;
    return std::nullopt;
}

std::string readString(const CMPIString* s) {
    if (!s || !s->ft)
        return std::string();
    if (auto* o = objectOf<StringObj>(s))
        return o->s;
    const char* p = s->ft->getCharPtr(s, nullptr);
    return p ? p : "";
}

CMPIrc fromCMPI(const CMPIValue* v, CMPIType ct, Value& out) {
    if (ct == CMPI_null) {
        out = Value();
        return CMPI_RC_OK;
    }
    auto t = hostType(ct);
    if (!t)
        return CMPI_RC_ERR_INVALID_DATA_TYPE;
    const bool array = (ct & CMPI_ARRAY) != 0;
    if (!v) {
        out = Value::null(*t, array);
        return CMPI_RC_OK;
    }
    if (ct == CMPI_chars) {
        // By convention the value pointer itself is the C string.
        out = Value::string(reinterpret_cast<const char*>(v));
        return CMPI_RC_OK;
    }
    if (!array)
        return scalarFromCMPI(v, *t, out);
    auto* h = read<const CMPIArray*>(v);
    if (!h) {
        out = Value::null(*t, true);
        return CMPI_RC_OK;
    }
    auto* a = objectOf<ArrayObj>(h);
    if (!a)
        return CMPI_RC_ERR_INVALID_HANDLE;
    if (a->elem != *t)
        return CMPI_RC_ERR_TYPE_MISMATCH;
    out = Value::array(a->elem, a->items);
    return CMPI_RC_OK;
}

CMPIData toCMPI(const Value& v, Arena& owner) {
    CMPIData d;
    std::memset(&d, 0, sizeof d);
    d.type = cmpiType(v.type(), v.isArray());
    if (v.isNull()) {
        d.state = CMPI_nullValue;
        return d;
    }
    d.state = CMPI_goodValue;
    if (v.isArray()) {
        d.value.array = &make<ArrayObj>(owner, v.type(), v.elements())->c;
        return d;
    }
    switch (v.type()) {
        case Type::Boolean: d.value.boolean = v.asBool() ? 1 : 0; break;
        case Type::Real32: d.value.real32 = static_cast<CMPIReal32>(v.asReal()); break;
        case Type::Real64: d.value.real64 = v.asReal(); break;
        case Type::Char16: d.value.char16 = v.asChar16(); break;
        case Type::String: d.value.string = &make<StringObj>(owner, v.asString())->c; break;
        case Type::DateTime: d.value.dateTime = &make<DateTimeObj>(owner, v.asDateTime())->c; break;
        case Type::Reference: d.value.ref = &make<PathObj>(owner, v.asReference())->c; break;
        case Type::Instance: d.value.inst = &make<InstanceObj>(owner, v.asInstance())->c; break;
        default: setIntegerBits(d.value, v.type(), v.asUint());
    }
    return d;
}

CPropertyList::CPropertyList(const PropertyList& p) : on_(p.has_value()) {
    if (!on_)
        return;
    names_ = *p;
    for (const auto& n : names_)
        ptrs_.push_back(n.c_str());
    ptrs_.push_back(nullptr);
}

PropertyList propertyList(const char** props) {
    if (!props)
        return std::nullopt;
    std::vector<std::string> r;
    for (; *props; ++props)
        r.emplace_back(*props);
    return r;
}

// ---------------------------------------------------------------------------
// Slot helpers: every slot validates its handle, and no exception leaves it.
// ---------------------------------------------------------------------------
namespace {

CMPIData noData(CMPIValueState extra = CMPI_notFound) {
    CMPIData d;
    std::memset(&d, 0, sizeof d);
    d.type = CMPI_null;
    d.state = static_cast<CMPIValueState>(CMPI_nullValue | extra);
    return d;
}

template <class O, class R, class F>
R guard(const typename O::CType* c, CMPIStatus* rc, R fail, F&& f) noexcept {
    try {
        O* o = objectOf<O>(c);
        if (!o) {
            setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
            return fail;
        }
        setRc(rc, CMPI_RC_OK);
        return f(*o);
    } catch (const std::bad_alloc&) {
        setRc(rc, CMPI_RC_ERROR_SYSTEM);
    } catch (...) {
        setRc(rc, CMPI_RC_ERR_FAILED);
    }
    return fail;
}

// For slots returning CMPIStatus; `f` returns the code.
template <class O, class F>
CMPIStatus guardStatus(const typename O::CType* c, F&& f) noexcept {
    CMPIStatus st = status(CMPI_RC_OK);
    const CMPIrc rc = guard<O>(c, &st, CMPI_RC_ERR_INVALID_HANDLE, std::forward<F>(f));
    return status(st.rc != CMPI_RC_OK ? st.rc : rc);
}

template <class O>
CMPIStatus releaseSlot(typename O::CType* c) noexcept {
    O* o = objectOf<O>(c);
    if (!o)
        return status(CMPI_RC_ERR_INVALID_HANDLE);
    destroy(o);
    return status(CMPI_RC_OK);
}

template <class O>
typename O::CType* cloneSlot(const typename O::CType* c, CMPIStatus* rc) noexcept {
    using CT = typename O::CType;
    return guard<O>(c, rc, static_cast<CT*>(nullptr), [&](O& o) -> CT* {
        O* n = o.clone();
        if (!n) {
            setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
            return nullptr;
        }
        return &n->c;
    });
}

CMPIString* newChildString(Encap& parent, std::string s) {
    return &make<StringObj>(parent.children, std::move(s))->c;
}

// Named value lists: instance properties, path keys, arguments, context
// entries.
CMPIData namedGet(Encap& o, const PropertyVector& v, const char* name, CMPIStatus* rc,
                  CMPIrc missing, CMPIValueState extra) {
    if (!name) {
        setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
        return noData();
    }
    const Value* val = findProperty(v, name);
    if (!val) {
        setRc(rc, missing);
        return noData();
    }
    CMPIData d = toCMPI(*val, o.children);
    d.state = static_cast<CMPIValueState>(d.state | extra);
    return d;
}

CMPIData namedGetAt(Encap& o, const PropertyVector& v, CMPICount i, CMPIString** name,
                    CMPIStatus* rc, CMPIrc missing, CMPIValueState extra) {
    if (i >= v.size()) {
        if (name)
            *name = nullptr;
        setRc(rc, missing);
        return noData();
    }
    if (name)
        *name = newChildString(o, v[i].name);
    CMPIData d = toCMPI(v[i].value, o.children);
    d.state = static_cast<CMPIValueState>(d.state | extra);
    return d;
}

CMPIrc namedSet(PropertyVector& v, const char* name, const CMPIValue* value, CMPIType type) {
    if (!name || !*name)
        return CMPI_RC_ERR_INVALID_PARAMETER;
    Value val;
    const CMPIrc r = fromCMPI(value, type, val);
    if (r != CMPI_RC_OK)
        return r;
    setProperty(v, name, std::move(val));
    return CMPI_RC_OK;
}

// ---------------------------------------------------------------------------
// String
// ---------------------------------------------------------------------------
const char* stringGetCharPtr(const CMPIString* s, CMPIStatus* rc) {
    return guard<StringObj>(s, rc, static_cast<const char*>(nullptr),
                            [](StringObj& o) { return o.s.c_str(); });
}

// ---------------------------------------------------------------------------
// Array
// ---------------------------------------------------------------------------
CMPICount arrayGetSize(const CMPIArray* a, CMPIStatus* rc) {
    return guard<ArrayObj>(a, rc, CMPICount(0),
                           [](ArrayObj& o) { return static_cast<CMPICount>(o.items.size()); });
}

CMPIType arrayGetSimpleType(const CMPIArray* a, CMPIStatus* rc) {
    return guard<ArrayObj>(a, rc, CMPIType(CMPI_null),
                           [](ArrayObj& o) { return cmpiType(o.elem, false); });
}

CMPIData arrayGetElementAt(const CMPIArray* a, CMPICount i, CMPIStatus* rc) {
    return guard<ArrayObj>(a, rc, noData(), [&](ArrayObj& o) {
        if (i >= o.items.size()) {
            setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
            return noData();
        }
        return toCMPI(o.items[i], o.children);
    });
}

CMPIStatus arraySetElementAt(CMPIArray* a, CMPICount i, const CMPIValue* v, CMPIType t) {
    return guardStatus<ArrayObj>(a, [&](ArrayObj& o) {
        if (i >= o.items.size())
            return CMPI_RC_ERR_NO_SUCH_PROPERTY;
        const CMPIType scalar = static_cast<CMPIType>(t & ~CMPI_ARRAY);
        if (hostType(scalar) != o.elem)
            return CMPI_RC_ERR_TYPE_MISMATCH;
        Value val;
        const CMPIrc r = fromCMPI(v, scalar, val);
        if (r == CMPI_RC_OK)
            o.items[i] = std::move(val);
        return r;
    });
}

// ---------------------------------------------------------------------------
// Instance
// ---------------------------------------------------------------------------
CMPIData instGetProperty(const CMPIInstance* i, const char* name, CMPIStatus* rc) {
    return guard<InstanceObj>(i, rc, noData(), [&](InstanceObj& o) {
        return namedGet(o, o.inst.properties(), name, rc, CMPI_RC_ERR_NO_SUCH_PROPERTY,
                        CMPI_goodValue);
    });
}

CMPIData instGetPropertyAt(const CMPIInstance* i, CMPICount n, CMPIString** name, CMPIStatus* rc) {
    return guard<InstanceObj>(i, rc, noData(), [&](InstanceObj& o) {
        return namedGetAt(o, o.inst.properties(), n, name, rc, CMPI_RC_ERR_NO_SUCH_PROPERTY,
                          CMPI_goodValue);
    });
}

CMPICount instGetPropertyCount(const CMPIInstance* i, CMPIStatus* rc) {
    return guard<InstanceObj>(i, rc, CMPICount(0), [](InstanceObj& o) {
        return static_cast<CMPICount>(o.inst.properties().size());
    });
}

CMPIStatus instSetProperty(const CMPIInstance* i, const char* name, const CMPIValue* v,
                           CMPIType t) {
    return guardStatus<InstanceObj>(i, [&](InstanceObj& o) {
        if (!name || !*name)
            return CMPI_RC_ERR_INVALID_PARAMETER;
        Value val;
        const CMPIrc r = fromCMPI(v, t, val);
        if (r != CMPI_RC_OK)
            return r;
        if (!o.admits(name))
            return CMPI_RC_OK;  // filtered out: silently dropped
        if (o.inst.path().key(name))
            o.inst.path().addKey(name, val);
        o.inst.set(name, std::move(val));
        return CMPI_RC_OK;
    });
}

CMPIStatus instSetPropertyWithOrigin(const CMPIInstance* i, const char* name, const CMPIValue* v,
                                     CMPIType t, const char*) {
    return instSetProperty(i, name, v, t);
}

CMPIObjectPath* instGetObjectPath(const CMPIInstance* i, CMPIStatus* rc) {
    return guard<InstanceObj>(i, rc, static_cast<CMPIObjectPath*>(nullptr), [](InstanceObj& o) {
        return &make<PathObj>(o.children, o.inst.path())->c;
    });
}

CMPIStatus instSetPropertyFilter(CMPIInstance* i, const char** props, const char** keys) {
    return guardStatus<InstanceObj>(i, [&](InstanceObj& o) {
        if (!props) {
            o.filter.reset();
            return CMPI_RC_OK;
        }
        std::set<std::string> allowed;
        for (const char** p = props; *p; ++p)
            allowed.insert(toLower(*p));
        for (const char** k = keys; k && *k; ++k)
            allowed.insert(toLower(*k));
        for (const auto& k : o.inst.path().keys())
            allowed.insert(toLower(k.name));
        o.filter = std::move(allowed);
        std::vector<std::string> drop;
        for (const auto& p : o.inst.properties())
            if (!o.admits(p.name))
                drop.push_back(p.name);
        for (const auto& n : drop)
            o.inst.remove(n);
        return CMPI_RC_OK;
    });
}

CMPIStatus instSetObjectPath(CMPIInstance* i, const CMPIObjectPath* op) {
    return guardStatus<InstanceObj>(i, [&](InstanceObj& o) {
        auto* p = objectOf<PathObj>(op);
        if (!p)
            return CMPI_RC_ERR_INVALID_HANDLE;
        o.inst.setPath(p->path);
        return CMPI_RC_OK;
    });
}

// ---------------------------------------------------------------------------
// Object path
// ---------------------------------------------------------------------------
template <class Set>
CMPIStatus pathSet(CMPIObjectPath* op, const char* text, Set set) {
    return guardStatus<PathObj>(op, [&](PathObj& o) {
        set(o.path, std::string(text ? text : ""));
        return CMPI_RC_OK;
    });
}

template <class Get>
CMPIString* pathGet(const CMPIObjectPath* op, CMPIStatus* rc, Get get) {
    return guard<PathObj>(op, rc, static_cast<CMPIString*>(nullptr),
                          [&](PathObj& o) { return newChildString(o, get(o.path)); });
}

CMPIStatus pathSetNameSpace(CMPIObjectPath* op, const char* ns) {
    return pathSet(op, ns, [](ObjectPath& p, std::string s) { p.setNameSpace(std::move(s)); });
}
CMPIString* pathGetNameSpace(const CMPIObjectPath* op, CMPIStatus* rc) {
    return pathGet(op, rc, [](const ObjectPath& p) { return p.nameSpace(); });
}
CMPIStatus pathSetHostname(CMPIObjectPath* op, const char* hn) {
    return pathSet(op, hn, [](ObjectPath& p, std::string s) { p.setHost(std::move(s)); });
}
CMPIString* pathGetHostname(const CMPIObjectPath* op, CMPIStatus* rc) {
    return pathGet(op, rc, [](const ObjectPath& p) { return p.host(); });
}
CMPIStatus pathSetClassName(CMPIObjectPath* op, const char* cn) {
    return pathSet(op, cn, [](ObjectPath& p, std::string s) { p.setClassName(std::move(s)); });
}
CMPIString* pathGetClassName(const CMPIObjectPath* op, CMPIStatus* rc) {
    return pathGet(op, rc, [](const ObjectPath& p) { return p.className(); });
}
CMPIString* pathToString(const CMPIObjectPath* op, CMPIStatus* rc) {
    return pathGet(op, rc, [](const ObjectPath& p) { return p.toString(); });
}

CMPIStatus pathAddKey(CMPIObjectPath* op, const char* name, const CMPIValue* v, CMPIType t) {
    return guardStatus<PathObj>(op, [&](PathObj& o) {
        if (!name || !*name)
            return CMPI_RC_ERR_INVALID_PARAMETER;
        Value val;
        const CMPIrc r = fromCMPI(v, t, val);
        if (r == CMPI_RC_OK)
            o.path.addKey(name, std::move(val));
        return r;
    });
}

CMPIData pathGetKey(const CMPIObjectPath* op, const char* name, CMPIStatus* rc) {
    return guard<PathObj>(op, rc, noData(), [&](PathObj& o) {
        return namedGet(o, o.path.keys(), name, rc, CMPI_RC_ERR_NOT_FOUND, CMPI_keyValue);
    });
}

CMPIData pathGetKeyAt(const CMPIObjectPath* op, CMPICount i, CMPIString** name, CMPIStatus* rc) {
    return guard<PathObj>(op, rc, noData(), [&](PathObj& o) {
        return namedGetAt(o, o.path.keys(), i, name, rc, CMPI_RC_ERR_NOT_FOUND, CMPI_keyValue);
    });
}

CMPICount pathGetKeyCount(const CMPIObjectPath* op, CMPIStatus* rc) {
    return guard<PathObj>(op, rc, CMPICount(0),
                          [](PathObj& o) { return static_cast<CMPICount>(o.path.keys().size()); });
}

CMPIStatus pathSetNameSpaceFrom(CMPIObjectPath* op, const CMPIObjectPath* src) {
    return guardStatus<PathObj>(op, [&](PathObj& o) {
        auto* s = objectOf<PathObj>(src);
        if (!s)
            return CMPI_RC_ERR_INVALID_HANDLE;
        o.path.setNameSpace(s->path.nameSpace());
        return CMPI_RC_OK;
    });
}

CMPIStatus pathSetHostAndNameSpaceFrom(CMPIObjectPath* op, const CMPIObjectPath* src) {
    return guardStatus<PathObj>(op, [&](PathObj& o) {
        auto* s = objectOf<PathObj>(src);
        if (!s)
            return CMPI_RC_ERR_INVALID_HANDLE;
        o.path.setNameSpace(s->path.nameSpace());
        o.path.setHost(s->path.host());
        return CMPI_RC_OK;
    });
}

// The host keeps no class definitions, hence no qualifiers.
CMPIData pathClassQualifier(const CMPIObjectPath*, const char*, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return noData();
}
CMPIData pathPropertyQualifier(const CMPIObjectPath*, const char*, const char*, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return noData();
}
CMPIData pathParameterQualifier(const CMPIObjectPath*, const char*, const char*, const char*,
                                CMPIStatus* rc) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return noData();
}

// ---------------------------------------------------------------------------
// Arguments and context: named lists
// ---------------------------------------------------------------------------
template <class O, class C>
struct NamedListSlots {
    static PropertyVector& list(O& o);
    static CMPIStatus add(const C* c, const char* name, const CMPIValue* v, CMPIType t) {
        return guardStatus<O>(c, [&](O& o) { return namedSet(list(o), name, v, t); });
    }
    static CMPIData get(const C* c, const char* name, CMPIStatus* rc) {
        return guard<O>(c, rc, noData(), [&](O& o) {
            return namedGet(o, list(o), name, rc, CMPI_RC_ERR_NOT_FOUND, CMPI_goodValue);
        });
    }
    static CMPIData getAt(const C* c, CMPICount i, CMPIString** name, CMPIStatus* rc) {
        return guard<O>(c, rc, noData(), [&](O& o) {
            return namedGetAt(o, list(o), i, name, rc, CMPI_RC_ERR_NOT_FOUND, CMPI_goodValue);
        });
    }
    static CMPICount count(const C* c, CMPIStatus* rc) {
        return guard<O>(c, rc, CMPICount(0),
                        [](O& o) { return static_cast<CMPICount>(list(o).size()); });
    }
};
template <>
PropertyVector& NamedListSlots<ArgsObj, CMPIArgs>::list(ArgsObj& o) {
    return o.args;
}
template <>
PropertyVector& NamedListSlots<ContextObj, CMPIContext>::list(ContextObj& o) {
    return o.entries;
}
using ArgsSlots = NamedListSlots<ArgsObj, CMPIArgs>;
using ContextSlots = NamedListSlots<ContextObj, CMPIContext>;

// ---------------------------------------------------------------------------
// Enumeration
// ---------------------------------------------------------------------------
CMPIData enumGetNext(const CMPIEnumeration* e, CMPIStatus* rc) {
    return guard<EnumObj>(e, rc, noData(), [&](EnumObj& o) {
        if (o.pos >= o.items.size()) {
            setRc(rc, CMPI_RC_NO_MORE_ELEMENTS);
            return noData();
        }
        return toCMPI(o.items[o.pos++], o.children);
    });
}

CMPIBoolean enumHasNext(const CMPIEnumeration* e, CMPIStatus* rc) {
    return guard<EnumObj>(e, rc, CMPIBoolean(0),
                          [](EnumObj& o) { return CMPIBoolean(o.pos < o.items.size()); });
}

CMPIArray* enumToArray(const CMPIEnumeration* e, CMPIStatus* rc) {
    return guard<EnumObj>(e, rc, static_cast<CMPIArray*>(nullptr), [](EnumObj& o) {
        const Type t = o.items.empty() ? Type::Instance : o.items.front().type();
        return &make<ArrayObj>(o.children, t, o.items)->c;
    });
}

// ---------------------------------------------------------------------------
// Date-time
// ---------------------------------------------------------------------------
CMPIUint64 dtGetBinary(const CMPIDateTime* d, CMPIStatus* rc) {
    return guard<DateTimeObj>(d, rc, CMPIUint64(0),
                              [](DateTimeObj& o) { return CMPIUint64(o.dt.toBinary()); });
}

CMPIString* dtGetString(const CMPIDateTime* d, CMPIStatus* rc) {
    return guard<DateTimeObj>(d, rc, static_cast<CMPIString*>(nullptr),
                              [](DateTimeObj& o) { return newChildString(o, o.dt.text()); });
}

CMPIBoolean dtIsInterval(const CMPIDateTime* d, CMPIStatus* rc) {
    return guard<DateTimeObj>(d, rc, CMPIBoolean(0),
                              [](DateTimeObj& o) { return CMPIBoolean(o.dt.isInterval()); });
}

// ---------------------------------------------------------------------------
// Result
// ---------------------------------------------------------------------------
template <class F>
CMPIStatus resultAppend(const CMPIResult* r, F make) {
    return guardStatus<ResultObj>(r, [&](ResultObj& o) {
        Value v;
        const CMPIrc rc = make(v);
        if (rc == CMPI_RC_OK) {
            std::lock_guard<std::mutex> g(o.m);
            o.items.push_back(std::move(v));
        }
        return rc;
    });
}

CMPIStatus resultReturnData(const CMPIResult* r, const CMPIValue* v, CMPIType t) {
    return resultAppend(r, [&](Value& out) { return fromCMPI(v, t, out); });
}

CMPIStatus resultReturnInstance(const CMPIResult* r, const CMPIInstance* i) {
    return resultAppend(r, [&](Value& out) {
        auto* o = objectOf<InstanceObj>(i);
        if (!o)
            return CMPI_RC_ERR_INVALID_HANDLE;
        out = Value::instance(o->inst);
        return CMPI_RC_OK;
    });
}

CMPIStatus resultReturnObjectPath(const CMPIResult* r, const CMPIObjectPath* op) {
    return resultAppend(r, [&](Value& out) {
        auto* o = objectOf<PathObj>(op);
        if (!o)
            return CMPI_RC_ERR_INVALID_HANDLE;
        out = Value::reference(o->path);
        return CMPI_RC_OK;
    });
}

CMPIStatus resultReturnDone(const CMPIResult* r) {
    return guardStatus<ResultObj>(r, [](ResultObj& o) {
        std::lock_guard<std::mutex> g(o.m);
        o.done = true;
        return CMPI_RC_OK;
    });
}

#ifdef CMPI_VER_200
CMPIStatus resultReturnError(const CMPIResult*, const CMPIError*) {
    return status(CMPI_RC_ERR_NOT_SUPPORTED);
}
#endif

// ---------------------------------------------------------------------------
// Select expression (indication filters): matches every instance.
// ---------------------------------------------------------------------------
CMPIBoolean seEvaluate(const CMPISelectExp* se, const CMPIInstance*, CMPIStatus* rc) {
    return guard<SelectExpObj>(se, rc, CMPIBoolean(0),
                               [](SelectExpObj&) { return CMPIBoolean(1); });
}

CMPIString* seGetString(const CMPISelectExp* se, CMPIStatus* rc) {
    return guard<SelectExpObj>(se, rc, static_cast<CMPIString*>(nullptr),
                               [](SelectExpObj& o) { return newChildString(o, o.query); });
}

CMPISelectCond* seGetCond(const CMPISelectExp*, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return nullptr;
}

#ifdef CMPI_VER_87
CMPIBoolean seEvaluateUsingAccessor(const CMPISelectExp* se, CMPIAccessor*, void*, CMPIStatus* rc) {
    return seEvaluate(se, nullptr, rc);
}
#endif

}  // namespace

bool InstanceObj::admits(const std::string& name) const {
    return !filter || filter->count(toLower(name)) != 0;
}

// ---------------------------------------------------------------------------
// Function tables
// ---------------------------------------------------------------------------
CMPIStringFT gStringFT = {CMPICurrentVersion, releaseSlot<StringObj>, cloneSlot<StringObj>,
                          stringGetCharPtr};

CMPIArrayFT gArrayFT = {CMPICurrentVersion, releaseSlot<ArrayObj>, cloneSlot<ArrayObj>,
                        arrayGetSize,       arrayGetSimpleType,    arrayGetElementAt,
                        arraySetElementAt};

CMPIInstanceFT gInstanceFT = {
    CMPICurrentVersion,        releaseSlot<InstanceObj>, cloneSlot<InstanceObj>,
    instGetProperty,           instGetPropertyAt,        instGetPropertyCount,
    instSetProperty,           instGetObjectPath,        instSetPropertyFilter,
#ifdef CMPI_VER_100
    instSetObjectPath,
#endif
#ifdef CMPI_VER_200
    instSetPropertyWithOrigin,
#endif
};

CMPIObjectPathFT gObjectPathFT = {
    CMPICurrentVersion,
    releaseSlot<PathObj>,
    cloneSlot<PathObj>,
    pathSetNameSpace,
    pathGetNameSpace,
    pathSetHostname,
    pathGetHostname,
    pathSetClassName,
    pathGetClassName,
    pathAddKey,
    pathGetKey,
    pathGetKeyAt,
    pathGetKeyCount,
    pathSetNameSpaceFrom,
    pathSetHostAndNameSpaceFrom,
    pathClassQualifier,
    pathPropertyQualifier,
    pathPropertyQualifier,  // method qualifiers have the same shape
    pathParameterQualifier,
#ifdef CMPI_VER_86
    pathToString,
#endif
};

CMPIArgsFT gArgsFT = {CMPICurrentVersion, releaseSlot<ArgsObj>, cloneSlot<ArgsObj>, ArgsSlots::add,
                      ArgsSlots::get,     ArgsSlots::getAt,     ArgsSlots::count};

CMPIEnumerationFT gEnumerationFT = {CMPICurrentVersion, releaseSlot<EnumObj>, cloneSlot<EnumObj>,
                                    enumGetNext,        enumHasNext,          enumToArray};

CMPIDateTimeFT gDateTimeFT = {
    CMPICurrentVersion, releaseSlot<DateTimeObj>, cloneSlot<DateTimeObj>, dtGetBinary, dtGetString,
    dtIsInterval};

CMPIContextFT gContextFT = {CMPICurrentVersion, releaseSlot<ContextObj>, cloneSlot<ContextObj>,
                            ContextSlots::get,  ContextSlots::getAt,     ContextSlots::count,
                            ContextSlots::add};

CMPIResultFT gResultFT = {
    CMPICurrentVersion,   releaseSlot<ResultObj>, cloneSlot<ResultObj>, resultReturnData,
    resultReturnInstance, resultReturnObjectPath, resultReturnDone,
#ifdef CMPI_VER_200
    resultReturnError,
#endif
};

CMPISelectExpFT gSelectExpFT = {
    CMPICurrentVersion,
    releaseSlot<SelectExpObj>,
    cloneSlot<SelectExpObj>,
    seEvaluate,
    seGetString,
    seGetCond,
    seGetCond,
#ifdef CMPI_VER_87
    seEvaluateUsingAccessor,
#endif
};

}  // namespace detail
}  // namespace tvrnhost
