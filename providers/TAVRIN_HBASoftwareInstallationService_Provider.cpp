// The provider of TAVRIN_HBASoftwareInstallationService.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_HBASoftwareInstallationService_Methods.h"

namespace CPTA {

class TAVRIN_HBASoftwareInstallationService_Provider
    : public Instance_Provider<TAVRIN_HBASoftwareInstallationService>,
      public TAVRIN_HBASoftwareInstallationService_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HBASoftwareInstallationService)
