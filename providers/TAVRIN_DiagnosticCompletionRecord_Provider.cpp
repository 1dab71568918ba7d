// The provider of TAVRIN_DiagnosticCompletionRecord.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_DiagnosticCompletionRecord_Methods.h"

namespace CPTA {

class TAVRIN_DiagnosticCompletionRecord_Provider
    : public Instance_Provider<TAVRIN_DiagnosticCompletionRecord>,
      public TAVRIN_DiagnosticCompletionRecord_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DiagnosticCompletionRecord)
