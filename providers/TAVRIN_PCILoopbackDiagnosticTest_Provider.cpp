// The provider of TAVRIN_PCILoopbackDiagnosticTest.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_PCILoopbackDiagnosticTest_Methods.h"

namespace CPTA {

class TAVRIN_PCILoopbackDiagnosticTest_Provider
    : public Instance_Provider<TAVRIN_PCILoopbackDiagnosticTest>,
      public TAVRIN_PCILoopbackDiagnosticTest_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PCILoopbackDiagnosticTest)
