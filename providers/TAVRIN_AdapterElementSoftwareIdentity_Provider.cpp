// The provider of TAVRIN_AdapterElementSoftwareIdentity.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AdapterElementSoftwareIdentity_Methods.h"

namespace CPTA {

class TAVRIN_AdapterElementSoftwareIdentity_Provider
    : public Association_Provider<TAVRIN_AdapterElementSoftwareIdentity>,
      public TAVRIN_AdapterElementSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AdapterElementSoftwareIdentity)
