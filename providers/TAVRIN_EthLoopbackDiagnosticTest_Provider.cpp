// The provider of TAVRIN_EthLoopbackDiagnosticTest.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_EthLoopbackDiagnosticTest_Methods.h"

namespace CPTA {

class TAVRIN_EthLoopbackDiagnosticTest_Provider
    : public Instance_Provider<TAVRIN_EthLoopbackDiagnosticTest>,
      public TAVRIN_EthLoopbackDiagnosticTest_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthLoopbackDiagnosticTest)
