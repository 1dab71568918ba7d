// The provider of TAVRIN_PhysicalPackage.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_PhysicalPackage_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_PhysicalPackage_Source = {
    CID_PHYSICAL_PACKAGE, fromFCHBAManager, "No Adapter Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE,     __LINE__};

class TAVRIN_PhysicalPackage_Provider
    : public Inventory_Provider<TAVRIN_PhysicalPackage, TAVRIN_PhysicalPackage_Source>,
      public TAVRIN_PhysicalPackage_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PhysicalPackage)
