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

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_SCSI_PROTOCOL_ENDPOINT, Narrowing::WHOLE, Narrowing::OBJECT);

}  // namespace

class TAVRIN_HostedAccessPoint_Provider
    : public Keyed_Pairing_Provider<TAVRIN_HostedAccessPoint, kHosted, kScopes>,
      public TAVRIN_HostedAccessPoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HostedAccessPoint)
