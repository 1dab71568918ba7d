// The provider of TAVRIN_ObjectManagerHostedService: the host with the CIM
// server's object manager.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_ObjectManagerHostedService_Methods.h"

namespace CPTA {

namespace {

constexpr char kCount[] = "Invalid number of reference class instances";

constexpr Pairing kHosted = TVRN_PAIRING.fetch(CID_COMPUTER_SYSTEM)
                                .when_not_one(LL_ERR, kCount)
                                .fetch(CID_OBJECT_MANAGER)
                                .when_not_one(LL_ERR, kCount)
                                .for_each(0)
                                .as("Antecedent")
                                .with_every(1, "Dependent");

}  // namespace

class TAVRIN_ObjectManagerHostedService_Provider
    : public Profile_Pairing_Provider<TAVRIN_ObjectManagerHostedService, kHosted>,
      public TAVRIN_ObjectManagerHostedService_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(ObjectManagerHostedService)
