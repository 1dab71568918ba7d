// The provider of TAVRIN_DiagnosticElementSoftwareIdentity.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_DiagnosticElementSoftwareIdentity_Methods.h"

namespace CPTA {

class TAVRIN_DiagnosticElementSoftwareIdentity_Provider
    : public Association_Provider<TAVRIN_DiagnosticElementSoftwareIdentity>,
      public TAVRIN_DiagnosticElementSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DiagnosticElementSoftwareIdentity)
