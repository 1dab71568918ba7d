// The broker's function tables: up-calls (routed through HostImpl),
// encapsulated-object factories and type services, operating-system services
// and memory services.
#include <pthread.h>
#include <time.h>

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>
#include <type_traits>
#include <unordered_map>

#include "host/internal.h"

namespace tvrnhost {
namespace detail {

namespace {

using B = const CMPIBroker*;
using C = const CMPIContext*;
using OP = const CMPIObjectPath*;

CMPIString* newString(HostImpl& h, std::string s) {
    return &make<StringObj>(h.currentArena(), std::move(s))->c;
}

void setStatus(HostImpl& h, CMPIStatus* rc, const Status& s) {
    if (!rc)
        return;
    rc->rc = static_cast<CMPIrc>(s.rc);
    rc->msg = s.msg.empty() ? nullptr : newString(h, s.msg);
}

CMPIStatus toStatus(HostImpl& h, const Status& s) {
    CMPIStatus st;
    setStatus(h, &st, s);
    return st;
}

// Runs an up-call body with the host of `b`; no exception leaves it.
template <class R, class F>
R upcall(B b, CMPIStatus* rc, R fail, F&& f) noexcept {
    try {
        HostImpl* h = HostImpl::of(b);
        if (!h) {
            setRc(rc, CMPI_RC_ERR_INVALID_HANDLE);
            return fail;
        }
        setRc(rc, CMPI_RC_OK);
        return f(*h);
    } catch (const std::bad_alloc&) {
        setRc(rc, CMPI_RC_ERROR_SYSTEM);
    } catch (...) {
        setRc(rc, CMPI_RC_ERR_FAILED);
    }
    return fail;
}

template <class F>
CMPIStatus upcallStatus(B b, F&& f) noexcept {
    CMPIStatus st = status(CMPI_RC_OK);
    CMPIStatus r = upcall(b, &st, status(CMPI_RC_ERR_FAILED), std::forward<F>(f));
    return st.rc != CMPI_RC_OK ? st : r;
}

const ObjectPath* pathArg(OP op) {
    auto* p = objectOf<PathObj>(op);
    return p ? &p->path : nullptr;
}

// The path an up-call names, with its namespace filled in from the context.
bool requestPath(HostImpl& h, OP op, C ctx, CMPIStatus* rc, ObjectPath& out) {
    auto* p = objectOf<PathObj>(op);
    if (!p) {
        setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
        return false;
    }
    out = p->path;
    out.setNameSpace(h.nameSpaceOf(p->path, ctx));
    return true;
}

template <class T>
CMPIEnumeration* enumeration(HostImpl& h, const std::vector<T>& items) {
    std::vector<Value> vals;
    vals.reserve(items.size());
    for (const auto& i : items) {
        if constexpr (std::is_same<T, Instance>::value)
            vals.push_back(Value::instance(i));
        else if constexpr (std::is_same<T, ObjectPath>::value)
            vals.push_back(Value::reference(i));
        else
            vals.push_back(i);
    }
    return &make<EnumObj>(h.currentArena(), std::move(vals))->c;
}

// ---------------------------------------------------------------------------
// CMPIBrokerFT
// ---------------------------------------------------------------------------
CMPIContext* bPrepareAttachThread(B b, C ctx) {
    return upcall(b, nullptr, static_cast<CMPIContext*>(nullptr), [&](HostImpl& h) {
        auto* src = objectOf<ContextObj>(ctx);
        PropertyVector entries = src ? src->entries : PropertyVector{};
        return &make<ContextObj>(h.prepared, std::move(entries))->c;
    });
}

CMPIStatus bAttachThread(B b, C ctx) {
    return upcallStatus(b, [&](HostImpl&) {
        if (!objectOf<ContextObj>(ctx))
            return status(CMPI_RC_ERR_INVALID_HANDLE);
        ThreadState& ts = threadState();
        auto* a = new Arena;
        ts.arenas.push_back(a);
        ts.attached.emplace_back(ctx, a);
        return status(CMPI_RC_OK);
    });
}

CMPIStatus bDetachThread(B b, C ctx) {
    return upcallStatus(b, [&](HostImpl& h) {
        ThreadState& ts = threadState();
        for (auto it = ts.attached.rbegin(); it != ts.attached.rend(); ++it) {
            if (it->first != ctx)
                continue;
            Arena* a = it->second;
            ts.attached.erase(std::next(it).base());
            for (auto ai = ts.arenas.rbegin(); ai != ts.arenas.rend(); ++ai)
                if (*ai == a) {
                    ts.arenas.erase(std::next(ai).base());
                    break;
                }
            delete a;
            // A context prepared for this thread ends with it.
            auto* c = objectOf<ContextObj>(ctx);
            if (c && c->owner == &h.prepared)
                destroy(c);
            return status(CMPI_RC_OK);
        }
        return status(CMPI_RC_ERR_FAILED);
    });
}

CMPIStatus bDeliverIndication(B b, C, const char* ns, const CMPIInstance* ind) {
    return upcallStatus(b, [&](HostImpl& h) {
        auto* i = objectOf<InstanceObj>(ind);
        if (!i)
            return status(CMPI_RC_ERR_INVALID_PARAMETER);
        h.deliver(ns ? ns : "", i->inst);
        return status(CMPI_RC_OK);
    });
}

CMPIEnumeration* bEnumInstanceNames(B b, C ctx, OP op, CMPIStatus* rc) {
    return upcall(b, rc, static_cast<CMPIEnumeration*>(nullptr),
                  [&](HostImpl& h) -> CMPIEnumeration* {
                      ObjectPath p;
                      if (!requestPath(h, op, ctx, rc, p))
                          return nullptr;
                      std::vector<ObjectPath> out;
                      Status s = h.enumNames(h.requestFrom(ctx), p.nameSpace(), p.className(), out);
                      setStatus(h, rc, s);
                      return s.ok() ? enumeration(h, out) : nullptr;
                  });
}

CMPIEnumeration* bEnumInstances(B b, C ctx, OP op, const char** props, CMPIStatus* rc) {
    return upcall(b, rc, static_cast<CMPIEnumeration*>(nullptr),
                  [&](HostImpl& h) -> CMPIEnumeration* {
                      ObjectPath p;
                      if (!requestPath(h, op, ctx, rc, p))
                          return nullptr;
                      std::vector<Instance> out;
                      Status s = h.enumInstances(h.requestFrom(ctx), p.nameSpace(), p.className(),
                                                 propertyList(props), out);
                      setStatus(h, rc, s);
                      return s.ok() ? enumeration(h, out) : nullptr;
                  });
}

CMPIInstance* bGetInstance(B b, C ctx, OP op, const char** props, CMPIStatus* rc) {
    return upcall(b, rc, static_cast<CMPIInstance*>(nullptr), [&](HostImpl& h) -> CMPIInstance* {
        ObjectPath p;
        if (!requestPath(h, op, ctx, rc, p))
            return nullptr;
        Instance out;
        Status s = h.getInstance(h.requestFrom(ctx), p, propertyList(props), out);
        setStatus(h, rc, s);
        return s.ok() ? &make<InstanceObj>(h.currentArena(), std::move(out))->c : nullptr;
    });
}

CMPIObjectPath* bCreateInstance(B b, C ctx, OP op, const CMPIInstance* inst, CMPIStatus* rc) {
    return upcall(b, rc, static_cast<CMPIObjectPath*>(nullptr),
                  [&](HostImpl& h) -> CMPIObjectPath* {
                      ObjectPath p;
                      auto* i = objectOf<InstanceObj>(inst);
                      if (!i) {
                          setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
                          return nullptr;
                      }
                      if (!requestPath(h, op, ctx, rc, p))
                          return nullptr;
                      ObjectPath out;
                      Status s = h.createInstance(h.requestFrom(ctx), p, i->inst, out);
                      setStatus(h, rc, s);
                      return s.ok() ? &make<PathObj>(h.currentArena(), std::move(out))->c : nullptr;
                  });
}

CMPIStatus bModifyInstance(B b, C ctx, OP op, const CMPIInstance* inst, const char** props) {
    return upcallStatus(b, [&](HostImpl& h) {
        CMPIStatus st = status(CMPI_RC_OK);
        ObjectPath p;
        auto* i = objectOf<InstanceObj>(inst);
        if (!i || !requestPath(h, op, ctx, &st, p))
            return status(CMPI_RC_ERR_INVALID_PARAMETER);
        return toStatus(h, h.modifyInstance(h.requestFrom(ctx), p, i->inst, propertyList(props)));
    });
}

CMPIStatus bDeleteInstance(B b, C ctx, OP op) {
    return upcallStatus(b, [&](HostImpl& h) {
        CMPIStatus st = status(CMPI_RC_OK);
        ObjectPath p;
        if (!requestPath(h, op, ctx, &st, p))
            return st;
        return toStatus(h, h.deleteInstance(h.requestFrom(ctx), p));
    });
}

CMPIEnumeration* bExecQuery(B, C, OP, const char*, const char*, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return nullptr;
}

CMPIEnumeration* associationUpcall(B b, C ctx, OP op, AssocQuery q, CMPIStatus* rc) {
    return upcall(b, rc, static_cast<CMPIEnumeration*>(nullptr),
                  [&](HostImpl& h) -> CMPIEnumeration* {
                      if (!requestPath(h, op, ctx, rc, q.source))
                          return nullptr;
                      std::vector<Value> out;
                      Status s = h.associations(h.requestFrom(ctx), q, out);
                      setStatus(h, rc, s);
                      return s.ok() ? enumeration(h, out) : nullptr;
                  });
}

std::string str(const char* s) {
    return s ? s : "";
}

CMPIEnumeration* bAssociators(B b, C ctx, OP op, const char* assocClass, const char* resultClass,
                              const char* role, const char* resultRole, const char** props,
                              CMPIStatus* rc) {
    return associationUpcall(b, ctx, op,
                             AssocQuery{AssocOp::Associators,
                                        {},
                                        str(assocClass),
                                        str(resultClass),
                                        str(role),
                                        str(resultRole),
                                        propertyList(props)},
                             rc);
}

CMPIEnumeration* bAssociatorNames(B b, C ctx, OP op, const char* assocClass,
                                  const char* resultClass, const char* role, const char* resultRole,
                                  CMPIStatus* rc) {
    return associationUpcall(b, ctx, op,
                             AssocQuery{AssocOp::AssociatorNames,
                                        {},
                                        str(assocClass),
                                        str(resultClass),
                                        str(role),
                                        str(resultRole),
                                        std::nullopt},
                             rc);
}

CMPIEnumeration* bReferences(B b, C ctx, OP op, const char* resultClass, const char* role,
                             const char** props, CMPIStatus* rc) {
    return associationUpcall(
        b, ctx, op,
        AssocQuery{
            AssocOp::References, {}, str(resultClass), "", str(role), "", propertyList(props)},
        rc);
}

CMPIEnumeration* bReferenceNames(B b, C ctx, OP op, const char* resultClass, const char* role,
                                 CMPIStatus* rc) {
    return associationUpcall(
        b, ctx, op,
        AssocQuery{AssocOp::ReferenceNames, {}, str(resultClass), "", str(role), "", std::nullopt},
        rc);
}

CMPIData noData() {
    CMPIData d;
    std::memset(&d, 0, sizeof d);
    d.type = CMPI_null;
    d.state = CMPI_nullValue;
    return d;
}

CMPIData bInvokeMethod(B b, C ctx, OP op, const char* method, const CMPIArgs* in, CMPIArgs* out,
                       CMPIStatus* rc) {
    return upcall(b, rc, noData(), [&](HostImpl& h) {
        ObjectPath p;
        if (!method || !requestPath(h, op, ctx, rc, p)) {
            setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
            return noData();
        }
        PropertyVector inArgs;
        if (auto* a = objectOf<ArgsObj>(in))
            inArgs = a->args;
        Value ret;
        PropertyVector outArgs;
        Status s = h.invokeMethod(h.requestFrom(ctx), p, method, inArgs, ret, outArgs);
        setStatus(h, rc, s);
        if (!s.ok())
            return noData();
        if (auto* a = objectOf<ArgsObj>(out))
            for (auto& o : outArgs)
                setProperty(a->args, std::move(o.name), std::move(o.value));
        return toCMPI(ret, h.currentArena());
    });
}

CMPIStatus bSetProperty(B b, C ctx, OP op, const char* name, const CMPIValue* v, CMPIType t) {
    return upcallStatus(b, [&](HostImpl& h) {
        CMPIStatus st = status(CMPI_RC_OK);
        ObjectPath p;
        if (!name || !requestPath(h, op, ctx, &st, p))
            return status(CMPI_RC_ERR_INVALID_PARAMETER);
        Value val;
        const CMPIrc r = fromCMPI(v, t, val);
        if (r != CMPI_RC_OK)
            return status(r);
        Instance inst(p);
        inst.set(name, std::move(val));
        return toStatus(
            h, h.modifyInstance(h.requestFrom(ctx), p, inst, std::vector<std::string>{name}));
    });
}

CMPIData bGetProperty(B b, C ctx, OP op, const char* name, CMPIStatus* rc) {
    return upcall(b, rc, noData(), [&](HostImpl& h) {
        ObjectPath p;
        if (!name || !requestPath(h, op, ctx, rc, p)) {
            setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
            return noData();
        }
        Instance inst;
        Status s = h.getInstance(h.requestFrom(ctx), p, std::vector<std::string>{name}, inst);
        setStatus(h, rc, s);
        if (!s.ok())
            return noData();
        const Value* v = inst.get(name);
        if (!v) {
            setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
            return noData();
        }
        return toCMPI(*v, h.currentArena());
    });
}

// ---------------------------------------------------------------------------
// CMPIBrokerEncFT
// ---------------------------------------------------------------------------
template <class O, class... A>
typename O::CType* newObject(B b, CMPIStatus* rc, A&&... args) {
    using CT = typename O::CType;
    return upcall(b, rc, static_cast<CT*>(nullptr), [&](HostImpl& h) {
        return &make<O>(h.currentArena(), std::forward<A>(args)...)->c;
    });
}

CMPIInstance* eNewInstance(B b, OP op, CMPIStatus* rc) {
    auto* p = objectOf<PathObj>(op);
    if (!p) {
        setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
        return nullptr;
    }
    return upcall(b, rc, static_cast<CMPIInstance*>(nullptr), [&](HostImpl& h) {
        return &make<InstanceObj>(h.currentArena(), h.newInstance(p->path))->c;
    });
}

CMPIObjectPath* eNewObjectPath(B b, const char* ns, const char* cn, CMPIStatus* rc) {
    return newObject<PathObj>(b, rc, ObjectPath(str(ns), str(cn)));
}

CMPIArgs* eNewArgs(B b, CMPIStatus* rc) {
    return newObject<ArgsObj>(b, rc);
}

CMPIString* eNewString(B b, const char* data, CMPIStatus* rc) {
    return newObject<StringObj>(b, rc, str(data));
}

CMPIArray* eNewArray(B b, CMPICount max, CMPIType type, CMPIStatus* rc) {
    auto t = hostType(type);
    if (!t || (type & ~CMPI_ARRAY) == CMPI_null) {
        setRc(rc, CMPI_RC_ERR_INVALID_DATA_TYPE);
        return nullptr;
    }
    return newObject<ArrayObj>(b, rc, *t, std::vector<Value>(max, Value::null(*t)));
}

CMPIDateTime* eNewDateTime(B b, CMPIStatus* rc) {
    return newObject<DateTimeObj>(b, rc, DateTime::now());
}

CMPIDateTime* eNewDateTimeFromBinary(B b, CMPIUint64 bin, CMPIBoolean interval, CMPIStatus* rc) {
    return newObject<DateTimeObj>(b, rc, DateTime::fromBinary(bin, interval != 0));
}

CMPIDateTime* eNewDateTimeFromChars(B b, const char* text, CMPIStatus* rc) {
    auto dt = text ? DateTime::parse(text) : std::nullopt;
    if (!dt) {
        setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
        return nullptr;
    }
    return newObject<DateTimeObj>(b, rc, *dt);
}

CMPISelectExp* eNewSelectExp(B, const char*, const char*, CMPIArray** projection, CMPIStatus* rc) {
    if (projection)
        *projection = nullptr;
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return nullptr;
}

CMPIBoolean eClassPathIsA(B b, OP op, const char* type, CMPIStatus* rc) {
    return upcall(b, rc, CMPIBoolean(0), [&](HostImpl& h) {
        const ObjectPath* p = pathArg(op);
        if (!p || !type) {
            setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
            return CMPIBoolean(0);
        }
        return CMPIBoolean(h.isA(p->className(), type));
    });
}

// The kind of an encapsulated object given as `const void *`.
const Encap* encapOf(const void* object) {
    if (!object)
        return nullptr;
    const auto* shape = static_cast<const CMPIString*>(object);  // {hdl, ft}
    const auto* e = static_cast<const Encap*>(shape->hdl);
    return e && e->magic == kMagic ? e : nullptr;
}

const char* typeNameOf(const Encap& e) {
    static const char* const names[] = {
        "CMPIString",      "CMPIArray",    "CMPIInstance", "CMPIObjectPath", "CMPIArgs",
        "CMPIEnumeration", "CMPIDateTime", "CMPIContext",  "CMPIResult",     "CMPISelectExp",
    };
    return names[static_cast<int>(e.kind)];
}

std::string describe(const Encap& e) {
    switch (e.kind) {
        case Kind::String: return static_cast<const StringObj&>(e).s;
        case Kind::ObjectPath: return static_cast<const PathObj&>(e).path.toString();
        case Kind::Instance: return static_cast<const InstanceObj&>(e).inst.toString();
        case Kind::DateTime: return static_cast<const DateTimeObj&>(e).dt.text();
        case Kind::Array: {
            const auto& a = static_cast<const ArrayObj&>(e);
            return Value::array(a.elem, a.items).toString();
        }
        case Kind::Args:
        case Kind::Context: {
            const auto& list = e.kind == Kind::Args ? static_cast<const ArgsObj&>(e).args
                                                    : static_cast<const ContextObj&>(e).entries;
            std::string s;
            for (const auto& p : list)
                s += (s.empty() ? "" : ", ") + p.name + "=" + p.value.toString();
            return s;
        }
        default: return typeNameOf(e);
    }
}

CMPIString* eToString(B b, const void* object, CMPIStatus* rc) {
    return upcall(b, rc, static_cast<CMPIString*>(nullptr), [&](HostImpl& h) -> CMPIString* {
        const Encap* e = encapOf(object);
        if (!e) {
            setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
            return nullptr;
        }
        return newString(h, describe(*e));
    });
}

CMPIBoolean eIsOfType(B, const void* object, const char* type, CMPIStatus* rc) {
    const Encap* e = encapOf(object);
    if (!e || !type) {
        setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
        return 0;
    }
    setRc(rc, CMPI_RC_OK);
    return std::strcmp(typeNameOf(*e), type) == 0;
}

CMPIString* eGetType(B b, const void* object, CMPIStatus* rc) {
    return upcall(b, rc, static_cast<CMPIString*>(nullptr), [&](HostImpl& h) -> CMPIString* {
        const Encap* e = encapOf(object);
        if (!e) {
            setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
            return nullptr;
        }
        return newString(h, typeNameOf(*e));
    });
}

// Replaces $0..$9 in `def` by the (type, value) pairs of the argument list.
std::string formatMessage(const char* def, CMPICount count, va_list ap) {
    std::vector<std::string> args;
    for (CMPICount i = 0; i < count && i < 10; ++i) {
        const int type = va_arg(ap, int);
        switch (type) {
            case CMPI_sint32: args.push_back(std::to_string(va_arg(ap, long))); break;
            case CMPI_uint32: args.push_back(std::to_string(va_arg(ap, unsigned long))); break;
            case CMPI_sint64: args.push_back(std::to_string(va_arg(ap, CMPISint64))); break;
            case CMPI_uint64: args.push_back(std::to_string(va_arg(ap, CMPIUint64))); break;
            case CMPI_real64: args.push_back(Value::real64(va_arg(ap, double)).toString()); break;
            case CMPI_boolean: args.push_back(va_arg(ap, int) ? "true" : "false"); break;
            case CMPI_chars: {
                const char* s = va_arg(ap, const char*);
                args.push_back(s ? s : "");
                break;
            }
            case CMPI_string: args.push_back(readString(va_arg(ap, const CMPIString*))); break;
            default: i = count;  // unknown tag: the rest cannot be read safely
        }
    }
    std::string out;
    for (const char* p = def ? def : ""; *p; ++p) {
        if (p[0] == '$' && p[1] >= '0' && p[1] <= '9') {
            const size_t n = static_cast<size_t>(p[1] - '0');
            out += n < args.size() ? args[n] : std::string("$") + p[1];
            ++p;
        } else {
            out += *p;
        }
    }
    return out;
}

CMPIString* eGetMessage(B b, const char*, const char* defMsg, CMPIStatus* rc, CMPICount count,
                        ...) {
    va_list ap;
    va_start(ap, count);
    std::string text;
    try {
        text = formatMessage(defMsg, count, ap);
    } catch (...) {
    }
    va_end(ap);
    return upcall(b, rc, static_cast<CMPIString*>(nullptr),
                  [&](HostImpl& h) { return newString(h, text); });
}

#ifdef CMPI_VER_100
CMPIStatus eLogMessage(B b, CMPISeverity severity, const char* id, const char* text,
                       const CMPIString* string) {
    return upcallStatus(b, [&](HostImpl& h) {
        h.log("log[" + std::to_string(severity) + "] " + str(id) + ": " +
              (text ? std::string(text) : readString(string)));
        return status(CMPI_RC_OK);
    });
}

CMPIStatus eTrace(B b, CMPILevel level, const char* component, const char* text,
                  const CMPIString* string) {
    return upcallStatus(b, [&](HostImpl& h) {
        h.log("trace[" + std::to_string(level) + "] " + str(component) + ": " +
              (text ? std::string(text) : readString(string)));
        return status(CMPI_RC_OK);
    });
}
#endif

#ifdef CMPI_VER_200
CMPIError* eNewCMPIError(B, const char*, const char*, const char*, const CMPIErrorSeverity,
                         const CMPIErrorProbableCause, const CMPIrc, CMPIStatus* rc) {
    setRc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
    return nullptr;
}

CMPIStatus eOpenMessageFile(B, const char*, CMPIMsgFileHandle* handle) {
    // No message catalogues: every look-up yields the default message.
    if (handle)
        *handle = nullptr;
    return status(CMPI_RC_OK);
}

CMPIStatus eCloseMessageFile(B, const CMPIMsgFileHandle) {
    return status(CMPI_RC_OK);
}

CMPIString* eGetMessage2(B b, const char*, const CMPIMsgFileHandle, const char* defMsg,
                         CMPIStatus* rc, CMPICount count, ...) {
    va_list ap;
    va_start(ap, count);
    std::string text;
    try {
        text = formatMessage(defMsg, count, ap);
    } catch (...) {
    }
    va_end(ap);
    return upcall(b, rc, static_cast<CMPIString*>(nullptr),
                  [&](HostImpl& h) { return newString(h, text); });
}
#endif

// ---------------------------------------------------------------------------
// CMPIBrokerExtFT: POSIX threads
// ---------------------------------------------------------------------------
static_assert(sizeof(pthread_t) <= sizeof(void*), "thread handle fits CMPI_THREAD_TYPE");
static_assert(sizeof(pthread_key_t) == sizeof(CMPI_THREAD_KEY_TYPE), "thread key type");

char* xResolveFileName(const char* name) {
    if (!name)
        return nullptr;
    const size_t n = std::strlen(name) + sizeof "lib.so";
    char* r = static_cast<char*>(std::malloc(n));  // the caller frees it
    if (r)
        std::snprintf(r, n, "lib%s.so", name);
    return r;
}

CMPI_THREAD_TYPE xNewThread(CMPI_THREAD_RETURN(CMPI_THREAD_CDECL* start)(void*), void* parm,
                            int detached) {
    pthread_t t;
    if (pthread_create(&t, nullptr, start, parm) != 0)
        return nullptr;
    if (detached)
        pthread_detach(t);
    return reinterpret_cast<CMPI_THREAD_TYPE>(t);
}

int xJoinThread(CMPI_THREAD_TYPE t, CMPI_THREAD_RETURN* ret) {
    return pthread_join(reinterpret_cast<pthread_t>(t), ret);
}

int xExitThread(CMPI_THREAD_RETURN rc) {
    pthread_exit(rc);
}

int xCancelThread(CMPI_THREAD_TYPE t) {
    return pthread_cancel(reinterpret_cast<pthread_t>(t));
}

int xThreadSleep(CMPIUint32 msec) {
    timespec ts{static_cast<time_t>(msec / 1000), static_cast<long>(msec % 1000) * 1000000L};
    while (nanosleep(&ts, &ts) != 0 && errno == EINTR) {
    }
    return 0;
}

int xThreadOnce(int* once, void (*init)(void)) {
    static pthread_mutex_t m = PTHREAD_MUTEX_INITIALIZER;
    pthread_mutex_lock(&m);
    if (*once == 0) {
        init();
        *once = 1;
    }
    pthread_mutex_unlock(&m);
    return 0;
}

int xCreateThreadKey(CMPI_THREAD_KEY_TYPE* key, void (*cleanup)(void*)) {
    pthread_key_t k;
    const int r = pthread_key_create(&k, cleanup);
    if (r == 0)
        *key = static_cast<CMPI_THREAD_KEY_TYPE>(k);
    return r;
}

int xDestroyThreadKey(CMPI_THREAD_KEY_TYPE key) {
    return pthread_key_delete(key);
}
void* xGetThreadSpecific(CMPI_THREAD_KEY_TYPE key) {
    return pthread_getspecific(key);
}
int xSetThreadSpecific(CMPI_THREAD_KEY_TYPE key, void* v) {
    return pthread_setspecific(key, v);
}

// Broker mutexes are recursive.
CMPI_MUTEX_TYPE xNewMutex(int) {
    auto* m = new (std::nothrow) pthread_mutex_t;
    if (!m)
        return nullptr;
    pthread_mutexattr_t a;
    pthread_mutexattr_init(&a);
    pthread_mutexattr_settype(&a, PTHREAD_MUTEX_RECURSIVE);
    pthread_mutex_init(m, &a);
    pthread_mutexattr_destroy(&a);
    return m;
}

void xDestroyMutex(CMPI_MUTEX_TYPE m) {
    auto* pm = static_cast<pthread_mutex_t*>(m);
    if (!pm)
        return;
    pthread_mutex_destroy(pm);
    delete pm;
}

void xLockMutex(CMPI_MUTEX_TYPE m) {
    pthread_mutex_lock(static_cast<pthread_mutex_t*>(m));
}
void xUnlockMutex(CMPI_MUTEX_TYPE m) {
    pthread_mutex_unlock(static_cast<pthread_mutex_t*>(m));
}

CMPI_COND_TYPE xNewCondition(int) {
    auto* c = new (std::nothrow) pthread_cond_t;
    if (c)
        pthread_cond_init(c, nullptr);
    return c;
}

void xDestroyCondition(CMPI_COND_TYPE c) {
    auto* pc = static_cast<pthread_cond_t*>(c);
    if (!pc)
        return;
    pthread_cond_destroy(pc);
    delete pc;
}

int xCondWait(CMPI_COND_TYPE c, CMPI_MUTEX_TYPE m) {
    return pthread_cond_wait(static_cast<pthread_cond_t*>(c), static_cast<pthread_mutex_t*>(m));
}

int xTimedCondWait(CMPI_COND_TYPE c, CMPI_MUTEX_TYPE m, struct timespec* wait) {
    return pthread_cond_timedwait(static_cast<pthread_cond_t*>(c), static_cast<pthread_mutex_t*>(m),
                                  wait);
}

int xSignalCondition(CMPI_COND_TYPE c) {
    return pthread_cond_signal(static_cast<pthread_cond_t*>(c));
}

// ---------------------------------------------------------------------------
// CMPIBrokerMemFT: allocations live in the current arena like objects do.
// ---------------------------------------------------------------------------
#ifdef CMPI_VER_200
constexpr std::uint32_t kMarkMagic = 0x4b52414d;  // "MARK"

struct GcMark : Node {
    std::uint32_t magic = kMarkMagic;
    ~GcMark() override { magic = 0; }
};

std::mutex gMemMutex;
std::unordered_map<void*, struct MemBlock*> gBlocks;

struct MemBlock : Node {
    explicit MemBlock(void* p) : ptr(p) {
        std::lock_guard<std::mutex> g(gMemMutex);
        gBlocks[ptr] = this;
    }
    ~MemBlock() override {
        {
            std::lock_guard<std::mutex> g(gMemMutex);
            gBlocks.erase(ptr);
        }
        std::free(ptr);
    }
    void* ptr;
};

MemBlock* blockOf(void* p) {
    std::lock_guard<std::mutex> g(gMemMutex);
    auto it = gBlocks.find(p);
    return it == gBlocks.end() ? nullptr : it->second;
}

CMPIGcStat* mMark(B b, CMPIStatus* rc) {
    return upcall(b, rc, static_cast<CMPIGcStat*>(nullptr), [&](HostImpl& h) {
        return static_cast<CMPIGcStat*>(make<GcMark>(h.currentArena()));
    });
}

CMPIStatus mRelease(B, const CMPIGcStat* gc) {
    auto* m = static_cast<GcMark*>(const_cast<CMPIGcStat*>(gc));
    if (!m || m->magic != kMarkMagic || !m->owner)
        return status(CMPI_RC_ERR_INVALID_HANDLE);
    m->owner->freeAfter(m->seq - 1);  // the mark and everything made after it
    return status(CMPI_RC_OK);
}

void* adoptBlock(B b, void* p) {
    if (!p)
        return nullptr;
    HostImpl* h = HostImpl::of(b);
    if (!h) {
        std::free(p);
        return nullptr;
    }
    try {
        h->currentArena().adopt(new MemBlock(p));
        return p;
    } catch (...) {
        std::free(p);
        return nullptr;
    }
}

void* mMalloc(B b, size_t n) {
    return adoptBlock(b, std::malloc(n));
}
void* mCalloc(B b, size_t n, size_t s) {
    return adoptBlock(b, std::calloc(n, s));
}
char* mStrDup(B b, const char* s) {
    return s ? static_cast<char*>(adoptBlock(b, strdup(s))) : nullptr;
}

void mFree(B, void* p) {
    if (MemBlock* blk = p ? blockOf(p) : nullptr)
        destroy(blk);
}

void* mRealloc(B b, void* p, size_t n) {
    if (!p)
        return mMalloc(b, n);
    MemBlock* blk = blockOf(p);
    if (!blk)
        return nullptr;
    std::lock_guard<std::mutex> g(gMemMutex);
    try {
        gBlocks.reserve(gBlocks.size() + 1);  // the insertion below cannot throw then
    } catch (...) {
        return nullptr;
    }
    void* q = std::realloc(p, n);
    if (!q)
        return nullptr;
    gBlocks.erase(p);
    blk->ptr = q;
    gBlocks.emplace(q, blk);
    return q;
}

template <class O>
void mFreeObject(B, typename O::CType* c) {
    if (O* o = objectOf<O>(c))
        destroy(o);
}
#endif

}  // namespace

CMPIBrokerFT gBrokerFT = {
    CMPI_MB_Class_1 | CMPI_MB_Supports_IndicationMI | CMPI_MB_OSEncapsulationSupport,
    CMPICurrentVersion,
    "tvrnhost",
    bPrepareAttachThread,
    bAttachThread,
    bDetachThread,
    bDeliverIndication,
    bEnumInstanceNames,
    bGetInstance,
    bCreateInstance,
    bModifyInstance,
    bDeleteInstance,
    bExecQuery,
    bEnumInstances,
    bAssociators,
    bAssociatorNames,
    bReferences,
    bReferenceNames,
    bInvokeMethod,
    bSetProperty,
    bGetProperty,
};

CMPIBrokerEncFT gBrokerEncFT = {
    CMPICurrentVersion,
    eNewInstance,
    eNewObjectPath,
    eNewArgs,
    eNewString,
    eNewArray,
    eNewDateTime,
    eNewDateTimeFromBinary,
    eNewDateTimeFromChars,
    eNewSelectExp,
    eClassPathIsA,
    eToString,
    eIsOfType,
    eGetType,
#ifdef CMPI_VER_85
    eGetMessage,
#endif
#ifdef CMPI_VER_100
    eLogMessage,
    eTrace,
#else
    nullptr,
#endif
#ifdef CMPI_VER_200
    eNewCMPIError,
    eOpenMessageFile,
    eCloseMessageFile,
    eGetMessage2,
#endif
};

#ifdef CMPI_VER_90
CMPIBrokerExtFT gBrokerExtFT = {
    CMPICurrentVersion, xResolveFileName,   xNewThread,        xJoinThread,      xExitThread,
    xCancelThread,      xThreadSleep,       xThreadOnce,       xCreateThreadKey, xDestroyThreadKey,
    xGetThreadSpecific, xSetThreadSpecific, xNewMutex,         xDestroyMutex,    xLockMutex,
    xUnlockMutex,       xNewCondition,      xDestroyCondition, xCondWait,        xTimedCondWait,
    xSignalCondition,
};
#endif

#ifdef CMPI_VER_200
CMPIBrokerMemFT gBrokerMemFT = {
    CMPICurrentVersion,
    mMark,
    mRelease,
    mMalloc,
    mCalloc,
    mRealloc,
    mStrDup,
    mFree,
    mFreeObject<InstanceObj>,
    mFreeObject<PathObj>,
    mFreeObject<ArgsObj>,
    mFreeObject<StringObj>,
    mFreeObject<ArrayObj>,
    mFreeObject<DateTimeObj>,
    mFreeObject<SelectExpObj>,
};
#endif

void initBroker(HostImpl& h) {
    h.broker.hdl = &h;
    h.broker.bft = &gBrokerFT;
    h.broker.eft = &gBrokerEncFT;
#ifdef CMPI_VER_90
    h.broker.xft = &gBrokerExtFT;
#endif
#ifdef CMPI_VER_200
    h.broker.mft = &gBrokerMemFT;
#endif
}

HostImpl* HostImpl::of(const CMPIBroker* b) {
    if (!b || b->bft != &gBrokerFT || !b->hdl)
        return nullptr;
    return static_cast<HostImpl*>(b->hdl);
}

}  // namespace detail
}  // namespace tvrnhost
