// The provider of TAVRIN_HBASoftwareInstallationServiceCapabilities.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_HBASoftwareInstallationServiceCapabilities_Methods.h"

namespace CPTA {

class TAVRIN_HBASoftwareInstallationServiceCapabilities_Provider
    : public Instance_Provider<TAVRIN_HBASoftwareInstallationServiceCapabilities>,
      public TAVRIN_HBASoftwareInstallationServiceCapabilities_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HBASoftwareInstallationServiceCapabilities)
