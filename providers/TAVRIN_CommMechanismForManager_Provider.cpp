// The provider of TAVRIN_CommMechanismForManager.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_CommMechanismForManager_Methods.h"

namespace CPTA {

class TAVRIN_CommMechanismForManager_Provider
    : public Association_Provider<TAVRIN_CommMechanismForManager>,
      public TAVRIN_CommMechanismForManager_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(CommMechanismForManager)
