// The provider of TAVRIN_EthernetPortControlledBy.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_EthernetPortControlledBy_Methods.h"

namespace CPTA {

class TAVRIN_EthernetPortControlledBy_Provider
    : public Association_Provider<TAVRIN_EthernetPortControlledBy>,
      public TAVRIN_EthernetPortControlledBy_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthernetPortControlledBy)
