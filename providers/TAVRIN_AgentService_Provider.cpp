// The provider of TAVRIN_AgentService.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_AgentService_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_AgentService_Source = {
    CID_AGENT_SERVICE, fromServerManager, "No AgentService Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE,  __LINE__};

class TAVRIN_AgentService_Provider
    : public Inventory_Provider<TAVRIN_AgentService, TAVRIN_AgentService_Source>,
      public TAVRIN_AgentService_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AgentService)
