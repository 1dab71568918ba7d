// The provider of TAVRIN_HostedDependency.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_HostedDependency_Methods.h"

namespace CPTA {

class TAVRIN_HostedDependency_Provider
    : public Association_Provider<TAVRIN_HostedDependency>,
      public TAVRIN_HostedDependency_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HostedDependency)
