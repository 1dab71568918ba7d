// The provider of TAVRIN_CommMechanismForManager: the object manager with each
// CIM-XML communication mechanism.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_CommMechanismForManager_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kMechanisms =
    TVRN_PAIRING.fetch(CID_OBJECT_MANAGER)
        .when_not_one(LL_ERR, "Invalid number of ObjectManager instances")
        .fetch(CID_CIMXML_COMMUNICATION_MECHANISM)
        .for_each(0)
        .as("Antecedent")
        .with_every(1, "Dependent");

}  // namespace

class TAVRIN_CommMechanismForManager_Provider
    : public Profile_Pairing_Provider<TAVRIN_CommMechanismForManager, kMechanisms>,
      public TAVRIN_CommMechanismForManager_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(CommMechanismForManager)
