// The provider of TAVRIN_AvailableDiagnosticServiceForFCPort: every FC port
// with the FC loopback and PCI loopback tests, but the ports of a converged
// adapter without the internal loopback test.
#include "diagnostics/DiagnosticHelper.h"
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_AvailableDiagnosticServiceForFCPort_Methods.h"
#include "schema/generated/TAVRIN_PortController.h"

namespace CPTA {

namespace {

bool offered_on(const Instance* adapter, const Instance* test) {
    const auto* controller = static_cast<const TAVRIN_PortController*>(adapter);
    if (controller->ControllerType.null || controller->ControllerType.value != 1)
        return true;
    const Property<String>* name = text_property(test, "Name");
    if (name == nullptr || name->null ||
        !name->value.equali(getDiagTestName(DIAG_INTERNAL_LOOPBACK_TEST)))
        return true;
    TVRN_LOG(LL_INFO, " The PortController is CNA");
    return false;
}

constexpr Pairing kPortTests =
    TVRN_PAIRING
        .fetch(CID_PORT_CONTROLLER)  // 0
        .when_empty(LL_WARN, "No adapters are available.")
        .fetch(CID_LOOPBACK_DIAGNOSTIC_TEST, CID_PCI_LOOPBACK_DIAGNOSTIC_TEST)  // 1
        .when_empty(LL_WARN, "No diagnostic tests are available.")
        .fetch_for_each(Source::FC_PORTS_OF_ADAPTER, key("DeviceID"))  // 2
        .when_empty(LL_WARN,
                    "No ports are present for running dianostics.Continue with remaining adapter")
        .for_each(0)
        .pair(2, "UserOfService")
        .with_every(1, "ServiceProvided")
        .only_for_walked(offered_on);

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_FC_PORT, Narrowing::ADAPTER, Narrowing::WHOLE);

}  // namespace

class TAVRIN_AvailableDiagnosticServiceForFCPort_Provider
    : public Keyed_Pairing_Provider<TAVRIN_AvailableDiagnosticServiceForFCPort, kPortTests,
                                    kScopes>,
      public TAVRIN_AvailableDiagnosticServiceForFCPort_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AvailableDiagnosticServiceForFCPort)
