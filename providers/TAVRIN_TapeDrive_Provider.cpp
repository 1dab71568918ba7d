// The provider of TAVRIN_TapeDrive.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_TapeDrive_Methods.h"

namespace CPTA {

class TAVRIN_TapeDrive_Provider
    : public Instance_Provider<TAVRIN_TapeDrive>,
      public TAVRIN_TapeDrive_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(TapeDrive)
