// The provider of TAVRIN_CommMechHostedAccessPoint.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_CommMechHostedAccessPoint_Methods.h"

namespace CPTA {

class TAVRIN_CommMechHostedAccessPoint_Provider
    : public Association_Provider<TAVRIN_CommMechHostedAccessPoint>,
      public TAVRIN_CommMechHostedAccessPoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(CommMechHostedAccessPoint)
