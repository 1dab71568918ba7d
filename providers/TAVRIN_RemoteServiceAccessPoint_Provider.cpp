// The provider of TAVRIN_RemoteServiceAccessPoint.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_RemoteServiceAccessPoint_Methods.h"

namespace CPTA {

class TAVRIN_RemoteServiceAccessPoint_Provider
    : public Instance_Provider<TAVRIN_RemoteServiceAccessPoint>,
      public TAVRIN_RemoteServiceAccessPoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(RemoteServiceAccessPoint)
