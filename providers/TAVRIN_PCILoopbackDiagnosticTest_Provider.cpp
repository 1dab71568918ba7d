// The provider of TAVRIN_PCILoopbackDiagnosticTest: the PCI loopback test of an FC or Ethernet
// port.
#include "providers/Diagnostic_Test_Provider.h"
#include "providers/generated/TAVRIN_PCILoopbackDiagnosticTest_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_PCILoopbackDiagnosticTest_Source = {
    CID_PCI_LOOPBACK_DIAGNOSTIC_TEST,
    fromFCHBAManager,
    "No PCI loopback diagnostic test is available",
    LL_WARN,
    QUIET,
    TVRN_SOURCE_FILE,
    __LINE__};

const Diagnostic_Start TAVRIN_PCILoopbackDiagnosticTest_Start = {
    {{"TAVRIN_FCPort", "PCI Loopback Test is requested for FC Port"},
     {"TAVRIN_EthernetPort", "PCI Loopback Test is requested for Ethernet Port"}},
    start_on<&DiagnosticHelper::runPCILoopbackTest>};

class TAVRIN_PCILoopbackDiagnosticTest_Provider
    : public Diagnostic_Test_Provider<TAVRIN_PCILoopbackDiagnosticTest,
                                      TAVRIN_PCILoopbackDiagnosticTest_Source,
                                      TAVRIN_PCILoopbackDiagnosticTest_Start>,
      public TAVRIN_PCILoopbackDiagnosticTest_Methods {
public:
    using Diagnostic_Test_Provider::RunDiagnostic;
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PCILoopbackDiagnosticTest)
