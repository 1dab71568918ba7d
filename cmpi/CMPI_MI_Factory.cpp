#include "cmpi/CMPI_MI_Factory.h"

#include <cstdio>
#include <mutex>

#include "cmpi/CMPI_Association_MI.h"
#include "cmpi/CMPI_Entry.h"
#include "cmpi/CMPI_Indication_MI.h"
#include "cmpi/CMPI_Instance_MI.h"
#include "cmpi/CMPI_Method_MI.h"
#include "cmpi/CMPI_Thread_Context.h"
#include "framework/Log.h"

namespace CPTA {

namespace {

// Guards the creation of adapters and the MI counts of the module.
std::recursive_mutex& _module_mutex() {
    static std::recursive_mutex mutex;
    return mutex;
}

template <class FT>
void _fill_table_head(FT& ft, const char* name) {
    ft.ftVersion = 100;
    ft.miVersion = 100;
    ft.miName = name;
}

// Shared by the four cleanup entries.
CMPIStatus _cleanup(CMPI_Adapter* adapter, bool terminating) {
    TVRN_LOG(LL_DBG, "enter: %s()", "cleanup");
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    std::lock_guard<std::recursive_mutex> guard(_module_mutex());

    if (!terminating && !adapter->unload_allowed()) {
        TVRN_LOG(LL_DBG, "cleanup do not unload");
        status.rc = CMPI_RC_DO_NOT_UNLOAD;
    } else if (adapter->mi_count() == 1) {
        try {
            // No request of the provider runs any more; a delivery may, and
            // may hold the adapter's mutex until it is done.
            stop_indications(adapter);
            adapter->unload();
        } catch (...) {
            TVRN_LOG(LL_ERR, "unload of %s failed", adapter->registration()->provider_name);
        }
        TVRN_LOG(LL_DBG, "cleanup unload");
        delete adapter;
    } else {
        adapter->drop_mi();
        TVRN_LOG(LL_DBG, "cleanup decrement");
    }
    TVRN_LOG(LL_DBG, "return: %s(): %s", "cleanup", _rc_to_str(status.rc));
    return status;
}

CMPIStatus _cleanup_entry(void* hdl, const CMPIContext* context, CMPIBoolean terminating,
                          bool with_context) {
    try {
        std::lock_guard<std::recursive_mutex> guard(_module_mutex());
        CMPI_Adapter* adapter = CMPI_Adapter::from_handle(hdl);
        if (!adapter) {
            CMPIStatus status = {CMPI_RC_OK, nullptr};
            return status;  // already unloaded
        }
        if (!with_context)
            return _cleanup(adapter, terminating != 0);
        Context_Scope scope(adapter->broker(), context, adapter);
        return _cleanup(adapter, terminating != 0);
    } catch (const std::exception& e) {
        _log_return("cleanup", Entry_Status(CMPI_RC_ERR_FAILED, e.what()));
    } catch (...) {
        _log_return("cleanup", Entry_Status(CMPI_RC_ERR_FAILED, "unexpected exception"));
    }
    CMPIStatus status = {CMPI_RC_ERR_FAILED, nullptr};
    return status;
}

CMPIStatus instanceCleanup(CMPIInstanceMI* mi, const CMPIContext* context,
                           CMPIBoolean terminating) {
    return _cleanup_entry(mi ? mi->hdl : nullptr, context, terminating, true);
}

CMPIStatus methodCleanup(CMPIMethodMI* mi, const CMPIContext* context, CMPIBoolean terminating) {
    return _cleanup_entry(mi ? mi->hdl : nullptr, context, terminating, true);
}

CMPIStatus indicationCleanup(CMPIIndicationMI* mi, const CMPIContext* context,
                             CMPIBoolean terminating) {
    return _cleanup_entry(mi ? mi->hdl : nullptr, context, terminating, true);
}

CMPIStatus associationCleanup(CMPIAssociationMI* mi, const CMPIContext* context,
                              CMPIBoolean terminating) {
    return _cleanup_entry(mi ? mi->hdl : nullptr, context, terminating, false);
}

// The names and function tables of the four MIs.
void _fill_tables(CMPI_Static_Data* sd, const char* provider_name) {
    snprintf(sd->instance_mi_name, CMPI_MI_NAME_SIZE, "instance%s", provider_name);
    snprintf(sd->method_mi_name, CMPI_MI_NAME_SIZE, "method%s", provider_name);
    snprintf(sd->indication_mi_name, CMPI_MI_NAME_SIZE, "indication%s", provider_name);
    snprintf(sd->association_mi_name, CMPI_MI_NAME_SIZE, "association%s", provider_name);

    CMPIInstanceMIFT& ift = sd->instance_ft;
    _fill_table_head(ift, sd->instance_mi_name);
    ift.cleanup = instanceCleanup;
    set_instance_entries(ift);
    sd->instance_mi.hdl = sd;
    sd->instance_mi.ft = &ift;

    CMPIMethodMIFT& mft = sd->method_ft;
    _fill_table_head(mft, sd->method_mi_name);
    mft.cleanup = methodCleanup;
    set_method_entries(mft);
    sd->method_mi.hdl = sd;
    sd->method_mi.ft = &mft;

    CMPIIndicationMIFT& nft = sd->indication_ft;
    _fill_table_head(nft, sd->indication_mi_name);
    nft.cleanup = indicationCleanup;
    set_indication_entries(nft);
    sd->indication_mi.hdl = sd;
    sd->indication_mi.ft = &nft;

    CMPIAssociationMIFT& aft = sd->association_ft;
    _fill_table_head(aft, sd->association_mi_name);
    aft.cleanup = associationCleanup;
    set_association_entries(aft);
    sd->association_mi.hdl = sd;
    sd->association_mi.ft = &aft;
}

// Creates the adapter, fills the static data and loads the provider (within
// a thread context of this call).
void _create_adapter(CMPI_Static_Data* static_data, const Registration* registration,
                     const CMPIBroker* broker, const CMPIContext* context,
                     const char* provider_name) {
    TVRN_LOG(LL_DBG, "enter: %s()", "CMPI_Adapter");
    CMPI_Adapter* adapter = new CMPI_Adapter(broker, registration, static_data);
    _fill_tables(static_data, provider_name);
    Context_Scope scope(broker, context, adapter);
    // As with a failed load status, the provider stays; the server is not told.
    try {
        adapter->load();
    } catch (const std::exception& e) {
        TVRN_LOG(LL_ERR, "load of %s failed: %s", provider_name, e.what());
    } catch (...) {
        TVRN_LOG(LL_ERR, "load of %s failed", provider_name);
    }
    TVRN_LOG(LL_DBG, "return: %s()", "CMPI_Adapter");
}

}  // namespace

int cimple_cmpi_adapter(CMPI_Static_Data* static_data, const Registration* registration,
                        const CMPIBroker* broker, const CMPIContext* context,
                        const char* provider_name, char kind, void** mi) {
    TVRN_LOG(LL_DBG, "enter: %s()", "cimple_cmpi_adapter");
    if (mi)
        *mi = nullptr;
    if (!static_data || !registration || !mi ||
        !(kind == 'I' || kind == 'M' || kind == 'A' || kind == 'N')) {
        TVRN_LOG(LL_DBG, "return: %s()", "cimple_cmpi_adapter");
        return -1;
    }

    std::lock_guard<std::recursive_mutex> guard(_module_mutex());
    if (static_data->magic == CMPI_STATIC_DATA_MAGIC && static_data->adapter)
        static_data->adapter->add_mi();
    else
        _create_adapter(static_data, registration, broker, context, provider_name);

    switch (kind) {
        case 'I': *mi = &static_data->instance_mi; break;
        case 'M': *mi = &static_data->method_mi; break;
        case 'A': *mi = &static_data->association_mi; break;
        default: *mi = &static_data->indication_mi; break;
    }
    TVRN_LOG(LL_DBG, "return: %s()", "cimple_cmpi_adapter");
    return 0;
}

void* create_mi(CMPI_Static_Data* static_data, const Registration* registration,
                const CMPIBroker* broker, const CMPIContext* context, const char* provider_name,
                char kind, CMPIStatus* rc) {
    String message;
    try {
        void* mi = nullptr;
        if (cimple_cmpi_adapter(static_data, registration, broker, context, provider_name, kind,
                                &mi) == 0) {
            if (rc) {
                rc->rc = CMPI_RC_OK;
                rc->msg = nullptr;
            }
            return mi;
        }
        message = "cannot create the MI";
    } catch (const std::exception& e) {
        message = e.what();
    } catch (...) {
        message = "unexpected exception";
    }
    TVRN_LOG(LL_ERR, "%s: %s", provider_name ? provider_name : "?", message.c_str());
    if (rc) {
        rc->rc = CMPI_RC_ERR_FAILED;
        rc->msg = nullptr;
        try {
            if (broker)
                rc->msg = CMNewString(broker, message.c_str(), nullptr);
        } catch (...) {
        }
    }
    return nullptr;
}

}  // namespace CPTA
