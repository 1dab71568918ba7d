// The provider of TAVRIN_HostedAccessPoint.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_HostedAccessPoint_Methods.h"

namespace CPTA {

class TAVRIN_HostedAccessPoint_Provider
    : public Association_Provider<TAVRIN_HostedAccessPoint>,
      public TAVRIN_HostedAccessPoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HostedAccessPoint)
