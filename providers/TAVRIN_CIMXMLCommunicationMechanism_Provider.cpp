// The provider of TAVRIN_CIMXMLCommunicationMechanism.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_CIMXMLCommunicationMechanism_Methods.h"

namespace CPTA {

class TAVRIN_CIMXMLCommunicationMechanism_Provider
    : public Instance_Provider<TAVRIN_CIMXMLCommunicationMechanism>,
      public TAVRIN_CIMXMLCommunicationMechanism_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(CIMXMLCommunicationMechanism)
