// The provider of TAVRIN_ProfileElementSoftwareIdentity.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ProfileElementSoftwareIdentity_Methods.h"

namespace CPTA {

class TAVRIN_ProfileElementSoftwareIdentity_Provider
    : public Association_Provider<TAVRIN_ProfileElementSoftwareIdentity>,
      public TAVRIN_ProfileElementSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ProfileElementSoftwareIdentity)
