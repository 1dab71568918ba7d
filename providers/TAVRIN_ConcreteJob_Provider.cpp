// The provider of TAVRIN_ConcreteJob: the job of the latest diagnostic test run (it cannot be
// killed or changed).
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_ConcreteJob_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_ConcreteJob_Source = {
    CID_CONCRETE_JOB, fromFCHBAManager, "No jobs are currently running in the system.",
    LL_INFO,          ANNOUNCED,        TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_ConcreteJob_Provider
    : public Inventory_Provider<TAVRIN_ConcreteJob, TAVRIN_ConcreteJob_Source>,
      public TAVRIN_ConcreteJob_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ConcreteJob)
