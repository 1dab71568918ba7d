// The provider of TAVRIN_AvailableDiagnosticServiceForEthernetPort.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AvailableDiagnosticServiceForEthernetPort_Methods.h"

namespace CPTA {

class TAVRIN_AvailableDiagnosticServiceForEthernetPort_Provider
    : public Association_Provider<TAVRIN_AvailableDiagnosticServiceForEthernetPort>,
      public TAVRIN_AvailableDiagnosticServiceForEthernetPort_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AvailableDiagnosticServiceForEthernetPort)
