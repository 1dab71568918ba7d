// The provider of TAVRIN_FCPortSystemDevice: the host with every FC port.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_FCPortSystemDevice_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted = TVRN_PAIRING.host_with_every(
    CID_FC_PORT, "GroupComponent", "PartComponent", "Error: Invalid mapping information");

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_FC_PORT, Narrowing::WHOLE, Narrowing::OBJECT);

}  // namespace

class TAVRIN_FCPortSystemDevice_Provider
    : public Keyed_Pairing_Provider<TAVRIN_FCPortSystemDevice, kHosted, kScopes>,
      public TAVRIN_FCPortSystemDevice_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(FCPortSystemDevice)
