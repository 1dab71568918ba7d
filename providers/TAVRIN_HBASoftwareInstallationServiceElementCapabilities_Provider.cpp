// The provider of TAVRIN_HBASoftwareInstallationServiceElementCapabilities:
// the firmware update service with its capabilities.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_HBASoftwareInstallationServiceElementCapabilities_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kCapabilities =
    TVRN_PAIRING.fetch(CID_HBA_SOFTWARE_INSTALLATION_SERVICE)
        .when_not_one(LL_ERR, "Error: Invalid mapping information for service", ENUM_INSTANCES_OK)
        .fetch(CID_HBA_SOFTWARE_INSTALLATION_SERVICE_CAPABILITIES)
        .when_not_one(LL_ERR, "Error: Invalid mapping information for capabilities",
                      ENUM_INSTANCES_OK)
        .for_each(0)
        .as("ManagedElement")
        .with_every(1, "Capabilities");

}  // namespace

class TAVRIN_HBASoftwareInstallationServiceElementCapabilities_Provider
    : public Pairing_Provider<TAVRIN_HBASoftwareInstallationServiceElementCapabilities,
                              kCapabilities>,
      public TAVRIN_HBASoftwareInstallationServiceElementCapabilities_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HBASoftwareInstallationServiceElementCapabilities)
