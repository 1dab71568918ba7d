// The provider of TAVRIN_EthernetPortSystemDevice.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_EthernetPortSystemDevice_Methods.h"

namespace CPTA {

class TAVRIN_EthernetPortSystemDevice_Provider
    : public Association_Provider<TAVRIN_EthernetPortSystemDevice>,
      public TAVRIN_EthernetPortSystemDevice_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthernetPortSystemDevice)
