// The provider of TAVRIN_HBASoftwareInstallationServiceCapabilities: what
// the firmware update service accepts.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_HBASoftwareInstallationServiceCapabilities_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_HBASoftwareInstallationServiceCapabilities_Source = {
    CID_HBA_SOFTWARE_INSTALLATION_SERVICE_CAPABILITIES,
    fromFCHBAManager,
    "Error: Invalid mapping information",
    LL_ERR,
    SINGLE_OR_NOTHING,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_HBASoftwareInstallationServiceCapabilities_Provider
    : public Inventory_Provider<TAVRIN_HBASoftwareInstallationServiceCapabilities,
                                TAVRIN_HBASoftwareInstallationServiceCapabilities_Source>,
      public TAVRIN_HBASoftwareInstallationServiceCapabilities_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HBASoftwareInstallationServiceCapabilities)
