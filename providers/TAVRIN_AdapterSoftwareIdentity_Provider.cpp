// The provider of TAVRIN_AdapterSoftwareIdentity.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_AdapterSoftwareIdentity_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_AdapterSoftwareIdentity_Source = {CID_ADAPTER_SOFTWARE_IDENTITY,
                                                                fromFCHBAManager,
                                                                "No Adapter Found!",
                                                                LL_ERR,
                                                                ANNOUNCED,
                                                                TVRN_SOURCE_FILE,
                                                                __LINE__};

class TAVRIN_AdapterSoftwareIdentity_Provider
    : public Inventory_Provider<TAVRIN_AdapterSoftwareIdentity,
                                TAVRIN_AdapterSoftwareIdentity_Source>,
      public TAVRIN_AdapterSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AdapterSoftwareIdentity)
