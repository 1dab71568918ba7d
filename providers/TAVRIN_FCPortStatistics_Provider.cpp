// The provider of TAVRIN_FCPortStatistics.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_FCPortStatistics_Methods.h"

namespace CPTA {

class TAVRIN_FCPortStatistics_Provider
    : public Instance_Provider<TAVRIN_FCPortStatistics>,
      public TAVRIN_FCPortStatistics_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(FCPortStatistics)
