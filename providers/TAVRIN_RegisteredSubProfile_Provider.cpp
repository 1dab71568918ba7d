// The provider of TAVRIN_RegisteredSubProfile.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_RegisteredSubProfile_Methods.h"

namespace CPTA {

class TAVRIN_RegisteredSubProfile_Provider : public Instance_Provider<TAVRIN_RegisteredSubProfile>,
                                             public TAVRIN_RegisteredSubProfile_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(RegisteredSubProfile)
