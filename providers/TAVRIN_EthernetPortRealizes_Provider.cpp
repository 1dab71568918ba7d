// The provider of TAVRIN_EthernetPortRealizes.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_EthernetPortRealizes_Methods.h"

namespace CPTA {

class TAVRIN_EthernetPortRealizes_Provider
    : public Association_Provider<TAVRIN_EthernetPortRealizes>,
      public TAVRIN_EthernetPortRealizes_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthernetPortRealizes)
