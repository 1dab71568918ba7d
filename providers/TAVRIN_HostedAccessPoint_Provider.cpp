// The provider of TAVRIN_HostedAccessPoint: the host with every SCSI protocol
// endpoint, initiators and targets.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_HostedAccessPoint_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted =
    TVRN_PAIRING
        .host_with_every(CID_SCSI_PROTOCOL_ENDPOINT, "Antecedent", "Dependent",
                         "Error: Invalid mapping information")
        .when_empty(LL_WARN, "Invalid number of SCSIProtocolEndPoint instances returned.");

}  // namespace

class TAVRIN_HostedAccessPoint_Provider
    : public Pairing_Provider<TAVRIN_HostedAccessPoint, kHosted>,
      public TAVRIN_HostedAccessPoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HostedAccessPoint)
