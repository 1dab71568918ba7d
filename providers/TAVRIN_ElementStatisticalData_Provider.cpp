// The provider of TAVRIN_ElementStatisticalData: each FC port with its
// statistics.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_ElementStatisticalData_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kStatistics =
    TVRN_PAIRING.fetch(CID_FC_PORT)
        .when_empty(LL_WARN, "No FC Ports Found")  // 0
        .fetch(CID_FC_PORT_STATISTICS)             // 1
        .when_empty(LL_WARN, "Invalid number of Port Statistice Instances!")
        .for_each(0)
        .as("ManagedElement")
        .with_all(1, "Stats", key("DeviceID"), key("InstanceID"));

constexpr Object_Scopes kScopes =
    Object_Scopes()
        .from(CID_FC_PORT, Narrowing::PORT, Narrowing::PORT)
        .from(CID_FC_PORT_STATISTICS, Narrowing::PORT, Narrowing::PORT);

}  // namespace

class TAVRIN_ElementStatisticalData_Provider
    : public Keyed_Pairing_Provider<TAVRIN_ElementStatisticalData, kStatistics, kScopes>,
      public TAVRIN_ElementStatisticalData_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ElementStatisticalData)
