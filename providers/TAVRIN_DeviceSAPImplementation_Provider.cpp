// The provider of TAVRIN_DeviceSAPImplementation: each FC port with its own
// SCSI initiator endpoint.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_DeviceSAPImplementation_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kEndpoints =
    TVRN_PAIRING
        .fetch(CID_SCSI_PROTOCOL_ENDPOINT)  // 0
        .when_empty(LL_ERR, "Error: Invalid number of instances returned")
        .fetch(CID_FC_PORT)
        .when_empty(LL_ERR, "Error: No FCPort found!")  // 1
        .for_each(1)
        .as("Antecedent")
        .with_first(0, "Dependent", key("DeviceID"), key("Name"));

constexpr Object_Scopes kScopes =
    Object_Scopes()
        .from(CID_SCSI_PROTOCOL_ENDPOINT, Narrowing::PORT, Narrowing::PORT)
        .from(CID_FC_PORT, Narrowing::PORT, Narrowing::PORT);

}  // namespace

class TAVRIN_DeviceSAPImplementation_Provider
    : public Keyed_Pairing_Provider<TAVRIN_DeviceSAPImplementation, kEndpoints, kScopes>,
      public TAVRIN_DeviceSAPImplementation_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DeviceSAPImplementation)
