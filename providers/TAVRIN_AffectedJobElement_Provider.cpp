// The provider of TAVRIN_AffectedJobElement: the diagnostic job with the element it tests.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_AffectedJobElement_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_AffectedJobElement_Source = {
    CID_AFFECTED_JOB_ELEMENT,
    fromFCHBAManager,
    "Any affectedJobElement association could not be formed.",
    LL_INFO,
    QUIET,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_AffectedJobElement_Provider
    : public Inventory_Provider<TAVRIN_AffectedJobElement, TAVRIN_AffectedJobElement_Source,
                                Association_Provider<TAVRIN_AffectedJobElement>>,
      public TAVRIN_AffectedJobElement_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AffectedJobElement)
