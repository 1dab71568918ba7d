// The provider of TAVRIN_PortController.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_PortController_Methods.h"

namespace CPTA {

class TAVRIN_PortController_Provider
    : public Instance_Provider<TAVRIN_PortController>,
      public TAVRIN_PortController_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PortController)
