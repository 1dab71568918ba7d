// The provider of TAVRIN_CompletionRecordAppliesToElement: each diagnostic completion record with
// the element of its run.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_CompletionRecordAppliesToElement_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_CompletionRecordAppliesToElement_Source = {
    CID_COMPLETION_RECORD_APPLIES_TO_ELEMENT,
    fromFCHBAManager,
    "No completion records or managed elements are present.",
    LL_INFO,
    QUIET,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_CompletionRecordAppliesToElement_Provider
    : public Inventory_Provider<TAVRIN_CompletionRecordAppliesToElement,
                                TAVRIN_CompletionRecordAppliesToElement_Source,
                                Association_Provider<TAVRIN_CompletionRecordAppliesToElement>>,
      public TAVRIN_CompletionRecordAppliesToElement_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(CompletionRecordAppliesToElement)
