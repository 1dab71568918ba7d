// The provider of TAVRIN_EthernetPort.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_EthernetPort_Methods.h"

namespace CPTA {

class TAVRIN_EthernetPort_Provider
    : public Instance_Provider<TAVRIN_EthernetPort>,
      public TAVRIN_EthernetPort_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthernetPort)
