// The provider of TAVRIN_ConcreteJob.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ConcreteJob_Methods.h"

namespace CPTA {

class TAVRIN_ConcreteJob_Provider : public Instance_Provider<TAVRIN_ConcreteJob>,
                                    public TAVRIN_ConcreteJob_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ConcreteJob)
