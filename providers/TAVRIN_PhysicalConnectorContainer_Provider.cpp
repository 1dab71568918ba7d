// The provider of TAVRIN_PhysicalConnectorContainer.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_PhysicalConnectorContainer_Methods.h"

namespace CPTA {

class TAVRIN_PhysicalConnectorContainer_Provider
    : public Association_Provider<TAVRIN_PhysicalConnectorContainer>,
      public TAVRIN_PhysicalConnectorContainer_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PhysicalConnectorContainer)
