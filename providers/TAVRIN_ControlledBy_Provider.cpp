// The provider of TAVRIN_ControlledBy: each port controller with the FC ports
// of its adapter.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_ControlledBy_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kPorts = TVRN_PAIRING.controller_with_every(Source::FC_PORTS_OF_ADAPTER);

constexpr Object_Scopes kScopes = Object_Scopes()
                                      .from(CID_PORT_CONTROLLER, Narrowing::OBJECT)
                                      .from(CID_FC_PORT, Narrowing::ADAPTER);

}  // namespace

class TAVRIN_ControlledBy_Provider
    : public Keyed_Pairing_Provider<TAVRIN_ControlledBy, kPorts, kScopes>,
      public TAVRIN_ControlledBy_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ControlledBy)
