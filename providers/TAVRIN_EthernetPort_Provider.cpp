// The provider of TAVRIN_EthernetPort.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_EthernetPort_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_EthernetPort_Source = {
    CID_ETHERNET_PORT, fromFCHBAManager, "Error: Invalid mapping information", LL_ERR, QUIET,
    TVRN_SOURCE_FILE,  __LINE__};

class TAVRIN_EthernetPort_Provider
    : public Inventory_Provider<TAVRIN_EthernetPort, TAVRIN_EthernetPort_Source>,
      public TAVRIN_EthernetPort_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(EthernetPort)
