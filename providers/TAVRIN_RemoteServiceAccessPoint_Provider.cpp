// The provider of TAVRIN_RemoteServiceAccessPoint: the host management
// agent's access point, while the agent runs.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_RemoteServiceAccessPoint_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_RemoteServiceAccessPoint_Source = {CID_REMOTE_SERVICE_ACCESS_POINT,
                                                                 fromFCHBAManager,
                                                                 "Warning: No service is available",
                                                                 LL_WARN,
                                                                 AT_MOST_ONE,
                                                                 TVRN_SOURCE_FILE,
                                                                 __LINE__};

class TAVRIN_RemoteServiceAccessPoint_Provider
    : public Inventory_Provider<TAVRIN_RemoteServiceAccessPoint,
                                TAVRIN_RemoteServiceAccessPoint_Source>,
      public TAVRIN_RemoteServiceAccessPoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(RemoteServiceAccessPoint)
