// The provider of TAVRIN_LogicalPortGroup.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_LogicalPortGroup_Methods.h"

namespace CPTA {

class TAVRIN_LogicalPortGroup_Provider
    : public Instance_Provider<TAVRIN_LogicalPortGroup>,
      public TAVRIN_LogicalPortGroup_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LogicalPortGroup)
