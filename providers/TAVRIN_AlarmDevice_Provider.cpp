// The provider of TAVRIN_AlarmDevice: the locator beacons of the FC ports,
// which SetAlarmState switches on and off.
#include "inventory/PortHelper.h"
#include "providers/Inventory_Provider.h"
#include "providers/generated/TAVRIN_AlarmDevice_Methods.h"

namespace CPTA {

const Inventory_Source TAVRIN_AlarmDevice_Source = {
    CID_ALARM_DEVICE, fromFCHBAManager, "Invalid number of Instances returned", LL_ERR, ANNOUNCED,
    TVRN_SOURCE_FILE, __LINE__};

class TAVRIN_AlarmDevice_Provider
    : public Inventory_Provider<TAVRIN_AlarmDevice, TAVRIN_AlarmDevice_Source>,
      public TAVRIN_AlarmDevice_Methods {
public:
    // State 1 switches the beacon off, 3 on. The outcome is only in the
    // return value: 0 done, 1 not supported (mezzanine adapters have no
    // beacon), 2 anything else (already in that state, a failure, or a
    // state other than 1 and 3).
    Invoke_Method_Status SetAlarmState(const TAVRIN_AlarmDevice* self,
                                       const Property<uint16>& State,
                                       Property<uint32>& return_value) {
        TVRN_LOG(LL_DBG, "Entering: %s", "SetAlarmState");
        uint32 outcome = 2;
        if (!State.null && (State.value == 1 || State.value == 3)) {
            PortHelper* ports = FCHBAManager::getFCHBAManager()->getPortHelper();
            const String deviceId = self->DeviceID.null ? String() : self->DeviceID.value;
            switch (ports->setAlarmState(deviceId, State.value)) {
                case PortHelper::ALARM_DONE: outcome = 0; break;
                case PortHelper::ALARM_NOT_SUPPORTED: outcome = 1; break;
                default: outcome = 2; break;
            }
            TVRN_LOG(LL_DBG, "return value = %d\n", int(outcome));
        } else {
            TVRN_LOG(LL_ERR, "Error: Invalid Input State");
        }
        return_value.set(outcome);
        TVRN_LOG(LL_DBG, "Returning: %s", "SetAlarmState");
        return INVOKE_METHOD_OK;
    }
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AlarmDevice)
