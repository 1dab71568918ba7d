#include "cmpi/CMPI_Thread_Context.h"

#include <cmpimacs.h>

#include "cmpi/CMPI_Adapter.h"
#include "cmpi/CMPI_Containers.h"
#include "cmpi/Cmpi_Ptr.h"
#include "cmpi/Converter.h"
#include "framework/Log.h"

namespace CPTA {

namespace {

const Meta_Repository* _repository_of(const Instance* instance) {
    const Meta_Class* mc = instance->meta_class;
    return (mc->flags & FLAG_METHOD) ? nullptr : mc->meta_repository;
}

// Makes the path of instance (and, when with_instance, the instance itself)
// and hands them to up_call, which answers the broker's status code.
// 0 on CMPI_RC_OK, else -1.
template <class F>
int _write_up_call(const CMPIBroker* broker, const char* name_space, const Instance* instance,
                   bool with_instance, F up_call) {
    if (!instance)
        return -1;
    try {
        CMPIObjectPath* op = nullptr;
        if (make_cmpi_object_path(broker, instance, name_space, op) != CMPI_RC_OK)
            return -1;
        Cmpi_Ptr<CMPIObjectPath> hold_op(op);
        CMPIInstance* ci = nullptr;
        if (with_instance &&
            make_cmpi_instance(broker, instance, name_space, op, nullptr, ci) != CMPI_RC_OK)
            return -1;
        Cmpi_Ptr<CMPIInstance> hold_ci(ci);
        return up_call(op, ci) == CMPI_RC_OK ? 0 : -1;
    } catch (...) {
        return -1;
    }
}

}  // namespace

CMPI_Thread_Context::~CMPI_Thread_Context() {}

Context_Scope::Context_Scope(const CMPIBroker* broker, const CMPIContext* context,
                             CMPI_Adapter* adapter)
    : _context(broker, context, adapter) {
    Thread_Context::push(&_context);
}

Context_Scope::~Context_Scope() {
    while (Thread_Context* top = Thread_Context::top()) {
        Thread_Context::pop();
        if (top == &_context)
            break;
    }
}

CMPI_Thread_Context* CMPI_Thread_Context::top() {
    return dynamic_cast<CMPI_Thread_Context*>(Thread_Context::top());
}

Thread_Context* CMPI_Thread_Context::thread_create_hook(void*) {
    try {
        CMPIContext* context = CBPrepareAttachThread(_broker, _context);
        if (!context)
            return nullptr;
        return new CMPI_Thread_Context(_broker, context, _adapter);
    } catch (...) {
        TVRN_LOG(LL_ERR, "cannot prepare a context for a new thread");
        return nullptr;
    }
}

void CMPI_Thread_Context::thread_start_hook() {
    try {
        CBAttachThread(_broker, _context);
    } catch (...) {
        TVRN_LOG(LL_ERR, "cannot attach the thread to the server");
    }
}

void CMPI_Thread_Context::thread_exit_hook() {
    try {
        CBDetachThread(_broker, _context);
    } catch (...) {
        TVRN_LOG(LL_ERR, "cannot detach the thread from the server");
    }
}

// The broker has no service that drops a prepared context, but detaching
// releases the context of an attached thread: attached and detached at once,
// the context made for a thread that never ran is released.
void CMPI_Thread_Context::thread_not_started_hook() {
    try {
        if (CBAttachThread(_broker, _context).rc == CMPI_RC_OK)
            CBDetachThread(_broker, _context);
    } catch (...) {
        TVRN_LOG(LL_ERR, "cannot release the context prepared for a thread");
    }
}

//------------------------------------------------------------------------------
// Enumeration
//------------------------------------------------------------------------------

Instance_Enumerator_Rep* CMPI_Thread_Context::instance_enumerator_create(const char* name_space,
                                                                         const Instance* model) {
    if (!model)
        return nullptr;
    try {
        CMPIObjectPath* op = nullptr;
        if (make_cmpi_object_path(_broker, model, name_space, op) != CMPI_RC_OK)
            return nullptr;
        Cmpi_Ptr<CMPIObjectPath> hold(op);
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        CMPIEnumeration* enumeration = CBEnumInstances(_broker, _context, op, nullptr, &rc);
        if (!enumeration)
            return nullptr;
        if (rc.rc != CMPI_RC_OK) {
            CMRelease(enumeration);
            return nullptr;
        }
        Instance_Enumerator_Rep* rep =
            new Instance_Enumerator_Rep{enumeration, model->meta_class, Ref<>()};
        instance_enumerator_next(rep);
        return rep;
    } catch (...) {
        return nullptr;
    }
}

void CMPI_Thread_Context::instance_enumerator_destroy(Instance_Enumerator_Rep* rep) {
    if (!rep)
        return;
    try {
        if (rep->enumeration)
            CMRelease(rep->enumeration);
    } catch (...) {
    }
    delete rep;
}

bool CMPI_Thread_Context::instance_enumerator_more(Instance_Enumerator_Rep* rep) {
    return rep && rep->instance;
}

void CMPI_Thread_Context::instance_enumerator_next(Instance_Enumerator_Rep* rep) {
    if (!rep)
        return;
    rep->instance.reset();
    try {
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        if (!CMHasNext(rep->enumeration, &rc) || rc.rc != CMPI_RC_OK)
            return;
        CMPIData data = CMGetNext(rep->enumeration, &rc);
        if (rc.rc != CMPI_RC_OK || data.type != CMPI_instance || !data.value.inst ||
            (data.state & CMPI_nullValue))
            return;
        Cmpi_Ptr<CMPIObjectPath> op(CMGetObjectPath(data.value.inst, nullptr));
        Instance* instance = nullptr;
        if (make_cimple_instance(_broker, rep->meta_class, op.get(), data.value.inst, instance) ==
            CMPI_RC_OK)
            rep->instance.reset(instance);
    } catch (...) {
        rep->instance.reset();
    }
}

Instance* CMPI_Thread_Context::instance_enumerator_get(Instance_Enumerator_Rep* rep) {
    if (!rep || !rep->instance)
        return nullptr;
    ref(rep->instance.ptr());
    return rep->instance.ptr();
}

//------------------------------------------------------------------------------
// Instance operations
//------------------------------------------------------------------------------

Instance* CMPI_Thread_Context::get_instance(const char* name_space, const Instance* model) {
    if (!model)
        return nullptr;
    try {
        CMPIObjectPath* op = nullptr;
        if (make_cmpi_object_path(_broker, model, name_space, op) != CMPI_RC_OK)
            return nullptr;
        Cmpi_Ptr<CMPIObjectPath> hold(op);
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        Cmpi_Ptr<CMPIInstance> ci(CBGetInstance(_broker, _context, op, nullptr, &rc));
        if (!ci.get() || rc.rc != CMPI_RC_OK)
            return nullptr;
        Instance* instance = nullptr;
        if (make_cimple_instance(_broker, model->meta_class, op, ci.get(), instance) != CMPI_RC_OK)
            return nullptr;
        return instance;
    } catch (...) {
        return nullptr;
    }
}

int CMPI_Thread_Context::create_instance(const char* name_space, const Instance* instance) {
    return _write_up_call(
        _broker, name_space, instance, true, [this](CMPIObjectPath* op, CMPIInstance* ci) {
            CMPIStatus rc = {CMPI_RC_OK, nullptr};
            Cmpi_Ptr<CMPIObjectPath> created(CBCreateInstance(_broker, _context, op, ci, &rc));
            return rc.rc;
        });
}

int CMPI_Thread_Context::modify_instance(const char* name_space, const Instance* instance) {
    return _write_up_call(_broker, name_space, instance, true,
                          [this](CMPIObjectPath* op, CMPIInstance* ci) {
                              return CBModifyInstance(_broker, _context, op, ci, nullptr).rc;
                          });
}

int CMPI_Thread_Context::delete_instance(const char* name_space, const Instance* instance) {
    return _write_up_call(_broker, name_space, instance, false,
                          [this](CMPIObjectPath* op, CMPIInstance*) {
                              return CBDeleteInstance(_broker, _context, op).rc;
                          });
}

int CMPI_Thread_Context::invoke_method(const char* name_space, const Instance* instance,
                                       Instance* meth) {
    if (!instance || !meth)
        return -1;
    try {
        CMPIObjectPath* op = nullptr;
        if (make_cmpi_object_path(_broker, instance, name_space, op) != CMPI_RC_OK) {
            TVRN_WARN("failed");
            return -1;
        }
        Cmpi_Ptr<CMPIObjectPath> hold_op(op);

        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        Cmpi_Ptr<CMPIArgs> in(CMNewArgs(_broker, &rc));
        Cmpi_Ptr<CMPIArgs> out(CMNewArgs(_broker, &rc));
        if (!in.get() || !out.get()) {
            TVRN_WARN("failed");
            return -1;
        }
        {
            CMPIArgs_Container args(nullptr, _broker, name_space, in.get());
            args.convert(meth, FLAG_IN);
        }

        const Meta_Class* mc = meth->meta_class;
        CMPIData result = CBInvokeMethod(_broker, _context, op, mc->name, in.get(), out.get(), &rc);
        if (rc.rc != CMPI_RC_OK) {
            TVRN_WARN("failed[%u]", unsigned(rc.rc));
            return -1;
        }

        const Meta_Repository* repository = _repository_of(instance);
        CMPIArgs_Container args(repository, _broker, name_space, out.get());
        if (args.convert(mc, FLAG_OUT, meth) != 0) {
            TVRN_WARN("failed");
            return -1;
        }
        const Meta_Feature* rv =
            find_parameter(reinterpret_cast<const Meta_Method*>(mc), "return_value");
        if (rv) {
            Value value;
            if (cmpi_to_cimple_value(repository, _broker, name_space, result, value) != 0 ||
                value.get(meth, rv) != 0) {
                TVRN_WARN("failed");
                return -1;
            }
        }
        __set_name_space_recursive(meth, name_space, false);
        return 0;
    } catch (...) {
        TVRN_WARN("failed");
        return -1;
    }
}

void CMPI_Thread_Context::allow_unload(bool flag) {
    if (_adapter)
        _adapter->allow_unload(flag);
}

bool CMPI_Thread_Context::get_username(String& user_name) {
    try {
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        CMPIData data = CMGetContextEntry(_context, CMPIPrincipal, &rc);
        if (rc.rc != CMPI_RC_OK || data.type != CMPI_string || (data.state & CMPI_nullValue) ||
            !data.value.string) {
            TVRN_LOG(LL_ERR, "username not OK cmpirc=%d", int(rc.rc));
            return false;
        }
        const char* chars = CMGetCharsPtr(data.value.string, nullptr);
        if (!chars) {
            TVRN_LOG(LL_ERR, "username not OK cmpirc=%d", int(CMPI_RC_ERR_FAILED));
            return false;
        }
        user_name = chars;
        return true;
    } catch (...) {
        return false;
    }
}

}  // namespace CPTA
