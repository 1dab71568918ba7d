// The provider of TAVRIN_AssociatedAlarm: each FC port with its beacon.
#include "providers/Association_Pairing.h"
#include "providers/generated/TAVRIN_AssociatedAlarm_Methods.h"

namespace CPTA {

namespace {

constexpr Pairing kAlarms = TVRN_PAIRING.fetch(CID_FC_PORT)
                                .when_empty(LL_WARN, "No FC Ports Found!")  // 0
                                .fetch(CID_ALARM_DEVICE)
                                .when_empty(LL_WARN, "Invalid number of Instances!")  // 1
                                .for_each(0)
                                .as("Dependent")
                                .with_all(1, "Antecedent", key("DeviceID"), key("DeviceID"));

constexpr Object_Scopes kScopes = Object_Scopes()
                                      .from(CID_FC_PORT, Narrowing::PORT, Narrowing::PORT)
                                      .from(CID_ALARM_DEVICE, Narrowing::PORT, Narrowing::PORT);

}  // namespace

class TAVRIN_AssociatedAlarm_Provider
    : public Keyed_Pairing_Provider<TAVRIN_AssociatedAlarm, kAlarms, kScopes>,
      public TAVRIN_AssociatedAlarm_Methods {};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AssociatedAlarm)
