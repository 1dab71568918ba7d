// The provider of TAVRIN_MemoryDiagnosticTest: a memory test on a port controller (an adapter).
#include "providers/Diagnostic_Test_Provider.h"
#include "providers/generated/TAVRIN_MemoryDiagnosticTest_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_MemoryDiagnosticTest_Source = {
    CID_MEMORY_DIAGNOSTIC_TEST,
    fromFCHBAManager,
    "No memory diagnostic test is available",
    LL_WARN,
    QUIET,
    TVRN_SOURCE_FILE,
    __LINE__};

const Diagnostic_Start TAVRIN_MemoryDiagnosticTest_Start = {
    {{"TAVRIN_PortController", nullptr}}, start_on<&DiagnosticHelper::runMemoryTest>};

class TAVRIN_MemoryDiagnosticTest_Provider
    : public Diagnostic_Test_Provider<TAVRIN_MemoryDiagnosticTest,
                                      TAVRIN_MemoryDiagnosticTest_Source,
                                      TAVRIN_MemoryDiagnosticTest_Start>,
      public TAVRIN_MemoryDiagnosticTest_Methods {
public:
    using Diagnostic_Test_Provider::RunDiagnostic;
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(MemoryDiagnosticTest)
