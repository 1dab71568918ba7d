// The provider of TAVRIN_ProfileElementSoftwareIdentity: the software that
// implements the profiles with each registered profile and sub-profile.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_ProfileElementSoftwareIdentity_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kImplemented =
    TVRN_PAIRING.fetch(CID_PROFILE_SOFTWARE_IDENTITY)
        .when_not_one(LL_ERR, "Invalid number of ProfileSoftwareIdentity instances returned.")
        .fetch(CID_REGISTERED_PROFILE, CID_REGISTERED_SUB_PROFILE)
        .when_any_empty(LL_ERR, "Invalid number of Profile instances returned.")
        .for_each(0)
        .as("Antecedent")
        .with_every(1, "Dependent");

}  // namespace

class TAVRIN_ProfileElementSoftwareIdentity_Provider
    : public Profile_Pairing_Provider<TAVRIN_ProfileElementSoftwareIdentity, kImplemented>,
      public TAVRIN_ProfileElementSoftwareIdentity_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ProfileElementSoftwareIdentity)
