// Embedded CMPI host: plays the CIM server's side of CMPI for tests and
// tools. It loads provider libraries with dlopen, learns from a registration
// file which provider serves which class in which namespace, creates MIs on
// first use through the exported <provider>_Create_<Kind>MI functions, and
// talks to them only through the CMPI function tables.
//
// Requests (from this API or up-calls from providers) for a class that a
// provider serves go to that provider's MI, re-entrantly on the calling
// thread; other classes are answered from per-namespace instance stores that
// tests seed. Every request runs with its own context and its own memory
// arena: objects that the broker makes during the request are freed when it
// ends, unless the provider cloned them.
#ifndef TVRN_HOST_HOST_H
#define TVRN_HOST_HOST_H

#include <chrono>
#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "host/registration.h"
#include "host/value.h"

struct _CMPIBroker;

namespace tvrnhost {

// Name of a CMPI return code ("CMPI_RC_ERR_NOT_FOUND"); unknown codes give
// "CMPI_RC_<n>".
std::string rcName(int rc);

struct Status {
    int rc = 0;  // a CMPIrc value
    std::string msg;
    bool ok() const { return rc == 0; }
    // "CMPI_RC_OK", or "CMPI_RC_ERR_NOT_FOUND: message".
    std::string toString() const;
};

template <class T>
struct Result : Status {
    std::vector<T> items;
};

struct InstanceResult : Status {
    Instance instance;
};

struct PathResult : Status {
    ObjectPath path;
};

struct MethodResult : Status {
    Value returnValue;
    PropertyVector out;
    const Value* outArg(std::string_view name) const { return findProperty(out, name); }
};

struct Indication {
    std::string nameSpace;
    Instance instance;
};

struct CleanupReport {
    std::string provider;
    std::string kind;  // "instance", "association", "method", "indication"
    int rc = 0;
};

// Property list of a request; nullopt asks for every property.
using PropertyList = std::optional<std::vector<std::string>>;

// Instances of classes that no provider serves, for one namespace.
// Thread-safe.
class InstanceStore {
public:
    virtual ~InstanceStore() = default;
    // False (and nothing stored) when an instance with the same path exists.
    // The instance takes the store's namespace.
    virtual bool add(Instance inst) = 0;
    virtual bool remove(const ObjectPath& path) = 0;
    virtual std::optional<Instance> find(const ObjectPath& path) const = 0;
    virtual std::vector<Instance> all() const = 0;
    // Makes a class known without instances (enumerations then answer
    // empty rather than CMPI_RC_ERR_INVALID_CLASS).
    virtual void defineClass(const std::string& className) = 0;
    virtual void clear() = 0;
};

// A class as a CIM server knows it from its class repository.
struct ParameterInfo {
    std::string name;
    Type type = Type::String;  // Reference for a REF, Instance for an embedded instance
    bool array = false;
};

struct MethodInfo {
    std::string name;
    std::vector<ParameterInfo> parameters;  // the input parameters
};

struct ClassInfo {
    std::string name;
    std::string superclass;  // empty for a root class
    // Every property, inherited ones too, in the class's order, with the
    // class's default (a null value of the property's type where it has none).
    PropertyVector properties;
    std::vector<MethodInfo> methods;
};

// The classes of the namespaces the host serves. With one, the host does
// what a server does with its repository: new instances start with the
// class's defaults, a superclass of a served class is a class it knows (as
// the class of an enumeration, an association class or a result class),
// and method arguments are converted to the declared parameter types.
class ClassRepository {
public:
    virtual ~ClassRepository() = default;
    // Case-insensitive; null for an unknown class.
    virtual const ClassInfo* find(std::string_view className) const = 0;
};

struct HostOptions {
    std::string principal = "root";  // context entry CMPIPrincipal
    unsigned invocationFlags = 0;    // context entry CMPIInvocationFlags
    bool keepMapped = false;         // do not dlclose provider libraries
    // Classes of the served namespaces; none: the host knows only the
    // classes the registrations name and those declared by addSubclass.
    // Not owned; it must outlive the host.
    const ClassRepository* classes = nullptr;
    // With classes: whether new instances start with the class defaults (as
    // in a server) or empty, so that a property the provider leaves unset
    // shows as missing rather than as its default.
    bool classDefaults = true;
};

namespace detail {
class HostImpl;
}

class Host {
public:
    Host();
    explicit Host(HostOptions options);
    ~Host();  // unloads (terminating cleanup) if still loaded
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    // Reads the registration file and opens the library at `modulePath`,
    // which serves registrations whose location is its name
    // (lib<location>.so); other locations are looked up next to it. May be
    // called again to add further modules.
    Status load(const std::string& modulePath, const std::string& registrationFile);
    bool loaded() const;
    std::vector<Registration> registrations() const;

    Result<Instance> enumerateInstances(const std::string& ns, const std::string& className,
                                        const PropertyList& props = std::nullopt);
    Result<ObjectPath> enumerateInstanceNames(const std::string& ns, const std::string& className);
    InstanceResult getInstance(const ObjectPath& path, const PropertyList& props = std::nullopt);
    // The class, namespace and keys come from inst.path().
    PathResult createInstance(const Instance& inst);
    Status modifyInstance(const Instance& inst, const PropertyList& props = std::nullopt);
    Status deleteInstance(const ObjectPath& path);

    Result<Instance> associators(const ObjectPath& path, const std::string& assocClass = "",
                                 const std::string& resultClass = "", const std::string& role = "",
                                 const std::string& resultRole = "",
                                 const PropertyList& props = std::nullopt);
    Result<ObjectPath> associatorNames(const ObjectPath& path, const std::string& assocClass = "",
                                       const std::string& resultClass = "",
                                       const std::string& role = "",
                                       const std::string& resultRole = "");
    // `resultClass` is the association class, as in CMPI.
    Result<Instance> references(const ObjectPath& path, const std::string& resultClass = "",
                                const std::string& role = "",
                                const PropertyList& props = std::nullopt);
    Result<ObjectPath> referenceNames(const ObjectPath& path, const std::string& resultClass = "",
                                      const std::string& role = "");

    MethodResult invokeMethod(const ObjectPath& path, const std::string& method,
                              const PropertyVector& in = {});

    // Activates an indication filter on `className` in namespace `ns` with
    // the provider that serves the class (authorizeFilter, mustPoll,
    // activateFilter, and enableIndications for the first filter).
    Status subscribe(const std::string& ns, const std::string& className);
    Status unsubscribe(const std::string& ns, const std::string& className);
    // Indications delivered so far, in order of delivery.
    std::vector<Indication> indications() const;
    // The same, removing them: none is missed or seen twice by a caller that
    // takes them while more arrive.
    std::vector<Indication> takeIndications();
    void clearIndications();
    // Waits until at least `count` indications have been delivered.
    bool waitForIndications(std::size_t count, std::chrono::milliseconds timeout) const;

    InstanceStore& store(const std::string& ns);
    // Declares `sub` a subclass of `super` (used by enumerations, class-path
    // checks and association filters).
    void addSubclass(const std::string& sub, const std::string& super);

    // Calls cleanup on every MI created so far. MIs that agree are dropped
    // (the next request creates them again); the others stay. With
    // `terminating`, every MI is dropped whatever it answers.
    std::vector<CleanupReport> cleanup(bool terminating);
    // Deactivates subscriptions, runs the terminating cleanup and closes the
    // libraries (unless keepMapped).
    Status unload();

    // Messages the providers logged or traced through the broker.
    std::vector<std::string> logMessages() const;

    // The broker handed to providers (for tests that call it directly).
    const _CMPIBroker* broker() const;

    // Encapsulated objects made by any host's broker and not yet freed.
    static std::size_t liveObjects();

private:
    std::unique_ptr<detail::HostImpl> impl_;
};

}  // namespace tvrnhost

#endif
