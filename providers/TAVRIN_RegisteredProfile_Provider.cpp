// The provider of TAVRIN_RegisteredProfile.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_RegisteredProfile_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_RegisteredProfile_Source = {
    CID_REGISTERED_PROFILE, fromServerManager, nullptr, LL_DBG, QUIET, TVRN_SOURCE_FILE, __LINE__};

class TAVRIN_RegisteredProfile_Provider
    : public Inventory_Provider<TAVRIN_RegisteredProfile, TAVRIN_RegisteredProfile_Source>,
      public TAVRIN_RegisteredProfile_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(RegisteredProfile)
