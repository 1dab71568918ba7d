// The provider of TAVRIN_ProductElementComponent: each port controller with
// the product of the same serial number.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_ProductElementComponent_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kProducts =
    TVRN_PAIRING
        .fetch(CID_PORT_CONTROLLER)  // 0
        .fetch(CID_PRODUCT)
        .when_differs(0, LL_ERR, "Invalid mapping information.")  // 1
        .for_each(0)
        .as("PartComponent")
        .with_first(1, "GroupComponent", key("Name"), key("IdentifyingNumber"));

}  // namespace

class TAVRIN_ProductElementComponent_Provider
    : public Pairing_Provider<TAVRIN_ProductElementComponent, kProducts>,
      public TAVRIN_ProductElementComponent_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ProductElementComponent)
