// The provider of TAVRIN_EthernetPortControlledBy: each port controller with
// the Ethernet ports of its adapter.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_EthernetPortControlledBy_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kEthernetPorts =
    TVRN_PAIRING.controller_with_every(Source::ETHERNET_PORTS_OF_ADAPTER);

}  // namespace

class TAVRIN_EthernetPortControlledBy_Provider
    : public Pairing_Provider<TAVRIN_EthernetPortControlledBy, kEthernetPorts>,
      public TAVRIN_EthernetPortControlledBy_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthernetPortControlledBy)
