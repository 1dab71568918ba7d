// The provider of TAVRIN_AvailableDiagnosticServiceForEthernetPort: every
// Ethernet port with the Ethernet loopback and PCI loopback tests.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_AvailableDiagnosticServiceForEthernetPort_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kPortTests =
    TVRN_PAIRING
        .fetch(CID_ETHERNET_PORT)  // 0
        .when_empty(LL_WARN, "No ethernet ports are present for running dianostics.")
        .fetch(CID_ETH_LOOPBACK_DIAGNOSTIC_TEST, CID_PCI_LOOPBACK_DIAGNOSTIC_TEST)  // 1
        .when_empty(LL_WARN, "No diagnostic tests are available.")
        .for_each(0)
        .as("UserOfService")
        .with_every(1, "ServiceProvided");

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_ETHERNET_PORT, Narrowing::OBJECT, Narrowing::WHOLE);

}  // namespace

class TAVRIN_AvailableDiagnosticServiceForEthernetPort_Provider
    : public Keyed_Pairing_Provider<TAVRIN_AvailableDiagnosticServiceForEthernetPort, kPortTests,
                                    kScopes>,
      public TAVRIN_AvailableDiagnosticServiceForEthernetPort_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AvailableDiagnosticServiceForEthernetPort)
