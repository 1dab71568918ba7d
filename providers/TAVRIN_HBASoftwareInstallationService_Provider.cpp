// The provider of TAVRIN_HBASoftwareInstallationService: the host's one
// firmware update service, whose InstallFromURI flashes an adapter.
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_HBASoftwareInstallationService_Methods.h"
#include "schema/generated/CIM_ManagedElement.h"
#include "update/SoftwareUpdateHelper.h"

namespace CPTA {

const Inventory_Source TAVRIN_HBASoftwareInstallationService_Source = {
    CID_HBA_SOFTWARE_INSTALLATION_SERVICE,
    fromFCHBAManager,
    "Error: Invalid mapping information",
    LL_ERR,
    SINGLE_OR_NOTHING,
    TVRN_SOURCE_FILE,
    __LINE__};

class TAVRIN_HBASoftwareInstallationService_Provider
    : public Inventory_Provider<TAVRIN_HBASoftwareInstallationService,
                                TAVRIN_HBASoftwareInstallationService_Source>,
      public TAVRIN_HBASoftwareInstallationService_Methods {
public:
    // The outcome is only in the return value (0 done, 2 failed, 6 the
    // adapter is being updated by another request); Job is never set.
    Invoke_Method_Status InstallFromURI(const TAVRIN_HBASoftwareInstallationService*,
                                        CIM_ConcreteJob*&, const Property<String>& URI,
                                        const CIM_ManagedElement* Target,
                                        const Property<Array<uint16>>& InstallOptions,
                                        const Property<Array<String>>&,
                                        Property<uint32>& return_value) {
        return_value.set(SoftwareUpdateHelper::getSoftwareUpdateHelperInstance()->installFromURI(
            URI, Target, InstallOptions, fromFCHBAManager));
        return INVOKE_METHOD_OK;
    }
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HBASoftwareInstallationService)
