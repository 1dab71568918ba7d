// The provider of TAVRIN_AvailableDiagnosticServiceForFCPort.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AvailableDiagnosticServiceForFCPort_Methods.h"

namespace CPTA {

class TAVRIN_AvailableDiagnosticServiceForFCPort_Provider
    : public Association_Provider<TAVRIN_AvailableDiagnosticServiceForFCPort>,
      public TAVRIN_AvailableDiagnosticServiceForFCPort_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AvailableDiagnosticServiceForFCPort)
