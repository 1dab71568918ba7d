// The provider of TAVRIN_Product.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_Product_Methods.h"

namespace CPTA {

class TAVRIN_Product_Provider
    : public Instance_Provider<TAVRIN_Product>,
      public TAVRIN_Product_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(Product)
