// The provider of TAVRIN_InstalledSoftwareIdentity.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_InstalledSoftwareIdentity_Methods.h"

namespace CPTA {

class TAVRIN_InstalledSoftwareIdentity_Provider
    : public Association_Provider<TAVRIN_InstalledSoftwareIdentity>,
      public TAVRIN_InstalledSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(InstalledSoftwareIdentity)
