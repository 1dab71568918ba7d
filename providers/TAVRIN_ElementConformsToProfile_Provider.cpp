// The provider of TAVRIN_ElementConformsToProfile.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ElementConformsToProfile_Methods.h"

namespace CPTA {

class TAVRIN_ElementConformsToProfile_Provider
    : public Association_Provider<TAVRIN_ElementConformsToProfile>,
      public TAVRIN_ElementConformsToProfile_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ElementConformsToProfile)
