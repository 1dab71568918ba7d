// Internals of the embedded host: memory arenas, the encapsulated CMPI
// objects the broker hands out, conversions between CMPI data and host
// values, and the HostImpl that routes requests. Not for use outside host/.
#ifndef TVRN_HOST_INTERNAL_H
#define TVRN_HOST_INTERNAL_H

#include <cmpidt.h>
#include <cmpift.h>
#include <cmpimacs.h>

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <set>
#include <string>
#include <vector>

#include "host/host.h"

namespace tvrnhost {
namespace detail {

// ---------------------------------------------------------------------------
// Ownership. Everything the broker allocates is a Node owned by an Arena: the
// arena of the request (or attached thread) that made it, the parent object
// it was read from, or none for clones (the provider releases those).
// ---------------------------------------------------------------------------
class Arena;

struct Node {
    Node* prev = nullptr;
    Node* next = nullptr;
    Arena* owner = nullptr;
    std::uint64_t seq = 0;
    virtual ~Node() = default;
};

class Arena {
public:
    Arena();
    ~Arena();  // frees every node still owned
    Arena(const Arena&) = delete;
    Arena& operator=(const Arena&) = delete;

    void adopt(Node* n);
    void disown(Node* n);  // unlinks without freeing
    void freeAll();
    // Frees the nodes adopted after the one with sequence number `seq`.
    void freeAfter(std::uint64_t seq);
    std::uint64_t lastSeq();

private:
    std::mutex m_;
    Node head_;
    std::uint64_t nextSeq_ = 1;
};

// Unlinks `n` from its owner (if any) and deletes it.
void destroy(Node* n);

enum class Kind : std::uint8_t {
    String,
    Array,
    Instance,
    ObjectPath,
    Args,
    Enumeration,
    DateTime,
    Context,
    Result,
    SelectExp,
};

constexpr std::uint32_t kMagic = 0x484e5654;  // "TVNH"

struct Encap : Node {
    explicit Encap(Kind k) : kind(k) { ++live; }
    ~Encap() override {
        magic = 0;
        --live;
    }
    std::uint32_t magic = kMagic;
    Kind kind;
    Arena children;  // objects handed out by getters of this object
    static std::atomic<std::size_t> live;
};

template <class CT, class FT, Kind K>
struct Obj : Encap {
    using CType = CT;
    static constexpr Kind kKind = K;
    explicit Obj(FT* ft) : Encap(K) {
        c.hdl = static_cast<Encap*>(this);
        c.ft = ft;
    }
    CT c;
};

extern CMPIStringFT gStringFT;
extern CMPIArrayFT gArrayFT;
extern CMPIInstanceFT gInstanceFT;
extern CMPIObjectPathFT gObjectPathFT;
extern CMPIArgsFT gArgsFT;
extern CMPIEnumerationFT gEnumerationFT;
extern CMPIDateTimeFT gDateTimeFT;
extern CMPIContextFT gContextFT;
extern CMPIResultFT gResultFT;
extern CMPISelectExpFT gSelectExpFT;

struct StringObj : Obj<CMPIString, CMPIStringFT, Kind::String> {
    explicit StringObj(std::string v) : Obj(&gStringFT), s(std::move(v)) {}
    StringObj* clone() const { return new StringObj(s); }
    std::string s;
};

struct ArrayObj : Obj<CMPIArray, CMPIArrayFT, Kind::Array> {
    ArrayObj(Type t, std::vector<Value> v) : Obj(&gArrayFT), elem(t), items(std::move(v)) {}
    ArrayObj* clone() const { return new ArrayObj(elem, items); }
    Type elem;
    std::vector<Value> items;
};

struct InstanceObj : Obj<CMPIInstance, CMPIInstanceFT, Kind::Instance> {
    explicit InstanceObj(Instance i) : Obj(&gInstanceFT), inst(std::move(i)) {}
    InstanceObj* clone() const {
        auto* o = new InstanceObj(inst);
        o->filter = filter;
        return o;
    }
    bool admits(const std::string& name) const;
    Instance inst;
    // Lower-case names that setProperty accepts, when a filter is set.
    std::optional<std::set<std::string>> filter;
};

struct PathObj : Obj<CMPIObjectPath, CMPIObjectPathFT, Kind::ObjectPath> {
    explicit PathObj(ObjectPath p) : Obj(&gObjectPathFT), path(std::move(p)) {}
    PathObj* clone() const { return new PathObj(path); }
    ObjectPath path;
};

struct ArgsObj : Obj<CMPIArgs, CMPIArgsFT, Kind::Args> {
    explicit ArgsObj(PropertyVector a = {}) : Obj(&gArgsFT), args(std::move(a)) {}
    ArgsObj* clone() const { return new ArgsObj(args); }
    PropertyVector args;
};

struct EnumObj : Obj<CMPIEnumeration, CMPIEnumerationFT, Kind::Enumeration> {
    explicit EnumObj(std::vector<Value> v) : Obj(&gEnumerationFT), items(std::move(v)) {}
    EnumObj* clone() const {
        auto* o = new EnumObj(items);
        o->pos = pos;
        return o;
    }
    std::vector<Value> items;
    std::size_t pos = 0;
};

struct DateTimeObj : Obj<CMPIDateTime, CMPIDateTimeFT, Kind::DateTime> {
    explicit DateTimeObj(DateTime d) : Obj(&gDateTimeFT), dt(std::move(d)) {}
    DateTimeObj* clone() const { return new DateTimeObj(dt); }
    DateTime dt;
};

struct ContextObj : Obj<CMPIContext, CMPIContextFT, Kind::Context> {
    explicit ContextObj(PropertyVector e) : Obj(&gContextFT), entries(std::move(e)) {}
    ContextObj* clone() const { return new ContextObj(entries); }
    PropertyVector entries;
};

struct ResultObj : Obj<CMPIResult, CMPIResultFT, Kind::Result> {
    ResultObj() : Obj(&gResultFT) {}
    ResultObj* clone() const { return nullptr; }
    std::mutex m;
    std::vector<Value> items;  // instances, references or data, in order
    bool done = false;
};

struct SelectExpObj : Obj<CMPISelectExp, CMPISelectExpFT, Kind::SelectExp> {
    SelectExpObj(std::string q, std::string l)
        : Obj(&gSelectExpFT), query(std::move(q)), lang(std::move(l)) {}
    SelectExpObj* clone() const { return new SelectExpObj(query, lang); }
    std::string query, lang;
};

// The object behind a handle, or null when the handle is not one of ours of
// that kind (or was released).
template <class O>
O* objectOf(const typename O::CType* c) {
    if (!c || !c->hdl || c->ft == nullptr)
        return nullptr;
    auto* e = static_cast<Encap*>(c->hdl);
    if (e->magic != kMagic || e->kind != O::kKind)
        return nullptr;
    return static_cast<O*>(e);
}

template <class O, class... A>
O* make(Arena& a, A&&... args) {
    auto* o = new O(std::forward<A>(args)...);
    a.adopt(o);
    return o;
}

// ---------------------------------------------------------------------------
// Conversions
// ---------------------------------------------------------------------------
CMPIType cmpiType(Type t, bool array);
// Host type of a CMPI type (array bit ignored; CMPI_chars reads as string).
std::optional<Type> hostType(CMPIType t);
// Reads a CMPI value into a host value; not OK for types the host does not
// carry or handles it does not know. For CMPI_chars, `v` is the C string
// itself (the usual CMSetProperty(i, n, "text", CMPI_chars) idiom).
CMPIrc fromCMPI(const CMPIValue* v, CMPIType t, Value& out);
// Makes CMPI data of a host value; objects it needs are owned by `owner`.
CMPIData toCMPI(const Value& v, Arena& owner);
std::string readString(const CMPIString* s);

// Null-terminated C property list of a PropertyList, and back.
class CPropertyList {
public:
    explicit CPropertyList(const PropertyList& p);
    const char** get() { return on_ ? ptrs_.data() : nullptr; }

private:
    bool on_;
    std::vector<std::string> names_;
    std::vector<const char*> ptrs_;
};
PropertyList propertyList(const char** props);

inline void setRc(CMPIStatus* rc, CMPIrc code) {
    if (rc) {
        rc->rc = code;
        rc->msg = nullptr;
    }
}
inline CMPIStatus status(CMPIrc code) {
    return CMPIStatus{code, nullptr};
}

// ---------------------------------------------------------------------------
// Per-thread state: the arenas of the requests (and attached threads) in
// progress on this thread, innermost last.
// ---------------------------------------------------------------------------
struct ThreadState {
    std::vector<Arena*> arenas;
    std::vector<std::pair<const CMPIContext*, Arena*>> attached;
};
ThreadState& threadState();

// ---------------------------------------------------------------------------
// The host
// ---------------------------------------------------------------------------
struct Module {
    std::string location;
    std::string path;
    void* handle = nullptr;
    std::string error;  // why it could not be opened
};

struct Provider {
    std::string name;
    Module* module = nullptr;
    CMPIInstanceMI* instanceMI = nullptr;
    CMPIAssociationMI* associationMI = nullptr;
    CMPIMethodMI* methodMI = nullptr;
    CMPIIndicationMI* indicationMI = nullptr;
    int activeFilters = 0;
    std::uint64_t created = 0;  // creation order of its first MI
};

struct ClassEntry {
    std::string className;
    std::string ns;
    unsigned kinds;
    Provider* provider;
};

struct Subscription {
    std::string ns, className;
    Provider* provider;
};

enum class AssocOp { Associators, AssociatorNames, References, ReferenceNames };

struct AssocQuery {
    AssocOp op;
    ObjectPath source;
    std::string assocClass, resultClass, role, resultRole;
    PropertyList props;
};

class StoreImpl;

class HostImpl {
public:
    explicit HostImpl(HostOptions o);
    ~HostImpl();

    static HostImpl* of(const CMPIBroker* b);

    // Who is asking; taken from the context of an up-call.
    struct Req {
        std::string principal;
    };
    Req request() const { return Req{opts.principal}; }
    Req requestFrom(const CMPIContext* ctx) const;
    // The namespace of a path, or the context's initial namespace.
    std::string nameSpaceOf(const ObjectPath& p, const CMPIContext* ctx) const;

    Status enumInstances(const Req& r, const std::string& ns, const std::string& cls,
                         const PropertyList& props, std::vector<Instance>& out);
    Status enumNames(const Req& r, const std::string& ns, const std::string& cls,
                     std::vector<ObjectPath>& out);
    Status getInstance(const Req& r, const ObjectPath& p, const PropertyList& props, Instance& out);
    Status createInstance(const Req& r, const ObjectPath& p, const Instance& inst, ObjectPath& out);
    Status modifyInstance(const Req& r, const ObjectPath& p, const Instance& inst,
                          const PropertyList& props);
    Status deleteInstance(const Req& r, const ObjectPath& p);
    Status associations(const Req& r, const AssocQuery& q, std::vector<Value>& out);
    Status invokeMethod(const Req& r, const ObjectPath& p, const std::string& method,
                        const PropertyVector& in, Value& ret, PropertyVector& out);
    Status subscribe(const std::string& ns, const std::string& cls);
    Status unsubscribe(const std::string& ns, const std::string& cls);
    std::vector<CleanupReport> cleanup(bool terminating);
    Status load(const std::string& modulePath, const std::string& regFile);
    Status unload();

    void deliver(const std::string& ns, Instance inst);
    void log(std::string line);
    bool isA(const std::string& cls, const std::string& super) const;
    // A new instance on `path`, with the class's defaults when the host
    // knows the class (classes.cpp).
    Instance newInstance(const ObjectPath& path) const;
    // The arguments as the declared parameters of the method take them;
    // not OK for an argument that does not convert (classes.cpp).
    Status typedArguments(const ObjectPath& target, const std::string& method,
                          PropertyVector& args) const;
    StoreImpl& store(const std::string& ns);  // made on first use
    std::vector<Instance> storedInstances(const std::string& ns) const;

    // Where objects made on this thread right now belong.
    Arena& currentArena();

    CMPIBroker broker{};
    HostOptions opts;
    Arena orphans;   // made on threads outside any request
    Arena prepared;  // contexts from prepareAttachThread

    mutable std::mutex logMutex;
    std::vector<std::string> logs;

    mutable std::mutex indMutex;
    mutable std::condition_variable indCv;
    std::vector<Indication> inds;

    mutable std::mutex classMutex;
    std::map<std::string, std::string> superOf;  // lower-case sub -> super

    mutable std::mutex storeMutex;
    std::map<std::string, std::unique_ptr<StoreImpl>> stores;  // lower-case ns

    // Registrations and providers: written by load/unload only.
    std::vector<Registration> regs;
    std::vector<std::unique_ptr<Module>> modules;
    std::vector<std::unique_ptr<Provider>> providers;
    std::vector<ClassEntry> classes;
    bool isLoaded = false;

    std::recursive_mutex miMutex;  // MI creation and cleanup
    std::uint64_t createdCount = 0;
    std::mutex subMutex;
    std::vector<Subscription> subs;

private:
    const ClassEntry* entry(const std::string& ns, const std::string& cls, unsigned kind) const;
    bool nameSpaceKnown(const std::string& ns) const;
    bool classKnown(const std::string& ns, const std::string& cls) const;
    Status checkClass(const std::string& ns, const std::string& cls) const;
    template <class MI>
    MI* mi(Provider& p, Status& st);
    template <class MI, class F>
    Status callMI(Provider& p, const Req& r, const std::string& ns, std::vector<Value>* items,
                  F&& f);
    Status storeAssociations(const Req& r, const std::string& ns, const AssocQuery& q,
                             std::vector<Value>& out);
};

// Fills in the broker's tables (broker.cpp).
void initBroker(HostImpl& h);

}  // namespace detail
}  // namespace tvrnhost

#endif
