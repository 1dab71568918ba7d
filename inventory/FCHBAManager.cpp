#include "inventory/FCHBAManager.h"

#include <iterator>

#include "framework/Log.h"
#include "gateway/ProviderUtil.h"
#include "inventory/AdapterHelper.h"
#include "inventory/CommonHelper.h"
#include "inventory/EthernetPortHelper.h"
#include "inventory/InventoryCommon.h"
#include "inventory/PhysicalAssetHelper.h"
#include "inventory/PortHelper.h"

namespace CPTA {

namespace {

Array<Instance*> computerSystem(classId_t id) {
    return CommonHelper::getCommonHelperObject()->getComputerSystemInstances(id);
}
Array<Instance*> adapters(classId_t id) {
    return AdapterHelper::getAdapterHelperInstance()->getInstancesByClass(id);
}
Array<Instance*> ports(classId_t id) {
    return PortHelper::getPortHelperObject()->getInstancesByClass(id);
}
Array<Instance*> ethernetPorts(classId_t id) {
    return EthernetPortHelper::getEthernetPortHelperObject()->getInstancesByClass(id);
}
Array<Instance*> connectors(classId_t id) {
    return PhysicalAssetHelper::getPhysicalAssetHelperObject()->getInstancesByClass(id);
}

// The server profile (10 to 15, 17, 37), the firmware update (18, 19) and
// the diagnostics (21 to 28, 31 to 33) live above the inventory and fill their
// routes when the module loads (fillRoute).
InventoryRoute kFCHBARoutes[] = {
    {CID_COMPUTER_SYSTEM, CID_COMPUTER_SYSTEM, false, computerSystem},
    {CID_PORT_CONTROLLER, CID_PORT_CONTROLLER, true, adapters},
    {CID_FC_PORT, CID_FC_PORT_STATISTICS, true, ports},
    {CID_PHYSICAL_PACKAGE, CID_ADAPTER_SOFTWARE_IDENTITY, true, adapters},
    {CID_REGISTERED_PROFILE, CID_PROFILE_SOFTWARE_IDENTITY, false, nullptr},
    {CID_REMOTE_SERVICE_ACCESS_POINT, CID_REMOTE_SERVICE_ACCESS_POINT, false, nullptr},
    {CID_HBA_SOFTWARE_INSTALLATION_SERVICE, CID_HBA_SOFTWARE_INSTALLATION_SERVICE_CAPABILITIES,
     true, nullptr},
    {CID_ETHERNET_PORT, CID_ETHERNET_PORT, true, ethernetPorts},
    {CID_MEMORY_DIAGNOSTIC_TEST, CID_DIAGNOSTIC_COMPLETION_RECORD, true, nullptr},
    {CID_LOGICAL_PORT_GROUP, CID_LOGICAL_PORT_GROUP, true, ports},
    {CID_AFFECTED_JOB_ELEMENT, CID_COMPLETION_RECORD_APPLIES_TO_ELEMENT, true, nullptr},
    {CID_LAN_ENDPOINT, CID_LAN_ENDPOINT, true, ethernetPorts},
    {CID_PHYSICAL_CONNECTOR, CID_PHYSICAL_CONNECTOR, true, connectors},
    {CID_ALARM_DEVICE, CID_ALARM_DEVICE, true, ports},
    {CID_AGENT_SERVICE, CID_AGENT_SERVICE, false, nullptr},
};

const InventoryRoute kHDRRoutes[] = {
    {CID_STORAGE_EXTENT, CID_STORAGE_EXTENT, true, ports},
    {CID_TAPE_DRIVE, CID_TAPE_DRIVE, true, ports},
    {CID_LOGICAL_DISK, CID_LOGICAL_DISK, true, ports},
};

const InventoryRoute* findRoute(const InventoryRoute* begin, const InventoryRoute* end,
                                classId_t classId) {
    for (const InventoryRoute* r = begin; r != end; r++)
        if (classId >= r->first && classId <= r->last)
            return r->build != nullptr ? r : nullptr;
    return nullptr;
}

// getInstances of both dispatchers.
Array<Instance*> dispatch(const InventoryRoute* begin, const InventoryRoute* end,
                          classId_t classId) {
    return runWalk("getInstances", [&](InstanceList& out) {
        TVRN_LOG(LL_DBG, "Entering: %s", "getInstances");
        TVRN_LOG(LL_INFO, "Requested classId : %d", int(classId));
        TVRN_LOG(LL_INFO, "Requested class is: %s", ProviderUtil::getClassName(classId).c_str());
        const bool driverUsable = ProviderUtil::getDriverStatus();
        const InventoryRoute* route = findRoute(begin, end, classId);
        if (route == nullptr) {
            TVRN_LOG(LL_INFO, "Requested class is NOT supported.");
        } else if (route->needsDriver && !driverUsable) {
            TVRN_LOG(LL_ERR,
                     "Driver is not installed or there is a tfal mismatch hence no "
                     "instances returned");
        } else {
            Array<Instance*> built = route->build(classId);
            out.take(built);
        }
        TVRN_LOG(LL_DBG, "Returning: %s", "getInstances");
    });
}

// Both dispatchers exist once the module has loaded, before any request.
struct BuiltAtLoad {
    BuiltAtLoad() {
        FCHBAManager::getFCHBAManager();
        HDRManager::getHDRManager();
    }
} builtAtLoad;

}  // namespace

// ---- FCHBAManager ----------------------------------------------------------------

FCHBAManager::FCHBAManager()
    : _adapterHelper(AdapterHelper::getAdapterHelperInstance()),
      _portHelper(PortHelper::getPortHelperObject()),
      _commonHelper(CommonHelper::getCommonHelperObject()),
      _ethernetPortHelper(EthernetPortHelper::getEthernetPortHelperObject()),
      _physicalAssetHelper(PhysicalAssetHelper::getPhysicalAssetHelperObject()) {
    TVRN_LOG(LL_DBG, "Inside FCHBAManager Constructor");
    // ProviderUtil::getEthDeviceNameByMAC reads Ethernet ports through us.
    ProviderUtil::setEthPortDetailsHook(&EthernetPortHelper::getEthPortDetails);
}

FCHBAManager* FCHBAManager::getFCHBAManager() {
    TVRN_LOG(LL_DBG, "Entering: %s", "getFCHBAManager");
    static FCHBAManager instance;
    TVRN_LOG(LL_DBG, "Returning: %s", "getFCHBAManager");
    return &instance;
}

const InventoryRoute* FCHBAManager::routes(size_t& count) {
    count = std::size(kFCHBARoutes);
    return kFCHBARoutes;
}

bool FCHBAManager::fillRoute(classId_t first, Array<Instance*> (*build)(classId_t classId)) {
    for (InventoryRoute& r : kFCHBARoutes)
        if (r.first == first && r.build == nullptr) {
            r.build = build;
            return true;
        }
    return false;
}

Array<Instance*> FCHBAManager::getInstances(classId_t classId) {
    return dispatch(std::begin(kFCHBARoutes), std::end(kFCHBARoutes), classId);
}

Array<Instance*> FCHBAManager::getFCPortInstancesByAdapter(const String& adapterKey) {
    HostIdentityScope scope;
    return _portHelper->getFCPortInstancesByAdapter(adapterKey);
}

Array<Instance*> FCHBAManager::getEthernetPortInstancesByAdapter(const String& portKey) {
    HostIdentityScope scope;
    return _ethernetPortHelper->getEthernetPortInstancesByAdapter(portKey);
}

Array<Instance*> FCHBAManager::getInstancesByPort(classId_t classId, const PortScope& scope) {
    HostIdentityScope host;
    if (!ProviderUtil::getDriverStatus())
        return Array<Instance*>();
    return _portHelper->getInstancesByPort(classId, scope);
}

// ---- HDRManager --------------------------------------------------------------------

HDRManager::HDRManager() : _portHelper(PortHelper::getPortHelperObject()) {
    TVRN_LOG(LL_DBG, "Inside HDRManager Constructor");
}

HDRManager* HDRManager::getHDRManager() {
    static HDRManager instance;
    return &instance;
}

const InventoryRoute* HDRManager::routes(size_t& count) {
    count = std::size(kHDRRoutes);
    return kHDRRoutes;
}

Array<Instance*> HDRManager::getInstances(classId_t classId) {
    return dispatch(std::begin(kHDRRoutes), std::end(kHDRRoutes), classId);
}

}  // namespace CPTA
