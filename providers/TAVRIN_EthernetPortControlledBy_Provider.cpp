// The provider of TAVRIN_EthernetPortControlledBy: each port controller with
// the Ethernet ports of its adapter.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_EthernetPortControlledBy_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kEthernetPorts =
    TVRN_PAIRING.controller_with_every(Source::ETHERNET_PORTS_OF_ADAPTER);

constexpr Object_Scopes kScopes = Object_Scopes()
                                      .from(CID_PORT_CONTROLLER, Narrowing::OBJECT)
                                      .from(CID_ETHERNET_PORT, Narrowing::ADAPTER);

}  // namespace

class TAVRIN_EthernetPortControlledBy_Provider
    : public Keyed_Pairing_Provider<TAVRIN_EthernetPortControlledBy, kEthernetPorts, kScopes>,
      public TAVRIN_EthernetPortControlledBy_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthernetPortControlledBy)
