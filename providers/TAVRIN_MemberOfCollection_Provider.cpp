// The provider of TAVRIN_MemberOfCollection: each FC port with its logical
// port group.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_MemberOfCollection_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kGroups =
    TVRN_PAIRING.fetch(CID_FC_PORT)
        .when_empty(LL_WARN, "No FC Ports Found!")  // 0
        .fetch(CID_LOGICAL_PORT_GROUP)              // 1
        .when_empty(LL_ERR, "Error: Invalid number of instances returned!\n", ENUM_INSTANCES_FAILED)
        .for_each(0)
        .as("Member")
        .with_first(1, "Collection", key("DeviceID"), key("Name"));

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_FC_PORT, Narrowing::PORT, Narrowing::PORT);

}  // namespace

class TAVRIN_MemberOfCollection_Provider
    : public Keyed_Pairing_Provider<TAVRIN_MemberOfCollection, kGroups, kScopes>,
      public TAVRIN_MemberOfCollection_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(MemberOfCollection)
