// The provider of TAVRIN_EthernetPortSystemDevice: the host with every
// Ethernet port.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_EthernetPortSystemDevice_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted = TVRN_PAIRING.host_with_every(
    CID_ETHERNET_PORT, "GroupComponent", "PartComponent", "Invalid mapping information");

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_ETHERNET_PORT, Narrowing::WHOLE, Narrowing::OBJECT);

}  // namespace

class TAVRIN_EthernetPortSystemDevice_Provider
    : public Keyed_Pairing_Provider<TAVRIN_EthernetPortSystemDevice, kHosted, kScopes>,
      public TAVRIN_EthernetPortSystemDevice_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthernetPortSystemDevice)
