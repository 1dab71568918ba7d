// Request routing of the embedded host: registrations, provider libraries
// and their MIs, the instance stores, association traversal, indication
// subscriptions and the cleanup sequence; and the public Host facade.
#include <dlfcn.h>

#include <algorithm>
#include <utility>

#include "host/internal.h"

namespace tvrnhost {

namespace {

struct RcName {
    int rc;
    const char* name;
};
const RcName kRcNames[] = {
    {CMPI_RC_OK, "CMPI_RC_OK"},
    {CMPI_RC_ERR_FAILED, "CMPI_RC_ERR_FAILED"},
    {CMPI_RC_ERR_ACCESS_DENIED, "CMPI_RC_ERR_ACCESS_DENIED"},
    {CMPI_RC_ERR_INVALID_NAMESPACE, "CMPI_RC_ERR_INVALID_NAMESPACE"},
    {CMPI_RC_ERR_INVALID_PARAMETER, "CMPI_RC_ERR_INVALID_PARAMETER"},
    {CMPI_RC_ERR_INVALID_CLASS, "CMPI_RC_ERR_INVALID_CLASS"},
    {CMPI_RC_ERR_NOT_FOUND, "CMPI_RC_ERR_NOT_FOUND"},
    {CMPI_RC_ERR_NOT_SUPPORTED, "CMPI_RC_ERR_NOT_SUPPORTED"},
    {CMPI_RC_ERR_CLASS_HAS_CHILDREN, "CMPI_RC_ERR_CLASS_HAS_CHILDREN"},
    {CMPI_RC_ERR_CLASS_HAS_INSTANCES, "CMPI_RC_ERR_CLASS_HAS_INSTANCES"},
    {CMPI_RC_ERR_INVALID_SUPERCLASS, "CMPI_RC_ERR_INVALID_SUPERCLASS"},
    {CMPI_RC_ERR_ALREADY_EXISTS, "CMPI_RC_ERR_ALREADY_EXISTS"},
    {CMPI_RC_ERR_NO_SUCH_PROPERTY, "CMPI_RC_ERR_NO_SUCH_PROPERTY"},
    {CMPI_RC_ERR_TYPE_MISMATCH, "CMPI_RC_ERR_TYPE_MISMATCH"},
    {CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED, "CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED"},
    {CMPI_RC_ERR_INVALID_QUERY, "CMPI_RC_ERR_INVALID_QUERY"},
    {CMPI_RC_ERR_METHOD_NOT_AVAILABLE, "CMPI_RC_ERR_METHOD_NOT_AVAILABLE"},
    {CMPI_RC_ERR_METHOD_NOT_FOUND, "CMPI_RC_ERR_METHOD_NOT_FOUND"},
    {CMPI_RC_NO_MORE_ELEMENTS, "CMPI_RC_NO_MORE_ELEMENTS"},
    {CMPI_RC_DO_NOT_UNLOAD, "CMPI_RC_DO_NOT_UNLOAD"},
    {CMPI_RC_NEVER_UNLOAD, "CMPI_RC_NEVER_UNLOAD"},
    {CMPI_RC_ERR_INVALID_HANDLE, "CMPI_RC_ERR_INVALID_HANDLE"},
    {CMPI_RC_ERR_INVALID_DATA_TYPE, "CMPI_RC_ERR_INVALID_DATA_TYPE"},
    {CMPI_RC_ERROR_SYSTEM, "CMPI_RC_ERROR_SYSTEM"},
    {CMPI_RC_ERROR, "CMPI_RC_ERROR"},
};

}  // namespace

std::string rcName(int rc) {
    for (const auto& r : kRcNames)
        if (r.rc == rc)
            return r.name;
    return "CMPI_RC_" + std::to_string(rc);
}

std::string Status::toString() const {
    return msg.empty() ? rcName(rc) : rcName(rc) + ": " + msg;
}

namespace detail {

// ---------------------------------------------------------------------------
// Instance stores
// ---------------------------------------------------------------------------
class StoreImpl : public InstanceStore {
public:
    explicit StoreImpl(std::string ns) : ns_(std::move(ns)) {}

    bool add(Instance inst) override {
        inst.path().setNameSpace(ns_);
        std::lock_guard<std::mutex> g(m_);
        for (const auto& i : insts_)
            if (i.path().identifies(inst.path()))
                return false;
        insts_.push_back(std::move(inst));
        return true;
    }

    bool remove(const ObjectPath& path) override {
        std::lock_guard<std::mutex> g(m_);
        auto it = std::find_if(insts_.begin(), insts_.end(),
                               [&](const Instance& i) { return i.path().identifies(path); });
        if (it == insts_.end())
            return false;
        insts_.erase(it);
        return true;
    }

    std::optional<Instance> find(const ObjectPath& path) const override {
        std::lock_guard<std::mutex> g(m_);
        for (const auto& i : insts_)
            if (i.path().identifies(path))
                return i;
        return std::nullopt;
    }

    bool replace(const ObjectPath& path, const Instance& inst) {
        std::lock_guard<std::mutex> g(m_);
        for (auto& i : insts_)
            if (i.path().identifies(path)) {
                i = inst;
                return true;
            }
        return false;
    }

    std::vector<Instance> all() const override {
        std::lock_guard<std::mutex> g(m_);
        return insts_;
    }

    void defineClass(const std::string& cls) override {
        std::lock_guard<std::mutex> g(m_);
        classes_.insert(toLower(cls));
    }

    bool hasClass(const HostImpl& h, const std::string& cls) const {
        std::lock_guard<std::mutex> g(m_);
        for (const auto& c : classes_)
            if (h.isA(c, cls))
                return true;
        for (const auto& i : insts_)
            if (h.isA(i.className(), cls))
                return true;
        return false;
    }

    void clear() override {
        std::lock_guard<std::mutex> g(m_);
        insts_.clear();
        classes_.clear();
    }

private:
    std::string ns_;
    mutable std::mutex m_;
    std::vector<Instance> insts_;
    std::set<std::string> classes_;
};

namespace {

// An instance restricted to a property list (keys always kept), as a server
// returns it.
Instance filtered(const Instance& inst, const PropertyList& props) {
    if (!props)
        return inst;
    Instance r(inst.path());
    for (const auto& p : inst.properties()) {
        const bool wanted = inst.path().key(p.name) ||
                            std::any_of(props->begin(), props->end(), [&](const std::string& n) {
                                return equalsIgnoreCase(n, p.name);
                            });
        if (wanted)
            r.set(p.name, p.value);
    }
    return r;
}

const char* orNull(const std::string& s) {
    return s.empty() ? nullptr : s.c_str();
}

// A request's own context and memory: installed on the calling thread for
// the duration of one MI call, freed with everything made in it.
class Scope {
public:
    Scope(HostImpl& h, const HostImpl::Req& r, const std::string& ns) {
        PropertyVector e;
        e.push_back({CMPIPrincipal, Value::string(r.principal)});
        e.push_back({CMPIInvocationFlags, Value::uint32(h.opts.invocationFlags)});
        e.push_back({CMPIInitNameSpace, Value::string(ns)});
        ctx_ = make<ContextObj>(arena_, std::move(e));
        threadState().arenas.push_back(&arena_);
    }
    ~Scope() {
        auto& a = threadState().arenas;
        auto it = std::find(a.rbegin(), a.rend(), &arena_);
        if (it != a.rend())
            a.erase(std::next(it).base());
    }
    Arena& arena() { return arena_; }
    const CMPIContext* ctx() const { return &ctx_->c; }

private:
    Arena arena_;
    ContextObj* ctx_;
};

template <class MI>
struct MIInfo;
template <>
struct MIInfo<CMPIInstanceMI> {
    static constexpr const char* kind = "instance";
    static constexpr const char* suffix = "_Create_InstanceMI";
    static CMPIInstanceMI*& slot(Provider& p) { return p.instanceMI; }
};
template <>
struct MIInfo<CMPIAssociationMI> {
    static constexpr const char* kind = "association";
    static constexpr const char* suffix = "_Create_AssociationMI";
    static CMPIAssociationMI*& slot(Provider& p) { return p.associationMI; }
};
template <>
struct MIInfo<CMPIMethodMI> {
    static constexpr const char* kind = "method";
    static constexpr const char* suffix = "_Create_MethodMI";
    static CMPIMethodMI*& slot(Provider& p) { return p.methodMI; }
};
template <>
struct MIInfo<CMPIIndicationMI> {
    static constexpr const char* kind = "indication";
    static constexpr const char* suffix = "_Create_IndicationMI";
    static CMPIIndicationMI*& slot(Provider& p) { return p.indicationMI; }
};

bool openModule(Module& m, Status& st) {
    if (m.handle)
        return true;
    dlerror();
    m.handle = dlopen(m.path.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (!m.handle) {
        const char* e = dlerror();
        st = Status{CMPI_RC_ERR_FAILED, "cannot load " + m.path + ": " + (e ? e : "?")};
        return false;
    }
    return true;
}

std::string dirName(const std::string& p) {
    const size_t s = p.rfind('/');
    return s == std::string::npos ? "." : p.substr(0, s);
}

// "lib<stem>.so" -> "<stem>"
std::string libraryStem(const std::string& p) {
    std::string b = p.substr(p.rfind('/') == std::string::npos ? 0 : p.rfind('/') + 1);
    if (b.compare(0, 3, "lib") == 0)
        b = b.substr(3);
    const size_t so = b.find(".so");
    return so == std::string::npos ? b : b.substr(0, so);
}

}  // namespace

// ---------------------------------------------------------------------------
// HostImpl
// ---------------------------------------------------------------------------
HostImpl::HostImpl(HostOptions o) : opts(std::move(o)) {
    initBroker(*this);
}

HostImpl::~HostImpl() {
    if (isLoaded)
        unload();
}

Arena& HostImpl::currentArena() {
    ThreadState& ts = threadState();
    return ts.arenas.empty() ? orphans : *ts.arenas.back();
}

HostImpl::Req HostImpl::requestFrom(const CMPIContext* ctx) const {
    if (auto* c = objectOf<ContextObj>(ctx))
        if (const Value* v = findProperty(c->entries, CMPIPrincipal))
            if (v->type() == Type::String && !v->isNull())
                return Req{v->asString()};
    return request();
}

std::string HostImpl::nameSpaceOf(const ObjectPath& p, const CMPIContext* ctx) const {
    if (!p.nameSpace().empty())
        return p.nameSpace();
    if (auto* c = objectOf<ContextObj>(ctx))
        if (const Value* v = findProperty(c->entries, CMPIInitNameSpace))
            if (v->type() == Type::String && !v->isNull())
                return v->asString();
    return std::string();
}

bool HostImpl::isA(const std::string& cls, const std::string& super) const {
    std::string c = toLower(cls);
    const std::string target = toLower(super);
    std::lock_guard<std::mutex> g(classMutex);
    for (int depth = 0; depth < 64; ++depth) {
        if (c == target)
            return true;
        auto it = superOf.find(c);
        if (it != superOf.end()) {
            c = it->second;
            continue;
        }
        const ClassInfo* ci = opts.classes ? opts.classes->find(c) : nullptr;
        if (!ci || ci->superclass.empty())
            return false;
        c = toLower(ci->superclass);
    }
    return false;
}

std::vector<Instance> HostImpl::storedInstances(const std::string& ns) const {
    StoreImpl* s = nullptr;
    {
        std::lock_guard<std::mutex> g(storeMutex);
        auto it = stores.find(toLower(ns));
        if (it != stores.end())
            s = it->second.get();
    }
    return s ? s->all() : std::vector<Instance>{};
}

StoreImpl& HostImpl::store(const std::string& ns) {
    std::lock_guard<std::mutex> g(storeMutex);
    auto& s = stores[toLower(ns)];
    if (!s)
        s = std::make_unique<StoreImpl>(ns);
    return *s;
}

void HostImpl::deliver(const std::string& ns, Instance inst) {
    {
        std::lock_guard<std::mutex> g(indMutex);
        inds.push_back(Indication{ns, std::move(inst)});
    }
    indCv.notify_all();
}

void HostImpl::log(std::string line) {
    std::lock_guard<std::mutex> g(logMutex);
    logs.push_back(std::move(line));
}

const ClassEntry* HostImpl::entry(const std::string& ns, const std::string& cls,
                                  unsigned kind) const {
    for (const auto& e : classes)
        if ((e.kinds & kind) && equalsIgnoreCase(e.ns, ns) && equalsIgnoreCase(e.className, cls))
            return &e;
    return nullptr;
}

bool HostImpl::nameSpaceKnown(const std::string& ns) const {
    for (const auto& e : classes)
        if (equalsIgnoreCase(e.ns, ns))
            return true;
    std::lock_guard<std::mutex> g(storeMutex);
    return stores.count(toLower(ns)) != 0;
}

bool HostImpl::classKnown(const std::string& ns, const std::string& cls) const {
    // The class repository holds the classes of the namespaces served.
    const bool inRepository = opts.classes && opts.classes->find(cls);
    for (const auto& e : classes)
        if (equalsIgnoreCase(e.ns, ns) && (inRepository || isA(e.className, cls)))
            return true;
    {
        std::lock_guard<std::mutex> g(classMutex);
        if (superOf.count(toLower(cls)))
            return true;
        for (const auto& s : superOf)
            if (s.second == toLower(cls))
                return true;
    }
    StoreImpl* s = nullptr;
    {
        std::lock_guard<std::mutex> g(storeMutex);
        auto it = stores.find(toLower(ns));
        if (it != stores.end())
            s = it->second.get();
    }
    return s && s->hasClass(*this, cls);
}

Status HostImpl::checkClass(const std::string& ns, const std::string& cls) const {
    if (!nameSpaceKnown(ns))
        return Status{CMPI_RC_ERR_INVALID_NAMESPACE, "namespace " + ns + " is not served"};
    if (!classKnown(ns, cls))
        return Status{CMPI_RC_ERR_INVALID_CLASS, "class " + cls + " is not served in " + ns};
    return Status{};
}

template <class MI>
MI* HostImpl::mi(Provider& p, Status& st) {
    std::lock_guard<std::recursive_mutex> g(miMutex);
    MI*& slot = MIInfo<MI>::slot(p);
    if (slot)
        return slot;
    if (!openModule(*p.module, st))
        return nullptr;
    const std::string sym = p.name + MIInfo<MI>::suffix;
    void* f = dlsym(p.module->handle, sym.c_str());
    if (!f) {
        st = Status{CMPI_RC_ERR_FAILED, p.module->path + " does not export " + sym};
        return nullptr;
    }
    using Factory = MI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
    Scope scope(*this, request(), "");
    CMPIStatus cs = status(CMPI_RC_OK);
    MI* m = nullptr;
    try {
        m = reinterpret_cast<Factory>(f)(&broker, scope.ctx(), &cs);
    } catch (...) {
        st = Status{CMPI_RC_ERR_FAILED, "exception escaped " + sym};
        return nullptr;
    }
    if (!m || !m->ft) {
        st = Status{cs.rc != CMPI_RC_OK ? cs.rc : CMPI_RC_ERR_FAILED,
                    cs.msg ? readString(cs.msg) : sym + " returned no MI"};
        return nullptr;
    }
    if (m->ft->miVersion > m->ft->ftVersion || m->ft->miVersion > CMPICurrentVersion) {
        st = Status{CMPI_RC_ERR_FAILED,
                    sym + ": MI version " + std::to_string(m->ft->miVersion) + " is not supported"};
        return nullptr;
    }
    slot = m;
    if (!p.created)
        p.created = ++createdCount;
    return m;
}

template <class MI, class F>
Status HostImpl::callMI(Provider& p, const Req& r, const std::string& ns, std::vector<Value>* items,
                        F&& f) {
    Status st;
    MI* m = mi<MI>(p, st);
    if (!m)
        return st;
    Scope scope(*this, r, ns);
    ResultObj* res = make<ResultObj>(scope.arena());
    CMPIStatus cs = status(CMPI_RC_OK);
    try {
        cs = f(m, scope.ctx(), &res->c, scope.arena());
    } catch (...) {
        return Status{CMPI_RC_ERR_FAILED, "exception escaped provider " + p.name};
    }
    st.rc = cs.rc;
    if (cs.msg)
        st.msg = readString(cs.msg);
    if (items) {
        std::lock_guard<std::mutex> g(res->m);
        *items = std::move(res->items);
    }
    return st;
}

// ---- instance operations ------------------------------------------------

Status HostImpl::enumInstances(const Req& r, const std::string& ns, const std::string& cls,
                               const PropertyList& props, std::vector<Instance>& out) {
    Status st = checkClass(ns, cls);
    if (!st.ok())
        return st;
    for (const auto& e : classes) {
        if (!(e.kinds & kInstanceMI) || !equalsIgnoreCase(e.ns, ns) || !isA(e.className, cls))
            continue;
        std::vector<Value> items;
        st = callMI<CMPIInstanceMI>(
            *e.provider, r, ns, &items,
            [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res, Arena& a) {
                auto* op = make<PathObj>(a, ObjectPath(ns, e.className));
                CPropertyList pl(props);
                return mi->ft->enumerateInstances(mi, ctx, res, &op->c, pl.get());
            });
        if (!st.ok())
            return st;
        for (const auto& v : items)
            if (v.type() == Type::Instance && !v.isArray() && !v.isNull())
                out.push_back(v.asInstance());
    }
    for (const auto& i : storedInstances(ns))
        if (isA(i.className(), cls) && !entry(ns, i.className(), kInstanceMI))
            out.push_back(filtered(i, props));
    return Status{};
}

Status HostImpl::enumNames(const Req& r, const std::string& ns, const std::string& cls,
                           std::vector<ObjectPath>& out) {
    Status st = checkClass(ns, cls);
    if (!st.ok())
        return st;
    for (const auto& e : classes) {
        if (!(e.kinds & kInstanceMI) || !equalsIgnoreCase(e.ns, ns) || !isA(e.className, cls))
            continue;
        std::vector<Value> items;
        st = callMI<CMPIInstanceMI>(
            *e.provider, r, ns, &items,
            [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res, Arena& a) {
                auto* op = make<PathObj>(a, ObjectPath(ns, e.className));
                return mi->ft->enumerateInstanceNames(mi, ctx, res, &op->c);
            });
        if (!st.ok())
            return st;
        for (const auto& v : items)
            if (v.type() == Type::Reference && !v.isArray() && !v.isNull())
                out.push_back(v.asReference());
    }
    for (const auto& i : storedInstances(ns))
        if (isA(i.className(), cls) && !entry(ns, i.className(), kInstanceMI))
            out.push_back(i.path());
    return Status{};
}

Status HostImpl::getInstance(const Req& r, const ObjectPath& p, const PropertyList& props,
                             Instance& out) {
    const std::string& ns = p.nameSpace();
    if (const ClassEntry* e = entry(ns, p.className(), kInstanceMI)) {
        std::vector<Value> items;
        Status st = callMI<CMPIInstanceMI>(
            *e->provider, r, ns, &items,
            [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res, Arena& a) {
                auto* op = make<PathObj>(a, p);
                CPropertyList pl(props);
                return mi->ft->getInstance(mi, ctx, res, &op->c, pl.get());
            });
        if (!st.ok())
            return st;
        for (const auto& v : items)
            if (v.type() == Type::Instance && !v.isArray() && !v.isNull()) {
                out = v.asInstance();
                return st;
            }
        return Status{CMPI_RC_ERR_NOT_FOUND, "provider " + e->provider->name + " returned nothing"};
    }
    Status st = checkClass(ns, p.className());
    if (!st.ok())
        return st;
    auto found = store(ns).find(p);
    if (!found)
        return Status{CMPI_RC_ERR_NOT_FOUND, p.toString()};
    out = filtered(*found, props);
    return Status{};
}

Status HostImpl::createInstance(const Req& r, const ObjectPath& p, const Instance& inst,
                                ObjectPath& out) {
    const std::string& ns = p.nameSpace();
    Instance full = inst;
    full.setPath(p.keys().empty() && !inst.path().keys().empty()
                     ? ObjectPath(inst.path()).setNameSpace(ns).setClassName(p.className())
                     : p);
    if (const ClassEntry* e = entry(ns, p.className(), kInstanceMI)) {
        std::vector<Value> items;
        Status st = callMI<CMPIInstanceMI>(
            *e->provider, r, ns, &items,
            [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res, Arena& a) {
                auto* op = make<PathObj>(a, full.path());
                auto* io = make<InstanceObj>(a, full);
                return mi->ft->createInstance(mi, ctx, res, &op->c, &io->c);
            });
        if (!st.ok())
            return st;
        out = full.path();
        for (const auto& v : items)
            if (v.type() == Type::Reference && !v.isArray() && !v.isNull()) {
                out = v.asReference();
                break;
            }
        return st;
    }
    Status st = checkClass(ns, p.className());
    if (!st.ok())
        return st;
    if (!store(ns).add(full))
        return Status{CMPI_RC_ERR_ALREADY_EXISTS, full.path().toString()};
    out = full.path();
    return Status{};
}

Status HostImpl::modifyInstance(const Req& r, const ObjectPath& p, const Instance& inst,
                                const PropertyList& props) {
    const std::string& ns = p.nameSpace();
    if (const ClassEntry* e = entry(ns, p.className(), kInstanceMI)) {
        return callMI<CMPIInstanceMI>(
            *e->provider, r, ns, nullptr,
            [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res, Arena& a) {
                auto* op = make<PathObj>(a, p);
                Instance withPath = inst;
                withPath.setPath(p);
                auto* io = make<InstanceObj>(a, std::move(withPath));
                CPropertyList pl(props);
                return mi->ft->modifyInstance(mi, ctx, res, &op->c, &io->c, pl.get());
            });
    }
    Status st = checkClass(ns, p.className());
    if (!st.ok())
        return st;
    StoreImpl& s = store(ns);
    auto current = s.find(p);
    if (!current)
        return Status{CMPI_RC_ERR_NOT_FOUND, p.toString()};
    for (const auto& prop : inst.properties()) {
        const bool listed =
            !props || std::any_of(props->begin(), props->end(), [&](const std::string& n) {
                return equalsIgnoreCase(n, prop.name);
            });
        if (listed && !current->path().key(prop.name))
            current->set(prop.name, prop.value);
    }
    s.replace(p, *current);
    return Status{};
}

Status HostImpl::deleteInstance(const Req& r, const ObjectPath& p) {
    const std::string& ns = p.nameSpace();
    if (const ClassEntry* e = entry(ns, p.className(), kInstanceMI)) {
        return callMI<CMPIInstanceMI>(
            *e->provider, r, ns, nullptr,
            [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res, Arena& a) {
                auto* op = make<PathObj>(a, p);
                return mi->ft->deleteInstance(mi, ctx, res, &op->c);
            });
    }
    Status st = checkClass(ns, p.className());
    if (!st.ok())
        return st;
    if (!store(ns).remove(p))
        return Status{CMPI_RC_ERR_NOT_FOUND, p.toString()};
    return Status{};
}

// ---- associations ---------------------------------------------------------

Status HostImpl::associations(const Req& r, const AssocQuery& q, std::vector<Value>& out) {
    const std::string& ns = q.source.nameSpace();
    if (!nameSpaceKnown(ns))
        return Status{CMPI_RC_ERR_INVALID_NAMESPACE, "namespace " + ns + " is not served"};
    if (!q.assocClass.empty() && !classKnown(ns, q.assocClass))
        return Status{CMPI_RC_ERR_INVALID_CLASS,
                      "class " + q.assocClass + " is not served in " + ns};

    std::vector<Provider*> done;
    for (const auto& e : classes) {
        if (!(e.kinds & kAssociationMI) || !equalsIgnoreCase(e.ns, ns))
            continue;
        if (!q.assocClass.empty() && !isA(e.className, q.assocClass))
            continue;
        if (std::find(done.begin(), done.end(), e.provider) != done.end())
            continue;
        done.push_back(e.provider);
        std::vector<Value> items;
        Status st = callMI<CMPIAssociationMI>(
            *e.provider, r, ns, &items,
            [&](CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* res, Arena& a) {
                auto* op = make<PathObj>(a, q.source);
                CPropertyList pl(q.props);
                const char *ac = orNull(q.assocClass), *rc = orNull(q.resultClass),
                           *role = orNull(q.role), *rr = orNull(q.resultRole);
                switch (q.op) {
                    case AssocOp::Associators:
                        return mi->ft->associators(mi, ctx, res, &op->c, ac, rc, role, rr,
                                                   pl.get());
                    case AssocOp::AssociatorNames:
                        return mi->ft->associatorNames(mi, ctx, res, &op->c, ac, rc, role, rr);
                    case AssocOp::References:
                        return mi->ft->references(mi, ctx, res, &op->c, ac, role, pl.get());
                    default: return mi->ft->referenceNames(mi, ctx, res, &op->c, ac, role);
                }
            });
        if (!st.ok())
            return st;
        for (auto& v : items)
            out.push_back(std::move(v));
    }
    return storeAssociations(r, ns, q, out);
}

// Association instances kept in the store: any instance with two or more
// reference properties, one of which names the source.
Status HostImpl::storeAssociations(const Req& r, const std::string& ns, const AssocQuery& q,
                                   std::vector<Value>& out) {
    for (const auto& a : storedInstances(ns)) {
        if (!q.assocClass.empty() && !isA(a.className(), q.assocClass))
            continue;
        std::vector<const Property*> refs;
        for (const auto& p : a.properties())
            if (p.value.type() == Type::Reference && !p.value.isArray() && !p.value.isNull())
                refs.push_back(&p);
        if (refs.size() < 2)
            continue;
        const Property* from = nullptr;
        for (const Property* p : refs)
            if ((q.role.empty() || equalsIgnoreCase(p->name, q.role)) &&
                p->value.asReference().identifies(q.source))
                from = p;
        if (!from)
            continue;
        if (q.op == AssocOp::References) {
            out.push_back(Value::instance(filtered(a, q.props)));
            continue;
        }
        if (q.op == AssocOp::ReferenceNames) {
            out.push_back(Value::reference(a.path()));
            continue;
        }
        for (const Property* to : refs) {
            if (to == from || (!q.resultRole.empty() && !equalsIgnoreCase(to->name, q.resultRole)))
                continue;
            ObjectPath target = to->value.asReference();
            if (target.nameSpace().empty())
                target.setNameSpace(ns);
            if (!q.resultClass.empty() && !isA(target.className(), q.resultClass))
                continue;
            if (q.op == AssocOp::AssociatorNames) {
                out.push_back(Value::reference(target));
                continue;
            }
            Instance inst;
            if (getInstance(r, target, q.props, inst).ok())
                out.push_back(Value::instance(std::move(inst)));
        }
    }
    return Status{};
}

// ---- methods --------------------------------------------------------------

Status HostImpl::invokeMethod(const Req& r, const ObjectPath& p, const std::string& method,
                              const PropertyVector& in, Value& ret, PropertyVector& out) {
    const std::string& ns = p.nameSpace();
    const ClassEntry* e = entry(ns, p.className(), kMethodMI);
    if (!e) {
        Status st = checkClass(ns, p.className());
        if (!st.ok())
            return st;
        return Status{CMPI_RC_ERR_NOT_SUPPORTED, "no method provider for " + p.className()};
    }
    PropertyVector args = in;
    Status typed = typedArguments(p, method, args);
    if (!typed.ok())
        return typed;
    std::vector<Value> items;
    Status st = callMI<CMPIMethodMI>(
        *e->provider, r, ns, &items,
        [&](CMPIMethodMI* mi, const CMPIContext* ctx, const CMPIResult* res, Arena& a) {
            auto* op = make<PathObj>(a, p);
            auto* ai = make<ArgsObj>(a, args);
            auto* ao = make<ArgsObj>(a);
            CMPIStatus cs =
                mi->ft->invokeMethod(mi, ctx, res, &op->c, method.c_str(), &ai->c, &ao->c);
            out = ao->args;
            return cs;
        });
    ret = items.empty() ? Value() : items.front();
    return st;
}

// ---- indications ----------------------------------------------------------

Status HostImpl::subscribe(const std::string& ns, const std::string& cls) {
    const ClassEntry* e = entry(ns, cls, kIndicationMI);
    if (!e) {
        Status st = checkClass(ns, cls);
        return st.ok() ? Status{CMPI_RC_ERR_NOT_SUPPORTED, "no indication provider for " + cls}
                       : st;
    }
    Provider& p = *e->provider;
    std::lock_guard<std::mutex> g(subMutex);
    Status st = callMI<CMPIIndicationMI>(
        p, request(), ns, nullptr,
        [&](CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPIResult*, Arena& a) {
            auto* filter = make<SelectExpObj>(a, "SELECT * FROM " + cls, "WQL");
            auto* cp = make<PathObj>(a, ObjectPath(ns, cls));
            CMPIStatus s = mi->ft->authorizeFilter(mi, ctx, &filter->c, cls.c_str(), &cp->c,
                                                   opts.principal.c_str());
            if (s.rc != CMPI_RC_OK)
                return s;
            mi->ft->mustPoll(mi, ctx, &filter->c, cls.c_str(), &cp->c);  // no polling here
            return mi->ft->activateFilter(mi, ctx, &filter->c, cls.c_str(), &cp->c,
                                          p.activeFilters == 0);
        });
    if (!st.ok())
        return st;
    subs.push_back(Subscription{ns, cls, &p});
    if (++p.activeFilters == 1)
        st = callMI<CMPIIndicationMI>(
            p, request(), ns, nullptr,
            [&](CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPIResult*, Arena&) {
                return mi->ft->enableIndications(mi, ctx);
            });
    return st;
}

Status HostImpl::unsubscribe(const std::string& ns, const std::string& cls) {
    std::lock_guard<std::mutex> g(subMutex);
    auto it = std::find_if(subs.begin(), subs.end(), [&](const Subscription& s) {
        return equalsIgnoreCase(s.ns, ns) && equalsIgnoreCase(s.className, cls);
    });
    if (it == subs.end())
        return Status{CMPI_RC_ERR_NOT_FOUND, "no subscription to " + cls + " in " + ns};
    Provider& p = *it->provider;
    subs.erase(it);
    Status st = callMI<CMPIIndicationMI>(
        p, request(), ns, nullptr,
        [&](CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPIResult*, Arena& a) {
            auto* filter = make<SelectExpObj>(a, "SELECT * FROM " + cls, "WQL");
            auto* cp = make<PathObj>(a, ObjectPath(ns, cls));
            return mi->ft->deActivateFilter(mi, ctx, &filter->c, cls.c_str(), &cp->c,
                                            p.activeFilters == 1);
        });
    if (--p.activeFilters == 0) {
        Status d = callMI<CMPIIndicationMI>(
            p, request(), ns, nullptr,
            [&](CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPIResult*, Arena&) {
                return mi->ft->disableIndications(mi, ctx);
            });
        if (st.ok())
            st = d;
    }
    return st;
}

// ---- life cycle -----------------------------------------------------------

namespace {

template <class MI>
void cleanupOne(HostImpl& h, Provider& p, bool terminating, std::vector<CleanupReport>& out) {
    MI*& slot = MIInfo<MI>::slot(p);
    if (!slot)
        return;
    CMPIStatus cs = status(CMPI_RC_ERR_FAILED);
    {
        Scope scope(h, h.request(), "");
        try {
            cs = slot->ft->cleanup(slot, scope.ctx(), terminating ? 1 : 0);
        } catch (...) {
        }
    }
    out.push_back(CleanupReport{p.name, MIInfo<MI>::kind, cs.rc});
    if (terminating || cs.rc == CMPI_RC_OK)
        slot = nullptr;
}

}  // namespace

std::vector<CleanupReport> HostImpl::cleanup(bool terminating) {
    std::lock_guard<std::recursive_mutex> g(miMutex);
    std::vector<Provider*> order;
    for (auto& p : providers)
        if (p->created)
            order.push_back(p.get());
    std::sort(order.begin(), order.end(),
              [](const Provider* a, const Provider* b) { return a->created > b->created; });
    std::vector<CleanupReport> out;
    for (Provider* p : order) {
        cleanupOne<CMPIIndicationMI>(*this, *p, terminating, out);
        cleanupOne<CMPIMethodMI>(*this, *p, terminating, out);
        cleanupOne<CMPIAssociationMI>(*this, *p, terminating, out);
        cleanupOne<CMPIInstanceMI>(*this, *p, terminating, out);
        if (!p->instanceMI && !p->associationMI && !p->methodMI && !p->indicationMI)
            p->created = 0;
    }
    return out;
}

Status HostImpl::load(const std::string& modulePath, const std::string& regFile) {
    std::vector<Registration> newRegs;
    try {
        newRegs = readRegistrationFile(regFile);
    } catch (const ParseError& e) {
        return Status{CMPI_RC_ERR_FAILED, e.what()};
    }
    std::lock_guard<std::recursive_mutex> g(miMutex);
    const std::string stem = libraryStem(modulePath);
    auto moduleFor = [&](const std::string& location) {
        for (auto& m : modules)
            if (m->location == location)
                return m.get();
        auto m = std::make_unique<Module>();
        m->location = location;
        m->path = location == stem ? modulePath : dirName(modulePath) + "/lib" + location + ".so";
        modules.push_back(std::move(m));
        return modules.back().get();
    };
    Module* main = moduleFor(stem);
    for (const auto& reg : newRegs) {
        Module* m = moduleFor(reg.location);
        Provider* prov = nullptr;
        for (auto& p : providers)
            if (p->module == m && p->name == reg.provider)
                prov = p.get();
        if (!prov) {
            providers.push_back(std::make_unique<Provider>());
            prov = providers.back().get();
            prov->name = reg.provider;
            prov->module = m;
        }
        for (const auto& ns : reg.namespaces) {
            for (const auto& e : classes)
                if (equalsIgnoreCase(e.ns, ns) && equalsIgnoreCase(e.className, reg.className) &&
                    (e.kinds & reg.kinds))
                    return Status{CMPI_RC_ERR_FAILED,
                                  regFile + ": line " + std::to_string(reg.line) + ": " +
                                      reg.className + " registered twice in " + ns};
            classes.push_back(ClassEntry{reg.className, ns, reg.kinds, prov});
        }
        regs.push_back(reg);
    }
    Status st;
    if (!openModule(*main, st))
        return st;
    isLoaded = true;
    return st;
}

Status HostImpl::unload() {
    if (!isLoaded)
        return Status{};
    std::vector<Subscription> active;
    {
        std::lock_guard<std::mutex> g(subMutex);
        active = subs;
    }
    for (const auto& s : active)
        unsubscribe(s.ns, s.className);
    cleanup(true);
    std::lock_guard<std::recursive_mutex> g(miMutex);
    Status st;
    for (auto& m : modules) {
        if (m->handle && !opts.keepMapped && dlclose(m->handle) != 0 && st.ok()) {
            const char* e = dlerror();
            st = Status{CMPI_RC_ERR_FAILED, "cannot unload " + m->path + ": " + (e ? e : "?")};
        }
        m->handle = nullptr;
    }
    classes.clear();
    providers.clear();
    modules.clear();
    regs.clear();
    isLoaded = false;
    return st;
}

}  // namespace detail

// ---------------------------------------------------------------------------
// Host
// ---------------------------------------------------------------------------
using detail::AssocOp;
using detail::AssocQuery;

Host::Host() : Host(HostOptions{}) {}
Host::Host(HostOptions options) : impl_(std::make_unique<detail::HostImpl>(std::move(options))) {}
Host::~Host() = default;

Status Host::load(const std::string& modulePath, const std::string& registrationFile) {
    return impl_->load(modulePath, registrationFile);
}

bool Host::loaded() const {
    return impl_->isLoaded;
}

std::vector<Registration> Host::registrations() const {
    return impl_->regs;
}

Result<Instance> Host::enumerateInstances(const std::string& ns, const std::string& className,
                                          const PropertyList& props) {
    Result<Instance> r;
    static_cast<Status&>(r) = impl_->enumInstances(impl_->request(), ns, className, props, r.items);
    return r;
}

Result<ObjectPath> Host::enumerateInstanceNames(const std::string& ns,
                                                const std::string& className) {
    Result<ObjectPath> r;
    static_cast<Status&>(r) = impl_->enumNames(impl_->request(), ns, className, r.items);
    return r;
}

InstanceResult Host::getInstance(const ObjectPath& path, const PropertyList& props) {
    InstanceResult r;
    static_cast<Status&>(r) = impl_->getInstance(impl_->request(), path, props, r.instance);
    return r;
}

PathResult Host::createInstance(const Instance& inst) {
    PathResult r;
    static_cast<Status&>(r) = impl_->createInstance(impl_->request(), inst.path(), inst, r.path);
    return r;
}

Status Host::modifyInstance(const Instance& inst, const PropertyList& props) {
    return impl_->modifyInstance(impl_->request(), inst.path(), inst, props);
}

Status Host::deleteInstance(const ObjectPath& path) {
    return impl_->deleteInstance(impl_->request(), path);
}

namespace {

template <class T>
Result<T> assocResult(detail::HostImpl& h, const AssocQuery& q) {
    Result<T> r;
    std::vector<Value> items;
    static_cast<Status&>(r) = h.associations(h.request(), q, items);
    for (const auto& v : items) {
        if constexpr (std::is_same<T, Instance>::value) {
            if (v.type() == Type::Instance && !v.isNull())
                r.items.push_back(v.asInstance());
        } else {
            if (v.type() == Type::Reference && !v.isNull())
                r.items.push_back(v.asReference());
        }
    }
    return r;
}

}  // namespace

Result<Instance> Host::associators(const ObjectPath& path, const std::string& assocClass,
                                   const std::string& resultClass, const std::string& role,
                                   const std::string& resultRole, const PropertyList& props) {
    return assocResult<Instance>(*impl_, AssocQuery{AssocOp::Associators, path, assocClass,
                                                    resultClass, role, resultRole, props});
}

Result<ObjectPath> Host::associatorNames(const ObjectPath& path, const std::string& assocClass,
                                         const std::string& resultClass, const std::string& role,
                                         const std::string& resultRole) {
    return assocResult<ObjectPath>(*impl_, AssocQuery{AssocOp::AssociatorNames, path, assocClass,
                                                      resultClass, role, resultRole, std::nullopt});
}

Result<Instance> Host::references(const ObjectPath& path, const std::string& resultClass,
                                  const std::string& role, const PropertyList& props) {
    return assocResult<Instance>(
        *impl_, AssocQuery{AssocOp::References, path, resultClass, "", role, "", props});
}

Result<ObjectPath> Host::referenceNames(const ObjectPath& path, const std::string& resultClass,
                                        const std::string& role) {
    return assocResult<ObjectPath>(
        *impl_, AssocQuery{AssocOp::ReferenceNames, path, resultClass, "", role, "", std::nullopt});
}

MethodResult Host::invokeMethod(const ObjectPath& path, const std::string& method,
                                const PropertyVector& in) {
    MethodResult r;
    static_cast<Status&>(r) =
        impl_->invokeMethod(impl_->request(), path, method, in, r.returnValue, r.out);
    return r;
}

Status Host::subscribe(const std::string& ns, const std::string& className) {
    return impl_->subscribe(ns, className);
}

Status Host::unsubscribe(const std::string& ns, const std::string& className) {
    return impl_->unsubscribe(ns, className);
}

std::vector<Indication> Host::indications() const {
    std::lock_guard<std::mutex> g(impl_->indMutex);
    return impl_->inds;
}

std::vector<Indication> Host::takeIndications() {
    std::lock_guard<std::mutex> g(impl_->indMutex);
    std::vector<Indication> taken;
    taken.swap(impl_->inds);
    return taken;
}

void Host::clearIndications() {
    std::lock_guard<std::mutex> g(impl_->indMutex);
    impl_->inds.clear();
}

bool Host::waitForIndications(std::size_t count, std::chrono::milliseconds timeout) const {
    std::unique_lock<std::mutex> lk(impl_->indMutex);
    return impl_->indCv.wait_for(lk, timeout, [&] { return impl_->inds.size() >= count; });
}

InstanceStore& Host::store(const std::string& ns) {
    return impl_->store(ns);
}

void Host::addSubclass(const std::string& sub, const std::string& super) {
    std::lock_guard<std::mutex> g(impl_->classMutex);
    impl_->superOf[toLower(sub)] = toLower(super);
}

std::vector<CleanupReport> Host::cleanup(bool terminating) {
    return impl_->cleanup(terminating);
}

Status Host::unload() {
    return impl_->unload();
}

std::vector<std::string> Host::logMessages() const {
    std::lock_guard<std::mutex> g(impl_->logMutex);
    return impl_->logs;
}

const _CMPIBroker* Host::broker() const {
    return &impl_->broker;
}

std::size_t Host::liveObjects() {
    return detail::Encap::live.load();
}

}  // namespace tvrnhost
