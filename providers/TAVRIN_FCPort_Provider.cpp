// The provider of TAVRIN_FCPort.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_FCPort_Methods.h"

namespace CPTA {

class TAVRIN_FCPort_Provider
    : public Instance_Provider<TAVRIN_FCPort>,
      public TAVRIN_FCPort_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(FCPort)
