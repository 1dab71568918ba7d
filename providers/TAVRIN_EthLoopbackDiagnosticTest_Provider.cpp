// The provider of TAVRIN_EthLoopbackDiagnosticTest: the external and serdes loopback tests of an
// Ethernet port; the test's Name picks the mode.
#include "providers/Diagnostic_Test_Provider.h"
#include "providers/generated/TAVRIN_EthLoopbackDiagnosticTest_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_EthLoopbackDiagnosticTest_Source = {
    CID_ETH_LOOPBACK_DIAGNOSTIC_TEST,
    fromFCHBAManager,
    "No ethloopback diagnostic test is available",
    LL_WARN,
    QUIET,
    TVRN_SOURCE_FILE,
    __LINE__};

const Diagnostic_Start TAVRIN_EthLoopbackDiagnosticTest_Start = {
    {{"TAVRIN_EthernetPort", nullptr}}, start_named<&DiagnosticHelper::runEthLoopbackTest>};

class TAVRIN_EthLoopbackDiagnosticTest_Provider
    : public Diagnostic_Test_Provider<TAVRIN_EthLoopbackDiagnosticTest,
                                      TAVRIN_EthLoopbackDiagnosticTest_Source,
                                      TAVRIN_EthLoopbackDiagnosticTest_Start>,
      public TAVRIN_EthLoopbackDiagnosticTest_Methods {
public:
    using Diagnostic_Test_Provider::RunDiagnostic;
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthLoopbackDiagnosticTest)
