// The provider of TAVRIN_OwningJobElement.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_OwningJobElement_Methods.h"

namespace CPTA {

class TAVRIN_OwningJobElement_Provider : public Association_Provider<TAVRIN_OwningJobElement>,
                                         public TAVRIN_OwningJobElement_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(OwningJobElement)
