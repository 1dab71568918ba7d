// The provider of TAVRIN_DiagnosticServiceRecord: the steps of diagnostic test runs.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_DiagnosticServiceRecord_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_DiagnosticServiceRecord_Source = {
    CID_DIAGNOSTIC_SERVICE_RECORD,
    fromFCHBAManager,
    "No diagnostic service records are available.",
    LL_INFO,
    ANNOUNCED,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_DiagnosticServiceRecord_Provider
    : public Inventory_Provider<TAVRIN_DiagnosticServiceRecord,
                                TAVRIN_DiagnosticServiceRecord_Source>,
      public TAVRIN_DiagnosticServiceRecord_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DiagnosticServiceRecord)
