// The frame around every request entry of a CMPI adapter: find the adapter,
// install a thread context for the request, serialise on the adapter's
// mutex, log entry and exit, and keep every exception inside the module;
// with the look-ups and the result delivery that the entries share.
#ifndef CPTA_CMPI_CMPI_ENTRY_H
#define CPTA_CMPI_CMPI_ENTRY_H

#include <cmpidt.h>
#include <cmpift.h>

#include <exception>

#include "cmpi/CMPI_Adapter.h"
#include "cmpi/CMPI_Thread_Context.h"
#include "framework/Request_Failure.h"

namespace CPTA {

// What an entry answers: a CMPI code and, for some failures, a message.
struct Entry_Status {
    int rc;
    String message;

    Entry_Status(int rc_ = CMPI_RC_OK) : rc(rc_) {}
    Entry_Status(int rc_, const String& message_) : rc(rc_), message(message_) {}
};

// Installs a thread context for the request and holds the adapter's mutex.
class Entry_Scope {
public:
    Entry_Scope(CMPI_Adapter* adapter, const CMPIContext* context)
        : _adapter(adapter), _context(adapter->broker(), context, adapter) {
        _adapter->mutex().lock();
    }
    ~Entry_Scope() { _adapter->mutex().unlock(); }

    Entry_Scope(const Entry_Scope&) = delete;
    Entry_Scope& operator=(const Entry_Scope&) = delete;

    const CMPIContext* cmpi_context() const { return _context.context().cmpi_context(); }

private:
    CMPI_Adapter* _adapter;
    Context_Scope _context;
};

// The CMPI status of an entry's answer (the message made by the broker).
CMPIStatus _make_status(const CMPIBroker* broker, const Entry_Status& status);

// The name of a CMPI return code, for the log.
const char* _rc_to_str(int rc);

// The entry and exit lines of an entry (logged as the adapter's).
void _log_enter(const char* name);
void _log_return(const char* name, const Entry_Status& status);

// Runs body(adapter, scope) as the entry called name.
template <class F>
CMPIStatus run_entry(const char* name, void* hdl, const CMPIContext* context, F&& body) {
    const CMPIBroker* broker = nullptr;
    Entry_Status status;
    try {
        CMPI_Adapter* adapter = CMPI_Adapter::from_handle(hdl);
        if (!adapter) {
            status = Entry_Status(CMPI_RC_ERR_FAILED, "provider is not loaded");
        } else {
            broker = adapter->broker();
            Entry_Scope scope(adapter, context);
            _log_enter(name);
            Request_Failure_Scope failures;
            try {
                status = body(adapter, scope);
            } catch (const std::exception& e) {
                status = Entry_Status(CMPI_RC_ERR_FAILED, e.what());
            } catch (...) {
                status = Entry_Status(CMPI_RC_ERR_FAILED, "unexpected exception");
            }
            // Data lost below the provider fails the request, whatever the
            // provider made of what was left.
            if (failures.failed() && !(status.rc == CMPI_RC_ERR_FAILED && status.message.size()))
                status = Entry_Status(CMPI_RC_ERR_FAILED, failures.message());
            _log_return(name, status);
            return _make_status(broker, status);
        }
    } catch (const std::exception& e) {
        status = Entry_Status(CMPI_RC_ERR_FAILED, e.what());
    } catch (...) {
        status = Entry_Status(CMPI_RC_ERR_FAILED, "unexpected exception");
    }
    _log_return(name, status);
    return _make_status(broker, status);
}

// Converts one instance into a CMPI instance on its object path in the name
// space, restricted to the property list (null: all), and returns it to the
// server; a CMPI return code.
int _return_cmpi_instance(const CMPIBroker* broker, const CMPIResult* result,
                          const Instance* instance, const char* name_space,
                          const char* const* properties);

// The class of a request's object path in the provider's repository
// (CMPI_RC_ERR_FAILED when the repository has no such class).
int _request_class(CMPI_Adapter* adapter, const CMPIObjectPath* op, const Meta_Class*& mc);

// The same for requests that hand the provider an instance of the class: a
// class above the provider's class is served as the provider's class; a
// class outside its line is refused with CMPI_RC_ERR_INVALID_CLASS.
Entry_Status _target_class(CMPI_Adapter* adapter, const CMPIObjectPath* op, const Meta_Class*& mc);

}  // namespace CPTA

#endif
