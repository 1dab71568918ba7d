// The provider of TAVRIN_HBASoftwareInstallationServiceHostedService: the
// host with its firmware update service.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_HBASoftwareInstallationServiceHostedService_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted = TVRN_PAIRING.fetch(CID_COMPUTER_SYSTEM)
                                .when_empty(LL_ERR, "Error: Invalid mapping information")
                                .fetch(CID_HBA_SOFTWARE_INSTALLATION_SERVICE)
                                .for_each(0)
                                .as("Antecedent")
                                .with_every(1, "Dependent");

}  // namespace

class TAVRIN_HBASoftwareInstallationServiceHostedService_Provider
    : public Pairing_Provider<TAVRIN_HBASoftwareInstallationServiceHostedService, kHosted>,
      public TAVRIN_HBASoftwareInstallationServiceHostedService_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HBASoftwareInstallationServiceHostedService)
