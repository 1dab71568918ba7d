// The provider of TAVRIN_HostedCollection: the host with every logical port
// group.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_HostedCollection_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted = TVRN_PAIRING
                                .host_with_every(CID_LOGICAL_PORT_GROUP, "Antecedent", "Dependent",
                                                 "Error: Invalid mapping information")
                                .when_empty(LL_WARN, "No Logical Port Groups found!");

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_LOGICAL_PORT_GROUP, Narrowing::WHOLE, Narrowing::OBJECT);

}  // namespace

class TAVRIN_HostedCollection_Provider
    : public Keyed_Pairing_Provider<TAVRIN_HostedCollection, kHosted, kScopes>,
      public TAVRIN_HostedCollection_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(HostedCollection)
