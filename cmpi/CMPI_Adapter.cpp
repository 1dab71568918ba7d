#include "cmpi/CMPI_Adapter.h"

#include "framework/Log.h"

namespace CPTA {

CMPI_Adapter::CMPI_Adapter(const CMPIBroker* broker, const Registration* registration,
                           CMPI_Static_Data* static_data)
    : Provider_Handle(registration),
      _broker(broker),
      _static_data(static_data),
      _mi_count(1),
      _unload_allowed(true),
      _meta_class(get_meta_class()),
      _mutex(true) {
    _static_data->magic = CMPI_STATIC_DATA_MAGIC;
    _static_data->adapter = this;
}

CMPI_Adapter::~CMPI_Adapter() {
    TVRN_LOG(LL_DBG, "enter: %s()", "~CMPI_Adapter");
    _static_data->magic = CMPI_STATIC_DATA_DEAD;
    _static_data->adapter = nullptr;
    _indications.name_spaces.clear();
    if (_provider) {
        call(OPERATION_DESTROY_PROVIDER);
        _provider = nullptr;
    }
    TVRN_LOG(LL_DBG, "return: %s()", "~CMPI_Adapter");
}

CMPI_Adapter* CMPI_Adapter::from_handle(void* hdl) {
    CMPI_Static_Data* sd = static_cast<CMPI_Static_Data*>(hdl);
    if (!sd || sd->magic != CMPI_STATIC_DATA_MAGIC)
        return nullptr;
    return sd->adapter;
}

}  // namespace CPTA
