// The provider of TAVRIN_LANEndpointDeviceSAPImplementation: each Ethernet
// port with its LAN endpoint.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_LANEndpointDeviceSAPImplementation_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kEndpoints = TVRN_PAIRING.fetch(CID_ETHERNET_PORT)
                                   .when_empty(LL_WARN, "No Ethernet Port Found")  // 0
                                   .fetch(CID_LAN_ENDPOINT)                        // 1
                                   .when_empty(LL_WARN, "Invalid number of EndPoint instances ")
                                   .when_differs(0, LL_ERR, "Error: Invalid mapping information!")
                                   .for_each(0)
                                   .as("Antecedent")
                                   .with_first(1, "Dependent", key("DeviceID"), key("MACAddress"));

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_ETHERNET_PORT, Narrowing::OBJECT, Narrowing::ETHERNET_PORT);

}  // namespace

class TAVRIN_LANEndpointDeviceSAPImplementation_Provider
    : public Keyed_Pairing_Provider<TAVRIN_LANEndpointDeviceSAPImplementation, kEndpoints, kScopes>,
      public TAVRIN_LANEndpointDeviceSAPImplementation_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LANEndpointDeviceSAPImplementation)
