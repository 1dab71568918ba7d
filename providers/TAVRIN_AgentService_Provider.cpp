// The provider of TAVRIN_AgentService.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AgentService_Methods.h"

namespace CPTA {

class TAVRIN_AgentService_Provider : public Instance_Provider<TAVRIN_AgentService>,
                                     public TAVRIN_AgentService_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AgentService)
