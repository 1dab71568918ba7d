// The provider of TAVRIN_FCPort.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_FCPort_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_FCPort_Source = {CID_FC_PORT, fromFCHBAManager, "No FC Ports Found!",
                                               LL_ERR,      ANNOUNCED,        TVRN_SOURCE_FILE,
                                               __LINE__};

class TAVRIN_FCPort_Provider : public Inventory_Provider<TAVRIN_FCPort, TAVRIN_FCPort_Source>,
                               public TAVRIN_FCPort_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(FCPort)
