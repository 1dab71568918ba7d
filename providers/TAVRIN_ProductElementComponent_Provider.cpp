// The provider of TAVRIN_ProductElementComponent.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ProductElementComponent_Methods.h"

namespace CPTA {

class TAVRIN_ProductElementComponent_Provider
    : public Association_Provider<TAVRIN_ProductElementComponent>,
      public TAVRIN_ProductElementComponent_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ProductElementComponent)
