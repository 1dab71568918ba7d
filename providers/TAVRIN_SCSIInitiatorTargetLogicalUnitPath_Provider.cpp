// The provider of TAVRIN_SCSIInitiatorTargetLogicalUnitPath.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_SCSIInitiatorTargetLogicalUnitPath_Methods.h"

namespace CPTA {

class TAVRIN_SCSIInitiatorTargetLogicalUnitPath_Provider
    : public Association_Provider<TAVRIN_SCSIInitiatorTargetLogicalUnitPath>,
      public TAVRIN_SCSIInitiatorTargetLogicalUnitPath_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(SCSIInitiatorTargetLogicalUnitPath)
