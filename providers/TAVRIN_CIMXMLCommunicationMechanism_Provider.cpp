// The provider of TAVRIN_CIMXMLCommunicationMechanism.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_CIMXMLCommunicationMechanism_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_CIMXMLCommunicationMechanism_Source = {
    CID_CIMXML_COMMUNICATION_MECHANISM,
    fromServerManager,
    nullptr,
    LL_DBG,
    QUIET,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_CIMXMLCommunicationMechanism_Provider
    : public Inventory_Provider<TAVRIN_CIMXMLCommunicationMechanism,
                                TAVRIN_CIMXMLCommunicationMechanism_Source>,
      public TAVRIN_CIMXMLCommunicationMechanism_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(CIMXMLCommunicationMechanism)
