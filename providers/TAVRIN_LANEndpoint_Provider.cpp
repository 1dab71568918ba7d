// The provider of TAVRIN_LANEndpoint.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_LANEndpoint_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_LANEndpoint_Source = {
    CID_LAN_ENDPOINT, fromFCHBAManager, "No Ethernet Port Found", LL_WARN, ANNOUNCED,
    TVRN_SOURCE_FILE, __LINE__};

class TAVRIN_LANEndpoint_Provider
    : public Inventory_Provider<TAVRIN_LANEndpoint, TAVRIN_LANEndpoint_Source>,
      public TAVRIN_LANEndpoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LANEndpoint)
