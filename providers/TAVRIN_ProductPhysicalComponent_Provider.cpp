// The provider of TAVRIN_ProductPhysicalComponent.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ProductPhysicalComponent_Methods.h"

namespace CPTA {

class TAVRIN_ProductPhysicalComponent_Provider
    : public Association_Provider<TAVRIN_ProductPhysicalComponent>,
      public TAVRIN_ProductPhysicalComponent_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ProductPhysicalComponent)
