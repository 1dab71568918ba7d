// Connector inventory: one physical connector per FC port, from the port's
// optic (SFP).
#ifndef CPTA_INVENTORY_PHYSICALASSETHELPER_H
#define CPTA_INVENTORY_PHYSICALASSETHELPER_H

#include <json/json.h>

#include "framework/Array.h"
#include "framework/Instance.h"
#include "gateway/ClassId.h"
#include "inventory/InventoryRecords.h"

namespace CPTA {

class InstanceList;

class PhysicalAssetHelper {
public:
    static PhysicalAssetHelper* getPhysicalAssetHelperObject();

    // All instances of class 35. Never throws.
    Array<Instance*> getInstancesByClass(classId_t classId);
    Instance* getPhysicalConnectorInstance(const _sfpInfo& sfp);

    // The optic record of port position `portPosition` of adapter
    // `adapterNumber`, from the library's optic answer.
    static _sfpInfo readOptic(const Json::Value& sfp, int adapterNumber, int portPosition);

private:
    PhysicalAssetHelper() = default;
    void walk(classId_t classId, InstanceList& out);
};

}  // namespace CPTA

#endif
