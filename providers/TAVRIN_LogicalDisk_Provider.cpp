// The provider of TAVRIN_LogicalDisk.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_LogicalDisk_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_LogicalDisk_Source = {
    CID_LOGICAL_DISK, fromHDRManager, "No LogicalDisks Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE, __LINE__};

class TAVRIN_LogicalDisk_Provider
    : public Inventory_Provider<TAVRIN_LogicalDisk, TAVRIN_LogicalDisk_Source>,
      public TAVRIN_LogicalDisk_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LogicalDisk)
