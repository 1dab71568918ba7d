// The provider of TAVRIN_ServiceRecordAppliesToElement.
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_ServiceRecordAppliesToElement_Methods.h"

namespace CPTA {

class TAVRIN_ServiceRecordAppliesToElement_Provider
    : public Association_Provider<TAVRIN_ServiceRecordAppliesToElement>,
      public TAVRIN_ServiceRecordAppliesToElement_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ServiceRecordAppliesToElement)
