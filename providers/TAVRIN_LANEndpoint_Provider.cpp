// The provider of TAVRIN_LANEndpoint.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_LANEndpoint_Methods.h"

namespace CPTA {

class TAVRIN_LANEndpoint_Provider
    : public Instance_Provider<TAVRIN_LANEndpoint>,
      public TAVRIN_LANEndpoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LANEndpoint)
