// Target and LUN inventory: the storage seen through one local FC port. Every
// LUN of a disk target gives a storage extent and a logical disk; every LUN of
// a tape or media-changer target gives a tape drive.
#ifndef CPTA_INVENTORY_TARGETHELPER_H
#define CPTA_INVENTORY_TARGETHELPER_H

#include <json/json.h>

#include "framework/Array.h"
#include "framework/Instance.h"
#include "gateway/ClassId.h"
#include "inventory/InventoryRecords.h"
#include "inventory/PortHelper.h"

namespace CPTA {

class TargetHelper {
public:
    static TargetHelper* getTargetHelperObject();

    // The instances of class 9, 16 or 38 behind the local port `port`
    // (its portId is the port's colon-free WWN), from the remote ports the
    // scope admits (only those are asked about). Never throws.
    Array<Instance*> getTargetInstances(const _hbaPortInfo& port, classId_t classId,
                                        const PortScope& scope = PortScope());

    // Builders: one new instance each (null only when memory runs out).
    Instance* getStorageExtentInstance(const _hbaPortInfo& port, const _hbaLunInfo& lun);
    Instance* getTapeDriveInstance(const _hbaPortInfo& port, const _hbaLunInfo& lun);
    Instance* getLogicalDiskInstance(const _hbaPortInfo& port, const _hbaLunInfo& lun);

    // The LUN record of one element of a remote port's "lunList"; false
    // (after "LUN info is NOT available") when it lacks its number, vendor or
    // product.
    static bool readLun(const Json::Value& element, const String& remotePortWwn, _hbaLunInfo& lun);

private:
    TargetHelper() = default;
};

}  // namespace CPTA

#endif
