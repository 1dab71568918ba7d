// The provider of TAVRIN_FCPortStatistics.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_FCPortStatistics_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_FCPortStatistics_Source = {
    CID_FC_PORT_STATISTICS, fromFCHBAManager, "No FC Ports Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE,       __LINE__};

class TAVRIN_FCPortStatistics_Provider
    : public Inventory_Provider<TAVRIN_FCPortStatistics, TAVRIN_FCPortStatistics_Source>,
      public TAVRIN_FCPortStatistics_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(FCPortStatistics)
