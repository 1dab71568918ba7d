// The provider of TAVRIN_PhysicalPackage.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_PhysicalPackage_Methods.h"

namespace CPTA {

class TAVRIN_PhysicalPackage_Provider
    : public Instance_Provider<TAVRIN_PhysicalPackage>,
      public TAVRIN_PhysicalPackage_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(PhysicalPackage)
