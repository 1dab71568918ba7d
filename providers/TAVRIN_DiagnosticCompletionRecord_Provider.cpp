// The provider of TAVRIN_DiagnosticCompletionRecord: the outcomes of diagnostic test runs.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_DiagnosticCompletionRecord_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_DiagnosticCompletionRecord_Source = {
    CID_DIAGNOSTIC_COMPLETION_RECORD,
    fromFCHBAManager,
    "No completion records are available.",
    LL_INFO,
    ANNOUNCED,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_DiagnosticCompletionRecord_Provider
    : public Inventory_Provider<TAVRIN_DiagnosticCompletionRecord,
                                TAVRIN_DiagnosticCompletionRecord_Source>,
      public TAVRIN_DiagnosticCompletionRecord_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DiagnosticCompletionRecord)
