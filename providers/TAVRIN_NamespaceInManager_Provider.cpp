// The provider of TAVRIN_NamespaceInManager: the object manager with each
// namespace; both name the object manager from one answer of the CIM server.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_NamespaceInManager_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kNamespaces =
    TVRN_PAIRING.fetch(CID_OBJECT_MANAGER)
        .when_not_one(LL_ERR, "Invalid number of ObjectManager class instances")
        .fetch(CID_NAMESPACE)
        .for_each(0)
        .as("Antecedent")
        .with_every(1, "Dependent");

}  // namespace

class TAVRIN_NamespaceInManager_Provider
    : public Profile_Pairing_Provider<TAVRIN_NamespaceInManager, kNamespaces>,
      public TAVRIN_NamespaceInManager_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(NamespaceInManager)
