// The provider of TAVRIN_ControlledBy: each port controller with the FC ports
// of its adapter.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_ControlledBy_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kPorts = TVRN_PAIRING.controller_with_every(Source::FC_PORTS_OF_ADAPTER);

}  // namespace

class TAVRIN_ControlledBy_Provider : public Pairing_Provider<TAVRIN_ControlledBy, kPorts>,
                                     public TAVRIN_ControlledBy_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ControlledBy)
