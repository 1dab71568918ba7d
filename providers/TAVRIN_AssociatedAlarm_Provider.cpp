// The provider of TAVRIN_AssociatedAlarm.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AssociatedAlarm_Methods.h"

namespace CPTA {

class TAVRIN_AssociatedAlarm_Provider
    : public Association_Provider<TAVRIN_AssociatedAlarm>,
      public TAVRIN_AssociatedAlarm_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AssociatedAlarm)
