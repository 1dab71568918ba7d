// The provider of TAVRIN_HostedLANEndpoint.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_HostedLANEndpoint_Methods.h"

namespace CPTA {

class TAVRIN_HostedLANEndpoint_Provider
    : public Association_Provider<TAVRIN_HostedLANEndpoint>,
      public TAVRIN_HostedLANEndpoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HostedLANEndpoint)
