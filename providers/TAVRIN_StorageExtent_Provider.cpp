// The provider of TAVRIN_StorageExtent.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_StorageExtent_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_StorageExtent_Source = {
    CID_STORAGE_EXTENT, fromHDRManager, "No StorageExtents Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE,   __LINE__};

class TAVRIN_StorageExtent_Provider
    : public Inventory_Provider<TAVRIN_StorageExtent, TAVRIN_StorageExtent_Source>,
      public TAVRIN_StorageExtent_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(StorageExtent)
