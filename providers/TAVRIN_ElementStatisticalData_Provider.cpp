// The provider of TAVRIN_ElementStatisticalData.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ElementStatisticalData_Methods.h"

namespace CPTA {

class TAVRIN_ElementStatisticalData_Provider
    : public Association_Provider<TAVRIN_ElementStatisticalData>,
      public TAVRIN_ElementStatisticalData_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ElementStatisticalData)
