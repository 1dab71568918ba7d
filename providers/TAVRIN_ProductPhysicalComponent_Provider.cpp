// The provider of TAVRIN_ProductPhysicalComponent: each physical package with
// the product of the same serial number.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_ProductPhysicalComponent_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kProducts =
    TVRN_PAIRING
        .fetch(CID_PHYSICAL_PACKAGE)  // 0
        .fetch(CID_PRODUCT)           // 1
        .when_differs(0, LL_ERR, "Error: Improper Product Information!\n")
        .for_each(0)
        .as("PartComponent")
        .with_first(1, "GroupComponent", key("SerialNumber"), key("IdentifyingNumber"));

}  // namespace

class TAVRIN_ProductPhysicalComponent_Provider
    : public Pairing_Provider<TAVRIN_ProductPhysicalComponent, kProducts>,
      public TAVRIN_ProductPhysicalComponent_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ProductPhysicalComponent)
