// The provider of TAVRIN_AgentService.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_AgentService_Methods.h"
#include "rpc/JsonRpcManager.h"

namespace CPTA {

const Inventory_Source TAVRIN_AgentService_Source = {
    CID_AGENT_SERVICE, fromServerManager, "No AgentService Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE,  __LINE__};

class TAVRIN_AgentService_Provider
    : public Inventory_Provider<TAVRIN_AgentService, TAVRIN_AgentService_Source>,
      public TAVRIN_AgentService_Methods {
public:
    // The management tunnel: a JSON-RPC request in, its response out. Every
    // failure is reported inside the response; the method itself succeeds.
    Invoke_Method_Status executeMethod(const TAVRIN_AgentService*, Property<String>& response,
                                       const Property<String>& request,
                                       Property<uint32>& return_value) {
        response.set(JsonRpcManager::executeMethod(request));
        return_value.set(0);
        return INVOKE_METHOD_OK;
    }
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AgentService)
