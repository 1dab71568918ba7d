// The provider of TAVRIN_SCSIProtocolEndpoint.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_SCSIProtocolEndpoint_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_SCSIProtocolEndpoint_Source = {
    CID_SCSI_PROTOCOL_ENDPOINT, fromFCHBAManager, "No FC Ports Found!", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE,           __LINE__};

class TAVRIN_SCSIProtocolEndpoint_Provider
    : public Inventory_Provider<TAVRIN_SCSIProtocolEndpoint, TAVRIN_SCSIProtocolEndpoint_Source>,
      public TAVRIN_SCSIProtocolEndpoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(SCSIProtocolEndpoint)
