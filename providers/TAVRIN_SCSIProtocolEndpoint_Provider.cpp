// The provider of TAVRIN_SCSIProtocolEndpoint.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_SCSIProtocolEndpoint_Methods.h"

namespace CPTA {

class TAVRIN_SCSIProtocolEndpoint_Provider
    : public Instance_Provider<TAVRIN_SCSIProtocolEndpoint>,
      public TAVRIN_SCSIProtocolEndpoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(SCSIProtocolEndpoint)
