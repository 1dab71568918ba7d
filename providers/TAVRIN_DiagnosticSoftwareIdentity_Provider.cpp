// The provider of TAVRIN_DiagnosticSoftwareIdentity.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_DiagnosticSoftwareIdentity_Methods.h"

namespace CPTA {

class TAVRIN_DiagnosticSoftwareIdentity_Provider
    : public Instance_Provider<TAVRIN_DiagnosticSoftwareIdentity>,
      public TAVRIN_DiagnosticSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DiagnosticSoftwareIdentity)
