// The provider of TAVRIN_PhysicalConnector.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_PhysicalConnector_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_PhysicalConnector_Source = {
    CID_PHYSICAL_CONNECTOR, fromFCHBAManager, "No Connector Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE,       __LINE__};

class TAVRIN_PhysicalConnector_Provider
    : public Inventory_Provider<TAVRIN_PhysicalConnector, TAVRIN_PhysicalConnector_Source>,
      public TAVRIN_PhysicalConnector_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PhysicalConnector)
