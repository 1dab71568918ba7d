// The provider of TAVRIN_TapeDrive.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_TapeDrive_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_TapeDrive_Source = {
    CID_TAPE_DRIVE,   fromHDRManager, "No TapeDrives Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE, __LINE__};

class TAVRIN_TapeDrive_Provider
    : public Inventory_Provider<TAVRIN_TapeDrive, TAVRIN_TapeDrive_Source>,
      public TAVRIN_TapeDrive_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(TapeDrive)
