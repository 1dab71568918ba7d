// The provider of TAVRIN_Product.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_Product_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_Product_Source = {CID_PRODUCT, fromFCHBAManager, "No Adapter Found!",
                                                LL_ERR,      ANNOUNCED,        TVRN_SOURCE_FILE,
                                                __LINE__};

class TAVRIN_Product_Provider : public Inventory_Provider<TAVRIN_Product, TAVRIN_Product_Source>,
                                public TAVRIN_Product_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(Product)
