// The provider of TAVRIN_SubProfileRequiresProfile.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_SubProfileRequiresProfile_Methods.h"

namespace CPTA {

class TAVRIN_SubProfileRequiresProfile_Provider
    : public Association_Provider<TAVRIN_SubProfileRequiresProfile>,
      public TAVRIN_SubProfileRequiresProfile_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(SubProfileRequiresProfile)
