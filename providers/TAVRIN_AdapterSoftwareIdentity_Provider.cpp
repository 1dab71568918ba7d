// The provider of TAVRIN_AdapterSoftwareIdentity.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AdapterSoftwareIdentity_Methods.h"

namespace CPTA {

class TAVRIN_AdapterSoftwareIdentity_Provider
    : public Instance_Provider<TAVRIN_AdapterSoftwareIdentity>,
      public TAVRIN_AdapterSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AdapterSoftwareIdentity)
