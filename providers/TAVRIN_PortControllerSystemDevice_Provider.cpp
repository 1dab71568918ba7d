// The provider of TAVRIN_PortControllerSystemDevice: the host with every port
// controller.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_PortControllerSystemDevice_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted =
    TVRN_PAIRING
        .host_with_every(CID_PORT_CONTROLLER, "GroupComponent", "PartComponent",
                         "Error: Returned instances for ComputerSystem is not 1")
        .when_empty(LL_ERR, "Error: Invalid mapping information")
        .announce(LL_INFO, "Building and returning association instances....\n");

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_PORT_CONTROLLER, Narrowing::WHOLE, Narrowing::OBJECT);

}  // namespace

class TAVRIN_PortControllerSystemDevice_Provider
    : public Keyed_Pairing_Provider<TAVRIN_PortControllerSystemDevice, kHosted, kScopes>,
      public TAVRIN_PortControllerSystemDevice_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PortControllerSystemDevice)
