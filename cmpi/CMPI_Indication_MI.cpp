// The entries of the indication MI: filter activation, which keeps the name
// spaces that indications go to, enabling and disabling the provider's
// indications, and the delivery of each indication the provider hands over.
#include "cmpi/CMPI_Indication_MI.h"

#include <time.h>

#include <atomic>
#include <cerrno>

#include "cmpi/CMPI_Entry.h"
#include "cmpi/Cmpi_Ptr.h"
#include "cmpi/Converter.h"
#include "framework/Assert.h"
#include "framework/Log.h"

namespace CPTA {

namespace {

// Takes the adapter's mutex for a delivery; false (without it) when the
// provider is being told to stop while someone else holds the mutex.
bool _lock_for_delivery(Mutex& mutex, const std::atomic<bool>& disabling) {
    for (;;) {
        int r = mutex.try_lock();
        if (r == 0)
            return true;
        if (disabling)
            return false;
        if (r != EBUSY) {
            mutex.lock();
            return true;
        }
        struct timespec pause = {0, 1000000};  // 1 ms
        nanosleep(&pause, nullptr);
    }
}

// Hands an indication of the provider to the server in every name space
// with an active filter (the callback given to enable_indications).
bool _indication_proc(Instance* indication, void* client_data) {
    if (!indication)
        return false;
    Ref<> hold(indication);
    CMPI_Adapter* adapter = static_cast<CMPI_Adapter*>(client_data);
    if (!adapter)
        return false;
    try {
        if (!_lock_for_delivery(adapter->mutex(), adapter->indications().disabling)) {
            TVRN_LOG(LL_INFO, "indication dropped: indications are being disabled");
            return false;
        }
        struct Unlock {
            Mutex& mutex;
            ~Unlock() { mutex.unlock(); }
        } unlock{adapter->mutex()};

        CMPI_Thread_Context* thread_context = CMPI_Thread_Context::top();
        CPTA_ASSERT(thread_context != 0);
        const CMPIBroker* broker = thread_context->cmpi_broker();

        const Array<Name_Space_Entry>& spaces = adapter->indications().name_spaces;
        for (size_t i = 0; i < spaces.size(); i++) {
            const char* ns = spaces[i].name_space.c_str();
            CMPIObjectPath* op = nullptr;
            if (make_cmpi_object_path(broker, indication, ns, op) != CMPI_RC_OK)
                continue;
            Cmpi_Ptr<CMPIObjectPath> hold_op(op);
            CMPIInstance* ci = nullptr;
            if (make_cmpi_instance(broker, indication, ns, op, nullptr, ci) != CMPI_RC_OK)
                continue;
            Cmpi_Ptr<CMPIInstance> hold_ci(ci);
            CBDeliverIndication(broker, thread_context->cmpi_context(), ns, ci);
        }
        return true;
    } catch (...) {
        TVRN_LOG(LL_ERR, "indication delivery failed");
        return false;
    }
}

CMPIStatus authorizeFilter(CMPIIndicationMI* mi, const CMPIContext* context, const CMPISelectExp*,
                           const char*, const CMPIObjectPath*, const char*) {
    return run_entry("authorizeFilter", mi ? mi->hdl : nullptr, context,
                     [](CMPI_Adapter*, Entry_Scope&) -> Entry_Status { return CMPI_RC_OK; });
}

CMPIStatus mustPoll(CMPIIndicationMI* mi, const CMPIContext* context, const CMPISelectExp*,
                    const char*, const CMPIObjectPath*) {
    return run_entry("mustPoll", mi ? mi->hdl : nullptr, context,
                     [](CMPI_Adapter*, Entry_Scope&) -> Entry_Status { return CMPI_RC_OK; });
}

CMPIStatus activateFilter(CMPIIndicationMI* mi, const CMPIContext* context, const CMPISelectExp*,
                          const char*, const CMPIObjectPath* class_path, CMPIBoolean) {
    return run_entry("activateFilter", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
                         if (!class_path)
                             return Entry_Status(CMPI_RC_ERR_INVALID_PARAMETER, "no class path");
                         Array<Name_Space_Entry>& spaces = adapter->indications().name_spaces;
                         Name_Space_Entry entry = {name_space_of(class_path), 1};
                         size_t pos = spaces.find(entry);
                         if (pos == size_t(-1))
                             spaces.append(entry);
                         else
                             spaces[pos].count++;
                         return CMPI_RC_OK;
                     });
}

CMPIStatus deactivateFilter(CMPIIndicationMI* mi, const CMPIContext* context, const CMPISelectExp*,
                            const char*, const CMPIObjectPath* class_path, CMPIBoolean) {
    return run_entry("deactivateFilter", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
                         if (!class_path)
                             return Entry_Status(CMPI_RC_ERR_INVALID_PARAMETER, "no class path");
                         Array<Name_Space_Entry>& spaces = adapter->indications().name_spaces;
                         Name_Space_Entry entry = {name_space_of(class_path), 0};
                         size_t pos = spaces.find(entry);
                         if (pos != size_t(-1)) {
                             if (spaces[pos].count <= 1)
                                 spaces.remove(pos);
                             else
                                 spaces[pos].count--;
                         }
                         return CMPI_RC_OK;
                     });
}

CMPIStatus enableIndications(CMPIIndicationMI* mi, const CMPIContext* context) {
    return run_entry("enableIndications", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
                         bool& enabled = adapter->indications().enabled;
                         if (enabled)
                             return CMPI_RC_OK;
                         enabled = true;
                         if (adapter->enable_indications(_indication_proc, adapter) ==
                             ENABLE_INDICATIONS_FAILED) {
                             // Not enabled: a later request must ask the provider again.
                             enabled = false;
                             return CMPI_RC_ERR_FAILED;
                         }
                         return CMPI_RC_OK;
                     });
}

CMPIStatus disableIndications(CMPIIndicationMI* mi, const CMPIContext* context) {
    return run_entry("disableIndications", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
                         return stop_indications(adapter) == DISABLE_INDICATIONS_FAILED
                                    ? CMPI_RC_ERR_FAILED
                                    : CMPI_RC_OK;
                     });
}

}  // namespace

void set_indication_entries(CMPIIndicationMIFT& ft) {
    ft.authorizeFilter = authorizeFilter;
    ft.mustPoll = mustPoll;
    ft.activateFilter = activateFilter;
    ft.deActivateFilter = deactivateFilter;
    ft.enableIndications = enableIndications;
    ft.disableIndications = disableIndications;
}

Disable_Indications_Status stop_indications(CMPI_Adapter* adapter) {
    if (!adapter->indications().enabled)
        return DISABLE_INDICATIONS_OK;
    struct Disabling {
        std::atomic<bool>& flag;
        explicit Disabling(std::atomic<bool>& f) : flag(f) { flag = true; }
        ~Disabling() { flag = false; }
    } disabling(adapter->indications().disabling);
    Disable_Indications_Status status = adapter->disable_indications();
    adapter->indications().enabled = false;
    return status;
}

}  // namespace CPTA
