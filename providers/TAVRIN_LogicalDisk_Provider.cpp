// The provider of TAVRIN_LogicalDisk.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_LogicalDisk_Methods.h"

namespace CPTA {

class TAVRIN_LogicalDisk_Provider
    : public Instance_Provider<TAVRIN_LogicalDisk>,
      public TAVRIN_LogicalDisk_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(LogicalDisk)
