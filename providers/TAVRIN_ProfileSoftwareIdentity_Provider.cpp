// The provider of TAVRIN_ProfileSoftwareIdentity.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_ProfileSoftwareIdentity_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_ProfileSoftwareIdentity_Source = {
    CID_PROFILE_SOFTWARE_IDENTITY,
    fromServerManager,
    "Error: Invalid number of ProfileSoftwareIdentity Instances",
    LL_ERR,
    REQUIRED,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_ProfileSoftwareIdentity_Provider
    : public Inventory_Provider<TAVRIN_ProfileSoftwareIdentity,
                                TAVRIN_ProfileSoftwareIdentity_Source>,
      public TAVRIN_ProfileSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ProfileSoftwareIdentity)
