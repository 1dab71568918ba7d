// The provider of TAVRIN_RegisteredSubProfile.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_RegisteredSubProfile_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_RegisteredSubProfile_Source = {
    CID_REGISTERED_SUB_PROFILE, fromServerManager, nullptr, LL_DBG, QUIET,
    TVRN_SOURCE_FILE,           __LINE__};

class TAVRIN_RegisteredSubProfile_Provider
    : public Inventory_Provider<TAVRIN_RegisteredSubProfile, TAVRIN_RegisteredSubProfile_Source>,
      public TAVRIN_RegisteredSubProfile_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(RegisteredSubProfile)
