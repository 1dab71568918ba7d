// The provider of TAVRIN_AvailableDiagnosticServiceForAdapter.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AvailableDiagnosticServiceForAdapter_Methods.h"

namespace CPTA {

class TAVRIN_AvailableDiagnosticServiceForAdapter_Provider
    : public Association_Provider<TAVRIN_AvailableDiagnosticServiceForAdapter>,
      public TAVRIN_AvailableDiagnosticServiceForAdapter_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AvailableDiagnosticServiceForAdapter)
