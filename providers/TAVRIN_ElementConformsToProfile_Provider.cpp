// The provider of TAVRIN_ElementConformsToProfile: the host and the object
// manager with the profiles they implement, and the SMI-S profile with every
// other profile and sub-profile. Everything is fetched and paired before the
// first association is delivered.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_ElementConformsToProfile_Methods.h"
#include "schema/generated/CIM_ManagedElement.h"
#include "schema/generated/CIM_RegisteredProfile.h"

namespace CPTA {

class TAVRIN_ElementConformsToProfile_Provider
    : public Association_Provider<TAVRIN_ElementConformsToProfile>,
      public TAVRIN_ElementConformsToProfile_Methods {
public:
    typedef TAVRIN_ElementConformsToProfile C;

    Enum_Instances_Status enum_instances(const C*, Enum_Instances_Handler<C>* handler) {
        return deliverPlanned(
            handler, &C::ConformantStandard, &C::ManagedElement, TVRN_SOURCE_FILE, __LINE__,
            [](Profile_Sets& sets, std::vector<Profile_Pair>& pairs) {
                const Array<Instance*>& profiles =
                    sets.fetch(fromServerManager, CID_REGISTERED_PROFILE);
                const Array<Instance*>& systems = sets.fetch(fromFCHBAManager, CID_COMPUTER_SYSTEM);
                const Array<Instance*>& managers =
                    sets.fetch(fromServerManager, CID_OBJECT_MANAGER);
                return planConformance(
                    profiles, sets.fetch(fromServerManager, CID_REGISTERED_SUB_PROFILE),
                    Profile_Sets::only(systems), Profile_Sets::only(managers), pairs);
            });
    }
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ElementConformsToProfile)
