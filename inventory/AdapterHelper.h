// Adapter inventory: per adapter one port controller, one physical package,
// one product, and the software identities of its firmware and option-ROM
// BIOS and of the host's storage and network drivers.
#ifndef CPTA_INVENTORY_ADAPTERHELPER_H
#define CPTA_INVENTORY_ADAPTERHELPER_H

#include <json/json.h>

#include "framework/Array.h"
#include "framework/Instance.h"
#include "gateway/ClassId.h"
#include "inventory/InventoryRecords.h"

namespace CPTA {

class InstanceList;

// Kinds of adapter software; the numbers are those of Classifications.
enum softwareType_t {
    SOFTWARE_DRIVER = 2,
    SOFTWARE_FIRMWARE = 10,
    SOFTWARE_BIOS = 32770,
};

class AdapterHelper {
public:
    static AdapterHelper* getAdapterHelperInstance();

    // All instances of class 2, 6, 7 or 8 for all adapters, in adapter order.
    // Never throws: a library exception ends the walk with no instances.
    Array<Instance*> getInstancesByClass(classId_t classId);
    // The instances of the same classes that the walk builds for the one
    // adapter listed under `address` (colon-free WWN or MAC, in any case):
    // only that adapter is asked about.
    Array<Instance*> getInstancesByAddress(classId_t classId, const String& address);
    // The software identities of the drivers that the walk of class 8 builds,
    // up to the one named `driver`: the adapters are asked about in order
    // until that driver (or both kinds of driver) has been reported, and no
    // firmware or BIOS is asked about.
    Array<Instance*> getDriverIdentities(const String& driver);

    // Builders: one new instance each (null only when memory runs out).
    Instance* getPortControllerInstance(const _adapterData& adapter);
    Instance* getPhysicalPackageInstance(const _adapterData& adapter);
    Instance* getProductInstance(const _adapterData& adapter);
    Instance* getAdapterSoftwareIdentityInstance(const _adapterData& adapter, softwareType_t type,
                                                 bool isNetworkDriver);

    // The vital-product-data rules: FRU number, part number, OEM serial
    // number and UUID.
    void fillVPDInfo(const Json::Value& hbaData, _adapterData* record);

private:
    AdapterHelper() = default;
    // `only`: the colon-free address of the one adapter to visit; "" all.
    // `onlyDriver`: only the driver identities, up to the one of that name.
    void walk(classId_t classId, InstanceList& out, const String& only,
              const String& onlyDriver = String());
};

}  // namespace CPTA

#endif
