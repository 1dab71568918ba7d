// The provider of TAVRIN_LoopbackDiagnosticTest: the internal, external and serdes loopback tests
// of an FC port; the test's Name picks the mode.
#include "providers/Diagnostic_Test_Provider.h"
#include "providers/generated/TAVRIN_LoopbackDiagnosticTest_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_LoopbackDiagnosticTest_Source = {
    CID_LOOPBACK_DIAGNOSTIC_TEST,
    fromFCHBAManager,
    "No loopback diagnostic test is available",
    LL_WARN,
    QUIET,
    TVRN_SOURCE_FILE,
    __LINE__};

const Diagnostic_Start TAVRIN_LoopbackDiagnosticTest_Start = {
    {{"TAVRIN_FCPort", nullptr}}, start_named<&DiagnosticHelper::runLoopbackTest>};

class TAVRIN_LoopbackDiagnosticTest_Provider
    : public Diagnostic_Test_Provider<TAVRIN_LoopbackDiagnosticTest,
                                      TAVRIN_LoopbackDiagnosticTest_Source,
                                      TAVRIN_LoopbackDiagnosticTest_Start>,
      public TAVRIN_LoopbackDiagnosticTest_Methods {
public:
    using Diagnostic_Test_Provider::RunDiagnostic;
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LoopbackDiagnosticTest)
