// The provider of TAVRIN_DiagnosticSoftwareIdentity: the software that runs the diagnostic tests.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_DiagnosticSoftwareIdentity_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_DiagnosticSoftwareIdentity_Source = {
    CID_DIAGNOSTIC_SOFTWARE_IDENTITY,
    fromFCHBAManager,
    "No diagnostic software is installed",
    LL_WARN,
    QUIET,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_DiagnosticSoftwareIdentity_Provider
    : public Inventory_Provider<TAVRIN_DiagnosticSoftwareIdentity,
                                TAVRIN_DiagnosticSoftwareIdentity_Source>,
      public TAVRIN_DiagnosticSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DiagnosticSoftwareIdentity)
