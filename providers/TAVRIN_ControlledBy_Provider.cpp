// The provider of TAVRIN_ControlledBy.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ControlledBy_Methods.h"

namespace CPTA {

class TAVRIN_ControlledBy_Provider
    : public Association_Provider<TAVRIN_ControlledBy>,
      public TAVRIN_ControlledBy_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ControlledBy)
