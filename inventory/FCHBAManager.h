// The class dispatchers. Providers never call an inventory helper for their
// own class: they ask FCHBAManager (adapters, ports, Ethernet, connectors, the
// host, the server profile, and later software update and diagnostics) or
// HDRManager (storage extents, tape drives, logical disks) for all instances
// of a class id. Both refuse to ask the adapter library anything while the
// adapter driver is not usable.
//
// Every operation runs as one request: it opens the thread's
// HostIdentityScope, so the host is resolved at most once however many
// instances are built, and it never throws. The caller owns the returned
// array and every instance in it.
#ifndef CPTA_INVENTORY_FCHBAMANAGER_H
#define CPTA_INVENTORY_FCHBAMANAGER_H

#include "framework/Array.h"
#include "framework/Instance.h"
#include "framework/String.h"
#include "gateway/ClassId.h"

namespace CPTA {

class AdapterHelper;
struct PortScope;
class CommonHelper;
class EthernetPortHelper;
class PhysicalAssetHelper;
class PortHelper;

// One row of a dispatcher's routing table: the class ids first..last go to
// `build`, behind the driver gate when `needsDriver`. A row whose helper does
// not exist yet has no `build` and answers like an unrouted class id.
struct InventoryRoute {
    classId_t first;
    classId_t last;
    bool needsDriver;
    Array<Instance*> (*build)(classId_t classId);
};

class FCHBAManager {
public:
    static FCHBAManager* getFCHBAManager();

    // All instances of the class, routed by class id.
    Array<Instance*> getInstances(classId_t classId);
    // The TAVRIN_FCPort instances of one adapter (WWN or MAC, with or
    // without colons).
    Array<Instance*> getFCPortInstancesByAdapter(const String& adapterKey);
    // The TAVRIN_EthernetPort instances of the adapter owning this port.
    Array<Instance*> getEthernetPortInstancesByAdapter(const String& portKey);
    // The instances of an FC port class (3, 4, 5, 30, 36) or of a class the
    // targets give (9, 16, 38) for the one port and the remote ports of the
    // scope (PortHelper::getInstancesByPort), behind the driver gate.
    Array<Instance*> getInstancesByPort(classId_t classId, const PortScope& scope);

    AdapterHelper* getAdapterHelper() const { return _adapterHelper; }
    PortHelper* getPortHelper() const { return _portHelper; }
    CommonHelper* getCommonHelper() const { return _commonHelper; }
    EthernetPortHelper* getEthernetPortHelper() const { return _ethernetPortHelper; }
    PhysicalAssetHelper* getPhysicalAssetHelper() const { return _physicalAssetHelper; }

    // The routing table (for inspection).
    static const InventoryRoute* routes(size_t& count);
    // Gives the route that starts at `first` its builder, if it has none:
    // the layers above the inventory fill their routes when the module
    // loads, before any request. False when there is no such route.
    static bool fillRoute(classId_t first, Array<Instance*> (*build)(classId_t classId));

private:
    FCHBAManager();
    FCHBAManager(const FCHBAManager&) = delete;
    FCHBAManager& operator=(const FCHBAManager&) = delete;

    AdapterHelper* _adapterHelper;
    PortHelper* _portHelper;
    CommonHelper* _commonHelper;
    EthernetPortHelper* _ethernetPortHelper;
    PhysicalAssetHelper* _physicalAssetHelper;
};

class HDRManager {
public:
    static HDRManager* getHDRManager();

    // All instances of class 9, 16 or 38.
    Array<Instance*> getInstances(classId_t classId);

    PortHelper* getPortHelper() const { return _portHelper; }

    static const InventoryRoute* routes(size_t& count);

private:
    HDRManager();
    HDRManager(const HDRManager&) = delete;
    HDRManager& operator=(const HDRManager&) = delete;

    PortHelper* _portHelper;
};

}  // namespace CPTA

#endif
