// The provider of TAVRIN_HostedDependency: on each CNA, every FC port with the
// Ethernet port of the same port number.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_HostedDependency_Methods.h"
#include "schema/generated/TAVRIN_PortController.h"

namespace CPTA {

namespace {

const uint16 kFcHba = 4;  // ControllerType

bool is_cna(const Instance* instance) {
    const auto* controller = static_cast<const TAVRIN_PortController*>(instance);
    return controller->ControllerType.null || controller->ControllerType.value != kFcHba;
}

constexpr Pairing kPortPairs =
    TVRN_PAIRING
        .fetch(CID_PORT_CONTROLLER)                                    // 0
        .fetch_for_each(Source::FC_PORTS_OF_ADAPTER, key("DeviceID"))  // 1
        .when_empty(LL_INFO, "There are no FCPORT instances returned")
        .fetch_for_each(Source::ETHERNET_PORTS_OF_ADAPTER, key("DeviceID"))  // 2
        .when_empty(LL_INFO, "There are no ETHPORT instances returned")
        .for_each(0, is_cna)
        .pair(1, "Dependent")
        .with_first(2, "Antecedent", key("PortNumber"), key("PortNumber"));

constexpr Object_Scopes kScopes = Object_Scopes()
                                      .from(CID_FC_PORT, Narrowing::ADAPTER)
                                      .from(CID_ETHERNET_PORT, Narrowing::ADAPTER);

}  // namespace

class TAVRIN_HostedDependency_Provider
    : public Keyed_Pairing_Provider<TAVRIN_HostedDependency, kPortPairs, kScopes>,
      public TAVRIN_HostedDependency_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HostedDependency)
