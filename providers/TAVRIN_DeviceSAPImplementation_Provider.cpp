// The provider of TAVRIN_DeviceSAPImplementation.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_DeviceSAPImplementation_Methods.h"

namespace CPTA {

class TAVRIN_DeviceSAPImplementation_Provider
    : public Association_Provider<TAVRIN_DeviceSAPImplementation>,
      public TAVRIN_DeviceSAPImplementation_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DeviceSAPImplementation)
