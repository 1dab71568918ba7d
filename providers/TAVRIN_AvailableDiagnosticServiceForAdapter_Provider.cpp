// The provider of TAVRIN_AvailableDiagnosticServiceForAdapter: every port
// controller with the memory test.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_AvailableDiagnosticServiceForAdapter_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kAdapterTests =
    TVRN_PAIRING
        .fetch(CID_PORT_CONTROLLER)  // 0
        .when_empty(LL_WARN, "No adapters are present in the host for running dianostics.")
        .fetch(CID_MEMORY_DIAGNOSTIC_TEST)  // 1
        .when_empty(LL_WARN, "No diagnostic tests are available.")
        .for_each(0)
        .as("UserOfService")
        .with_every(1, "ServiceProvided");

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_PORT_CONTROLLER, Narrowing::OBJECT, Narrowing::WHOLE);

}  // namespace

class TAVRIN_AvailableDiagnosticServiceForAdapter_Provider
    : public Keyed_Pairing_Provider<TAVRIN_AvailableDiagnosticServiceForAdapter, kAdapterTests,
                                    kScopes>,
      public TAVRIN_AvailableDiagnosticServiceForAdapter_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AvailableDiagnosticServiceForAdapter)
