// The provider of TAVRIN_LogicalPortGroup.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_LogicalPortGroup_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_LogicalPortGroup_Source = {
    CID_LOGICAL_PORT_GROUP, fromFCHBAManager, "No Logical Port Groups found!", LL_WARN, ANNOUNCED,
    TVRN_SOURCE_FILE,       __LINE__};

class TAVRIN_LogicalPortGroup_Provider
    : public Inventory_Provider<TAVRIN_LogicalPortGroup, TAVRIN_LogicalPortGroup_Source>,
      public TAVRIN_LogicalPortGroup_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LogicalPortGroup)
