// The provider of TAVRIN_PortControllerSystemDevice.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_PortControllerSystemDevice_Methods.h"

namespace CPTA {

class TAVRIN_PortControllerSystemDevice_Provider
    : public Association_Provider<TAVRIN_PortControllerSystemDevice>,
      public TAVRIN_PortControllerSystemDevice_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PortControllerSystemDevice)
