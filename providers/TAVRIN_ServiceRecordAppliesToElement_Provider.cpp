// The provider of TAVRIN_ServiceRecordAppliesToElement: each diagnostic service record with the
// element of its run.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_ServiceRecordAppliesToElement_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_ServiceRecordAppliesToElement_Source = {
    CID_SERVICE_RECORD_APPLIES_TO_ELEMENT,
    fromFCHBAManager,
    "No service records or managed elements are present.",
    LL_INFO,
    QUIET,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_ServiceRecordAppliesToElement_Provider
    : public Inventory_Provider<TAVRIN_ServiceRecordAppliesToElement,
                                TAVRIN_ServiceRecordAppliesToElement_Source,
                                Association_Provider<TAVRIN_ServiceRecordAppliesToElement>>,
      public TAVRIN_ServiceRecordAppliesToElement_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ServiceRecordAppliesToElement)
