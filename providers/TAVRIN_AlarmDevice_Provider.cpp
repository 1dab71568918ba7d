// The provider of TAVRIN_AlarmDevice.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AlarmDevice_Methods.h"

namespace CPTA {

class TAVRIN_AlarmDevice_Provider
    : public Instance_Provider<TAVRIN_AlarmDevice>,
      public TAVRIN_AlarmDevice_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AlarmDevice)
