// The provider of TAVRIN_InstalledSoftwareIdentity: the host with every
// adapter software identity.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_InstalledSoftwareIdentity_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted =
    TVRN_PAIRING
        .host_with_every(CID_ADAPTER_SOFTWARE_IDENTITY, "System", "InstalledSoftware",
                         "Error: count of computersystem instance is not 1")
        .when_empty(LL_ERR, "Error: Invalid mapping information");

constexpr Object_Scopes kScopes =
    Object_Scopes().from(CID_ADAPTER_SOFTWARE_IDENTITY, Narrowing::WHOLE, Narrowing::OBJECT);

}  // namespace

class TAVRIN_InstalledSoftwareIdentity_Provider
    : public Keyed_Pairing_Provider<TAVRIN_InstalledSoftwareIdentity, kHosted, kScopes>,
      public TAVRIN_InstalledSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(InstalledSoftwareIdentity)
