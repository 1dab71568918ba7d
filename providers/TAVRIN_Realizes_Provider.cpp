// The provider of TAVRIN_Realizes.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_Realizes_Methods.h"

namespace CPTA {

class TAVRIN_Realizes_Provider
    : public Association_Provider<TAVRIN_Realizes>,
      public TAVRIN_Realizes_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(Realizes)
