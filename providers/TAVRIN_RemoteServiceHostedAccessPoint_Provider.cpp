// The provider of TAVRIN_RemoteServiceHostedAccessPoint: the host with the
// management agent's access point, while the agent runs.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_RemoteServiceHostedAccessPoint_Methods.h"

namespace CPTA {

namespace {

constexpr char kMapping[] = "Error: Invalid mapping information";

constexpr Pairing kHosted = TVRN_PAIRING.fetch(CID_REMOTE_SERVICE_ACCESS_POINT)
                                .when_empty(LL_WARN, "Warning: No service is available")
                                .when_not_one(LL_ERR, kMapping)
                                .fetch(CID_COMPUTER_SYSTEM)
                                .when_not_one(LL_ERR, kMapping)
                                .for_each(1)
                                .as("Antecedent")
                                .with_every(0, "Dependent");

}  // namespace

class TAVRIN_RemoteServiceHostedAccessPoint_Provider
    : public Profile_Pairing_Provider<TAVRIN_RemoteServiceHostedAccessPoint, kHosted>,
      public TAVRIN_RemoteServiceHostedAccessPoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(RemoteServiceHostedAccessPoint)
