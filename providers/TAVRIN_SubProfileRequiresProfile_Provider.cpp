// The provider of TAVRIN_SubProfileRequiresProfile: each registered profile
// with the registered sub-profiles it requires.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_SubProfileRequiresProfile_Methods.h"
#include "schema/generated/CIM_RegisteredProfile.h"
#include "schema/generated/CIM_RegisteredSubProfile.h"

namespace CPTA {

class TAVRIN_SubProfileRequiresProfile_Provider
    : public Association_Provider<TAVRIN_SubProfileRequiresProfile>,
      public TAVRIN_SubProfileRequiresProfile_Methods {
public:
    typedef TAVRIN_SubProfileRequiresProfile C;

    Enum_Instances_Status enum_instances(const C*, Enum_Instances_Handler<C>* handler) {
        return deliverPlanned(handler, &C::Antecedent, &C::Dependent, TVRN_SOURCE_FILE, __LINE__,
                              [](Profile_Sets& sets, std::vector<Profile_Pair>& pairs) {
                                  return planRequirements(
                                      sets.fetch(fromServerManager, CID_REGISTERED_PROFILE),
                                      sets.fetch(fromServerManager, CID_REGISTERED_SUB_PROFILE),
                                      pairs);
                              });
    }
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(SubProfileRequiresProfile)
