// The provider of TAVRIN_HBASoftwareInstallationServiceHostedService.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_HBASoftwareInstallationServiceHostedService_Methods.h"

namespace CPTA {

class TAVRIN_HBASoftwareInstallationServiceHostedService_Provider
    : public Association_Provider<TAVRIN_HBASoftwareInstallationServiceHostedService>,
      public TAVRIN_HBASoftwareInstallationServiceHostedService_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HBASoftwareInstallationServiceHostedService)
