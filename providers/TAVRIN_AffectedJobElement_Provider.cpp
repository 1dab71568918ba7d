// The provider of TAVRIN_AffectedJobElement.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AffectedJobElement_Methods.h"

namespace CPTA {

class TAVRIN_AffectedJobElement_Provider : public Association_Provider<TAVRIN_AffectedJobElement>,
                                           public TAVRIN_AffectedJobElement_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AffectedJobElement)
