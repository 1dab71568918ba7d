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
    // The instance the walk builds for the port at `portPosition` (from 0)
    // of adapter `adapterNumber` (from 1) alone: only that adapter and that
    // port are asked about. Never throws.
    Array<Instance*> getInstancesByPosition(classId_t classId, unsigned adapterNumber,
                                            unsigned portPosition);
    Instance* getPhysicalConnectorInstance(const _sfpInfo& sfp);

    // The optic record of port position `portPosition` of adapter
    // `adapterNumber`, from the library's optic answer.
    static _sfpInfo readOptic(const Json::Value& sfp, int adapterNumber, int portPosition);

private:
    PhysicalAssetHelper() = default;
    // `onlyAdapter` 0: every adapter and port; else that adapter's port at
    // `onlyPort` alone.
    void walk(classId_t classId, InstanceList& out, unsigned onlyAdapter = 0,
              unsigned onlyPort = 0);
};

}  // namespace CPTA

#endif
