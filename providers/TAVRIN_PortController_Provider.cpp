// The provider of TAVRIN_PortController.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_PortController_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_PortController_Source = {
    CID_PORT_CONTROLLER, fromFCHBAManager, "No Adapter Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE,    __LINE__};

class TAVRIN_PortController_Provider
    : public Inventory_Provider<TAVRIN_PortController, TAVRIN_PortController_Source>,
      public TAVRIN_PortController_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PortController)
