// The provider of TAVRIN_PhysicalConnector.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_PhysicalConnector_Methods.h"

namespace CPTA {

class TAVRIN_PhysicalConnector_Provider
    : public Instance_Provider<TAVRIN_PhysicalConnector>,
      public TAVRIN_PhysicalConnector_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PhysicalConnector)
