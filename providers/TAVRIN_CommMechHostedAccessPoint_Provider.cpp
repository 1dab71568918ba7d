// The provider of TAVRIN_CommMechHostedAccessPoint: the host with each CIM-XML
// communication mechanism.
#include "providers/Server_Profile.h"
#include "providers/generated/TAVRIN_CommMechHostedAccessPoint_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kHosted =
    TVRN_PAIRING.host_with_every(CID_CIMXML_COMMUNICATION_MECHANISM, "Antecedent", "Dependent",
                                 "Invalid number of ComputerSystem instances");

}  // namespace

class TAVRIN_CommMechHostedAccessPoint_Provider
    : public Profile_Pairing_Provider<TAVRIN_CommMechHostedAccessPoint, kHosted>,
      public TAVRIN_CommMechHostedAccessPoint_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(CommMechHostedAccessPoint)
