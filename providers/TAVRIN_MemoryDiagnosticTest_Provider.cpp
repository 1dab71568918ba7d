// The provider of TAVRIN_MemoryDiagnosticTest.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_MemoryDiagnosticTest_Methods.h"

namespace CPTA {

class TAVRIN_MemoryDiagnosticTest_Provider : public Instance_Provider<TAVRIN_MemoryDiagnosticTest>,
                                             public TAVRIN_MemoryDiagnosticTest_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(MemoryDiagnosticTest)
