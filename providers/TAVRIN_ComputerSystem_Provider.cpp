// The provider of TAVRIN_ComputerSystem.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_ComputerSystem_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_ComputerSystem_Source = {
    CID_COMPUTER_SYSTEM, fromFCHBAManager, "Error: Invalid mapping information", LL_ERR, SINGLE,
    TVRN_SOURCE_FILE,    __LINE__};

class TAVRIN_ComputerSystem_Provider
    : public Inventory_Provider<TAVRIN_ComputerSystem, TAVRIN_ComputerSystem_Source>,
      public TAVRIN_ComputerSystem_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ComputerSystem)
