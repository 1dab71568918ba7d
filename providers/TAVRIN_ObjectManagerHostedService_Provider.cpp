// The provider of TAVRIN_ObjectManagerHostedService.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ObjectManagerHostedService_Methods.h"

namespace CPTA {

class TAVRIN_ObjectManagerHostedService_Provider
    : public Association_Provider<TAVRIN_ObjectManagerHostedService>,
      public TAVRIN_ObjectManagerHostedService_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ObjectManagerHostedService)
