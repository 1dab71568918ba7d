// The remote access point of the host management agent: while a process
// named mdcagent runs, one TAVRIN_RemoteServiceAccessPoint whose AccessInfo
// is the agent's console URL on this host. Reached through
// FCHBAManager::getInstances for class id 17, without the driver gate.
#ifndef CPTA_SERVER_ACCESSPOINTHELPER_H
#define CPTA_SERVER_ACCESSPOINTHELPER_H

#include "framework/Array.h"
#include "framework/Instance.h"
#include "gateway/ClassId.h"
#include "inventory/InventoryRecords.h"

namespace CPTA {

class AccessPointHelper {
public:
    static AccessPointHelper* getAccessPointHelperInstance();

    // None or one instance (the class id is not examined further): none when
    // the host is only known as "localhost" or the agent is not running.
    // Never throws.
    Array<Instance*> getInstancesByClass(classId_t classId);

    // The access point on the host the record names (its hostName alone is
    // read); null when the agent is not running.
    Instance* getRemoteServiceAccessPointInstance(_adapterData adapter);

private:
    AccessPointHelper() = default;
};

}  // namespace CPTA

#endif
