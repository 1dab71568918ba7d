// The provider of TAVRIN_CompletionRecordAppliesToElement.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_CompletionRecordAppliesToElement_Methods.h"

namespace CPTA {

class TAVRIN_CompletionRecordAppliesToElement_Provider
    : public Association_Provider<TAVRIN_CompletionRecordAppliesToElement>,
      public TAVRIN_CompletionRecordAppliesToElement_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(CompletionRecordAppliesToElement)
