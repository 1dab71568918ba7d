// The provider of TAVRIN_LANEndpointDeviceSAPImplementation.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_LANEndpointDeviceSAPImplementation_Methods.h"

namespace CPTA {

class TAVRIN_LANEndpointDeviceSAPImplementation_Provider
    : public Association_Provider<TAVRIN_LANEndpointDeviceSAPImplementation>,
      public TAVRIN_LANEndpointDeviceSAPImplementation_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LANEndpointDeviceSAPImplementation)
