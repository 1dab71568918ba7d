// The provider of TAVRIN_FCPortSystemDevice.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_FCPortSystemDevice_Methods.h"

namespace CPTA {

class TAVRIN_FCPortSystemDevice_Provider
    : public Association_Provider<TAVRIN_FCPortSystemDevice>,
      public TAVRIN_FCPortSystemDevice_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(FCPortSystemDevice)
