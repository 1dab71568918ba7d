// The provider of TAVRIN_DiagnosticServiceRecord.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_DiagnosticServiceRecord_Methods.h"

namespace CPTA {

class TAVRIN_DiagnosticServiceRecord_Provider
    : public Instance_Provider<TAVRIN_DiagnosticServiceRecord>,
      public TAVRIN_DiagnosticServiceRecord_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DiagnosticServiceRecord)
