// The provider of TAVRIN_RemoteServiceHostedAccessPoint.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_RemoteServiceHostedAccessPoint_Methods.h"

namespace CPTA {

class TAVRIN_RemoteServiceHostedAccessPoint_Provider
    : public Association_Provider<TAVRIN_RemoteServiceHostedAccessPoint>,
      public TAVRIN_RemoteServiceHostedAccessPoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(RemoteServiceHostedAccessPoint)
