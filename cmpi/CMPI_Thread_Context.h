// The thread context of a CMPI request (or of a thread attached to the
// server): the broker, the request's CMPI context and the provider's adapter.
#ifndef CPTA_CMPI_CMPI_THREAD_CONTEXT_H
#define CPTA_CMPI_CMPI_THREAD_CONTEXT_H

#include <cmpidt.h>
#include <cmpift.h>

#include "framework/Instance.h"
#include "framework/Thread_Context.h"

namespace CPTA {

class CMPI_Adapter;

// State of an enumeration started through cimom::enum_instances.
struct Instance_Enumerator_Rep {
    CMPIEnumeration* enumeration;
    const Meta_Class* meta_class;
    Ref<> instance;  // the current one; none at the end
};

class CMPI_Thread_Context : public Thread_Context {
public:
    CMPI_Thread_Context(const CMPIBroker* broker, const CMPIContext* context, CMPI_Adapter* adapter)
        : _broker(broker), _context(context), _adapter(adapter) {}
    ~CMPI_Thread_Context() override;

    Thread_Context* thread_create_hook(void* arg) override;
    void thread_start_hook() override;
    void thread_exit_hook() override;
    void thread_not_started_hook() override;

    Instance_Enumerator_Rep* instance_enumerator_create(const char* name_space,
                                                        const Instance* model) override;
    void instance_enumerator_destroy(Instance_Enumerator_Rep* rep) override;
    bool instance_enumerator_more(Instance_Enumerator_Rep* rep) override;
    void instance_enumerator_next(Instance_Enumerator_Rep* rep) override;
    Instance* instance_enumerator_get(Instance_Enumerator_Rep* rep) override;

    Instance* get_instance(const char* name_space, const Instance* model) override;
    int create_instance(const char* name_space, const Instance* instance) override;
    int delete_instance(const char* name_space, const Instance* instance) override;
    int modify_instance(const char* name_space, const Instance* instance) override;
    int invoke_method(const char* name_space, const Instance* instance, Instance* meth) override;
    void allow_unload(bool flag) override;
    bool get_username(String& user_name) override;

    const CMPIBroker* cmpi_broker() const { return _broker; }
    const CMPIContext* cmpi_context() const { return _context; }
    CMPI_Adapter* adapter() const { return _adapter; }

    // The calling thread's context when it is a CMPI one, else null.
    static CMPI_Thread_Context* top();

private:
    const CMPIBroker* _broker;
    const CMPIContext* _context;
    CMPI_Adapter* _adapter;
};

// Pushes a thread context for the adapter's work for as long as it lives;
// contexts left above it (by the provider) are taken off with it.
class Context_Scope {
public:
    Context_Scope(const CMPIBroker* broker, const CMPIContext* context, CMPI_Adapter* adapter);
    ~Context_Scope();
    Context_Scope(const Context_Scope&) = delete;
    Context_Scope& operator=(const Context_Scope&) = delete;

    const CMPI_Thread_Context& context() const { return _context; }

private:
    CMPI_Thread_Context _context;
};

}  // namespace CPTA

#endif
