// The provider of TAVRIN_DiagnosticElementSoftwareIdentity: the diagnostic
// software with every test it offers.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_DiagnosticElementSoftwareIdentity_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kSoftware =
    TVRN_PAIRING
        .fetch(CID_DIAGNOSTIC_SOFTWARE_IDENTITY)  // 0
        .when_empty(LL_WARN, "No diagnostic softwares are installed.")
        .when_not_one(LL_WARN, "More than one diagnostic software is installed.",
                      ENUM_INSTANCES_OK)
        .fetch_diagnostic_tests()  // 1
        .when_empty(LL_WARN, "No diagnostic services are available.")
        .for_each(0)
        .as("Antecedent")
        .with_every(1, "Dependent");

}  // namespace

class TAVRIN_DiagnosticElementSoftwareIdentity_Provider
    : public Pairing_Provider<TAVRIN_DiagnosticElementSoftwareIdentity, kSoftware>,
      public TAVRIN_DiagnosticElementSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(DiagnosticElementSoftwareIdentity)
