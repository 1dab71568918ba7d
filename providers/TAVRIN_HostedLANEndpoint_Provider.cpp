// The provider of TAVRIN_HostedLANEndpoint: the host with every LAN endpoint.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_HostedLANEndpoint_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted =
    TVRN_PAIRING
        .host_with_every(CID_LAN_ENDPOINT, "Antecedent", "Dependent",
                         "Error: Invalid number of ComputerSystem instances")
        .when_empty(LL_WARN, "No Ethernet Port Found");

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_LAN_ENDPOINT, Narrowing::WHOLE, Narrowing::OBJECT);

}  // namespace

class TAVRIN_HostedLANEndpoint_Provider
    : public Keyed_Pairing_Provider<TAVRIN_HostedLANEndpoint, kHosted, kScopes>,
      public TAVRIN_HostedLANEndpoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HostedLANEndpoint)
