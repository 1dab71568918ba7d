// The provider of TAVRIN_ComputerSystem.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ComputerSystem_Methods.h"

namespace CPTA {

class TAVRIN_ComputerSystem_Provider
    : public Instance_Provider<TAVRIN_ComputerSystem>,
      public TAVRIN_ComputerSystem_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ComputerSystem)
