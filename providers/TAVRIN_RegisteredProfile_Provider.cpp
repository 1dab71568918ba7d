// The provider of TAVRIN_RegisteredProfile.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_RegisteredProfile_Methods.h"

namespace CPTA {

class TAVRIN_RegisteredProfile_Provider : public Instance_Provider<TAVRIN_RegisteredProfile>,
                                          public TAVRIN_RegisteredProfile_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(RegisteredProfile)
