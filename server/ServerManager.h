// Server and profile registration: the profiles this module implements, the
// software that implements them, and the object manager, namespace,
// communication mechanism and agent service through which clients reach
// them. Nothing here asks the adapter library; everything is fixed text, the
// host's identity and the CIM server's own object manager.
//
// Every instance is new and belongs to the caller, as does the array.
#ifndef CPTA_SERVER_SERVERMANAGER_H
#define CPTA_SERVER_SERVERMANAGER_H

#include "framework/Array.h"
#include "framework/Instance.h"
#include "framework/Property.h"
#include "framework/String.h"
#include "gateway/ClassId.h"

namespace CPTA {

class ServerManager {
public:
    static ServerManager* getServerManager();

    // All instances of class 10 to 15 or 37, whatever the adapter driver's
    // state; any other class id gives none. Never throws.
    Array<Instance*> getInstances(classId_t classId);

    // The sub-profiles a registered profile requires, in order; the profile
    // name is compared without regard to case.
    Array<String> getSubProfilesOfProfile(const String& profile);

private:
    ServerManager();
    ServerManager(const ServerManager&) = delete;
    ServerManager& operator=(const ServerManager&) = delete;
};

// The CIM server's own object manager, as this module names it.
struct ObjectManagerIdentity {
    Property<String> name;
    Property<String> caption;
    Property<String> description;
};

// The object manager's identity comes from the CIM server (its
// CIM_ObjectManager in root/PG_InterOp) and is asked for at most once per
// request: inside a scope the first build that needs it asks and the others
// of the request reuse the answer, so the object manager and the namespace
// that names it always agree. Scopes nest (an inner one joins the outermost,
// which forgets the answer when it closes); ServerManager::getInstances
// opens one, and so does a provider that builds several of these classes in
// one request. Outside any scope every call asks afresh.
class ObjectManagerScope {
public:
    ObjectManagerScope() noexcept;
    ~ObjectManagerScope();

    ObjectManagerScope(const ObjectManagerScope&) = delete;
    ObjectManagerScope& operator=(const ObjectManagerScope&) = delete;

    // The identity. When the server cannot be asked or has no object manager
    // with a name, every part is "CIM Server": the name is a key of the
    // object manager and of the namespace, and is never left null.
    static ObjectManagerIdentity identity();
};

}  // namespace CPTA

#endif
