// The provider of TAVRIN_ProfileSoftwareIdentity.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ProfileSoftwareIdentity_Methods.h"

namespace CPTA {

class TAVRIN_ProfileSoftwareIdentity_Provider
    : public Instance_Provider<TAVRIN_ProfileSoftwareIdentity>,
      public TAVRIN_ProfileSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ProfileSoftwareIdentity)
