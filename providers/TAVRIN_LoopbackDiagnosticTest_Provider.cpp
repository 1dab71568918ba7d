// The provider of TAVRIN_LoopbackDiagnosticTest.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_LoopbackDiagnosticTest_Methods.h"

namespace CPTA {

class TAVRIN_LoopbackDiagnosticTest_Provider
    : public Instance_Provider<TAVRIN_LoopbackDiagnosticTest>,
      public TAVRIN_LoopbackDiagnosticTest_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LoopbackDiagnosticTest)
