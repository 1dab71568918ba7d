// The provider of TAVRIN_HBASoftwareInstallationServiceElementCapabilities.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_HBASoftwareInstallationServiceElementCapabilities_Methods.h"

namespace CPTA {

class TAVRIN_HBASoftwareInstallationServiceElementCapabilities_Provider
    : public Association_Provider<TAVRIN_HBASoftwareInstallationServiceElementCapabilities>,
      public TAVRIN_HBASoftwareInstallationServiceElementCapabilities_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HBASoftwareInstallationServiceElementCapabilities)
