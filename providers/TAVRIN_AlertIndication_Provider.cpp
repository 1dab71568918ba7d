// The provider of TAVRIN_AlertIndication: while the CIM server wants alert
// indications, the adapter library's events are translated and delivered
// (alerts/IndicationManager.h).
#include "alerts/IndicationManager.h"
#include "providers/Provider_Base.h"
#include "providers/generated/TAVRIN_AlertIndication_Methods.h"

namespace CPTA {

class TAVRIN_AlertIndication_Provider : public Indication_Provider<TAVRIN_AlertIndication>,
                                        public TAVRIN_AlertIndication_Methods {
public:
    Load_Status load() {
        TVRN_LOG(LL_DBG, "TAVRIN_AlertIndication_Provider::load()");
        return LOAD_OK;
    }

    // The delivery thread must be gone before the provider is.
    Unload_Status unload() {
        TVRN_LOG(LL_DBG, "TAVRIN_AlertIndication_Provider::unload()");
        if (_delivery.running())
            _delivery.disable();
        return UNLOAD_OK;
    }

    Enable_Indications_Status enable_indications(
        Indication_Handler<TAVRIN_AlertIndication>* handler) {
        return _delivery.enable(handler);
    }

    Disable_Indications_Status disable_indications() { return _delivery.disable(); }

private:
    IndicationDelivery _delivery;
};

}  // namespace CPTA

TVRN_PROVIDER_PROC(AlertIndication)
