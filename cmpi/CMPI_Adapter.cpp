#include "cmpi/CMPI_Adapter.h"

#include <cstdio>
#include <cstring>
#include <mutex>

#include "cmpi/CMPI_Entry.h"
#include "cmpi/Converter.h"

namespace CPTA {

namespace {

// Guards the creation of adapters and the MI counts of the module.
std::recursive_mutex& _module_mutex() {
    static std::recursive_mutex mutex;
    return mutex;
}

const char* const _rc_names[] = {
    "CMPI_RC_OK",                                // 0
    "CMPI_RC_ERR_FAILED",                        // 1
    "CMPI_RC_ERR_ACCESS_DENIED",                 // 2
    "CMPI_RC_ERR_INVALID_NAMESPACE",             // 3
    "CMPI_RC_ERR_INVALID_PARAMETER",             // 4
    "CMPI_RC_ERR_INVALID_CLASS",                 // 5
    "CMPI_RC_ERR_NOT_FOUND",                     // 6
    "CMPI_RC_ERR_NOT_SUPPORTED",                 // 7
    "CMPI_RC_ERR_CLASS_HAS_CHILDREN",            // 8
    "CMPI_RC_ERR_CLASS_HAS_INSTANCES",           // 9
    "CMPI_RC_ERR_INVALID_SUPERCLASS",            // 10
    "CMPI_RC_ERR_ALREADY_EXISTS",                // 11
    "CMPI_RC_ERR_NO_SUCH_PROPERTY",              // 12
    "CMPI_RC_ERR_TYPE_MISMATCH",                 // 13
    "CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED",  // 14
    "CMPI_RC_ERR_INVALID_QUERY",                 // 15
    "CMPI_RC_ERR_METHOD_NOT_AVAILABLE",          // 16
    "CMPI_RC_ERR_METHOD_NOT_FOUND",              // 17
};

// Pops (and destroys) a context pushed for an adapter's own work.
class Context_Scope {
public:
    Context_Scope(const CMPIBroker* broker, const CMPIContext* context, CMPI_Adapter* adapter)
        : _context(broker, context, adapter) {
        Thread_Context::push(&_context);
    }
    ~Context_Scope() {
        while (Thread_Context* top = Thread_Context::top()) {
            Thread_Context::pop();
            if (top == &_context)
                break;
        }
    }
    Context_Scope(const Context_Scope&) = delete;
    Context_Scope& operator=(const Context_Scope&) = delete;

private:
    CMPI_Thread_Context _context;
};

template <class FT>
void _fill_table_head(FT& ft, const char* name) {
    ft.ftVersion = 100;
    ft.miVersion = 100;
    ft.miName = name;
}

//------------------------------------------------------------------------------
// Results of the instance entries
//------------------------------------------------------------------------------

// What the result callbacks of one request share.
struct Result_Data {
    const CMPIBroker* broker;
    const CMPIResult* result;
    String name_space;
    const char* const* properties;
    bool failed;
};

bool _enum_instance_names_proc(Instance* instance, Enum_Instances_Status, void* client_data) {
    Result_Data* data = static_cast<Result_Data*>(client_data);
    if (!instance)
        return false;
    Ref<> hold(instance);
    if (data->failed)
        return false;
    try {
        CMPIObjectPath* op = nullptr;
        if (make_cmpi_object_path(data->broker, instance, data->name_space.c_str(), op) !=
            CMPI_RC_OK) {
            data->failed = true;
            return false;
        }
        Cmpi_Ptr<CMPIObjectPath> hold_op(op);
        if (CMReturnObjectPath(data->result, op).rc != CMPI_RC_OK)
            data->failed = true;
    } catch (...) {
        data->failed = true;
    }
    return !data->failed;
}

// Returns one instance restricted to the request's property list.
int _return_instance(Result_Data* data, const Instance* instance) {
    return _return_cmpi_instance(data->broker, data->result, instance, data->name_space.c_str(),
                                 data->properties);
}

bool _enum_instances_proc(Instance* instance, Enum_Instances_Status, void* client_data) {
    Result_Data* data = static_cast<Result_Data*>(client_data);
    if (!instance)
        return false;
    Ref<> hold(instance);
    if (data->failed)
        return false;
    try {
        if (_return_instance(data, instance) != CMPI_RC_OK)
            data->failed = true;
    } catch (...) {
        data->failed = true;
    }
    return !data->failed;
}

Entry_Status _done(const CMPIResult* result) {
    CMReturnDone(result);
    return CMPI_RC_OK;
}

}  // namespace

int _return_cmpi_instance(const CMPIBroker* broker, const CMPIResult* result,
                          const Instance* instance, const char* name_space,
                          const char* const* properties) {
    CMPIObjectPath* op = nullptr;
    int rc = make_cmpi_object_path(broker, instance, name_space, op);
    if (rc != CMPI_RC_OK)
        return rc;
    Cmpi_Ptr<CMPIObjectPath> hold_op(op);
    CMPIInstance* ci = nullptr;
    rc = make_cmpi_instance(broker, instance, name_space, op, properties, ci);
    if (rc != CMPI_RC_OK)
        return rc;
    Cmpi_Ptr<CMPIInstance> hold_ci(ci);
    return CMReturnInstance(result, ci).rc;
}

const char* _rc_to_str(int rc) {
    if (rc >= 0 && rc < int(sizeof(_rc_names) / sizeof(_rc_names[0])) && rc != 1)
        return _rc_names[rc];
    switch (rc) {
        case CMPI_RC_DO_NOT_UNLOAD: return "CMPI_RC_DO_NOT_UNLOAD";
        case CMPI_RC_NEVER_UNLOAD: return "CMPI_RC_NEVER_UNLOAD";
        case CMPI_RC_ERR_INVALID_HANDLE: return "CMPI_RC_ERR_INVALID_HANDLE";
        case CMPI_RC_ERR_INVALID_DATA_TYPE: return "CMPI_RC_ERR_INVALID_DATA_TYPE";
        case CMPI_RC_ERROR_SYSTEM: return "CMPI_RC_ERROR_SYSTEM";
        case CMPI_RC_ERROR: return "CMPI_RC_ERROR";
        default: return "CMPI_RC_ERR_FAILED";
    }
}

void _log_enter(const char* name) {
    TVRN_LOG(LL_DBG, "enter: %s()", name);
}

void _log_return(const char* name, const Entry_Status& status) {
    if (status.message.size())
        TVRN_LOG(LL_DBG, "return: %s(): %s %s", name, _rc_to_str(status.rc),
                 status.message.c_str());
    else
        TVRN_LOG(LL_DBG, "return: %s(): %s", name, _rc_to_str(status.rc));
}

//------------------------------------------------------------------------------
// Class look-up
//------------------------------------------------------------------------------

int _request_class(CMPI_Adapter* adapter, const CMPIObjectPath* op, const Meta_Class*& mc) {
    mc = nullptr;
    String class_name;
    if (op) {
        if (CMPIString* cn = CMGetClassName(op, nullptr)) {
            if (const char* chars = CMGetCharsPtr(cn, nullptr))
                class_name = chars;
            CMRelease(cn);
        }
    }
    mc = find_meta_class(adapter->get_repository(), class_name.c_str());
    return mc ? CMPI_RC_OK : CMPI_RC_ERR_FAILED;
}

Entry_Status _target_class(CMPI_Adapter* adapter, const CMPIObjectPath* op, const Meta_Class*& mc) {
    if (_request_class(adapter, op, mc) != CMPI_RC_OK)
        return CMPI_RC_ERR_FAILED;
    const Meta_Class* own = adapter->meta_class();
    if (is_subclass(own, mc))
        return CMPI_RC_OK;
    // The provider works on instances of its own class: a request for an
    // ancestor is served as one for the provider's class, and an instance of
    // an unrelated (or smaller) class is never passed in its place.
    if (is_subclass(mc, own)) {
        mc = own;
        return CMPI_RC_OK;
    }
    return Entry_Status(CMPI_RC_ERR_INVALID_CLASS,
                        String("class not served by this provider: ", mc->name));
}

//------------------------------------------------------------------------------
// Life cycle
//------------------------------------------------------------------------------

CMPI_Adapter::CMPI_Adapter(const CMPIBroker* broker, const CMPIContext* context,
                           const char* provider_name, const Registration* registration,
                           CMPI_Static_Data* static_data)
    : Provider_Handle(registration),
      _broker(nullptr),
      _static_data(static_data),
      _mi_count(1),
      _unload_allowed(true),
      _meta_class(nullptr),
      _indications_enabled(false),
      _disabling(false),
      _mutex(true) {
    TVRN_LOG(LL_DBG, "enter: %s()", "CMPI_Adapter");
    Context_Scope scope(broker, context, this);
    _fill_static_data(provider_name);
    _broker = broker;
    // As with a failed load status, the provider stays; the server is not told.
    try {
        load();
    } catch (const std::exception& e) {
        TVRN_LOG(LL_ERR, "load of %s failed: %s", provider_name, e.what());
    } catch (...) {
        TVRN_LOG(LL_ERR, "load of %s failed", provider_name);
    }
    _meta_class = get_meta_class();
    TVRN_LOG(LL_DBG, "return: %s()", "CMPI_Adapter");
}

CMPI_Adapter::~CMPI_Adapter() {
    TVRN_LOG(LL_DBG, "enter: %s()", "~CMPI_Adapter");
    _static_data->magic = CMPI_STATIC_DATA_DEAD;
    _static_data->adapter = nullptr;
    _name_spaces.clear();
    if (_provider) {
        call(OPERATION_DESTROY_PROVIDER);
        _provider = nullptr;
    }
    TVRN_LOG(LL_DBG, "return: %s()", "~CMPI_Adapter");
}

void CMPI_Adapter::_fill_static_data(const char* provider_name) {
    CMPI_Static_Data* sd = _static_data;
    sd->magic = CMPI_STATIC_DATA_MAGIC;
    sd->adapter = this;

    snprintf(sd->instance_mi_name, CMPI_MI_NAME_SIZE, "instance%s", provider_name);
    snprintf(sd->method_mi_name, CMPI_MI_NAME_SIZE, "method%s", provider_name);
    snprintf(sd->indication_mi_name, CMPI_MI_NAME_SIZE, "indication%s", provider_name);
    snprintf(sd->association_mi_name, CMPI_MI_NAME_SIZE, "association%s", provider_name);

    CMPIInstanceMIFT& ift = sd->instance_ft;
    _fill_table_head(ift, sd->instance_mi_name);
    ift.cleanup = instanceCleanup;
    ift.enumerateInstanceNames = enumInstanceNames;
    ift.enumerateInstances = enumInstances;
    ift.getInstance = getInstance;
    ift.createInstance = createInstance;
    ift.modifyInstance = modifyInstance;
    ift.deleteInstance = deleteInstance;
    ift.execQuery = execQuery;
    sd->instance_mi.hdl = sd;
    sd->instance_mi.ft = &ift;

    CMPIMethodMIFT& mft = sd->method_ft;
    _fill_table_head(mft, sd->method_mi_name);
    mft.cleanup = methodCleanup;
    mft.invokeMethod = invokeMethod;
    sd->method_mi.hdl = sd;
    sd->method_mi.ft = &mft;

    CMPIIndicationMIFT& nft = sd->indication_ft;
    _fill_table_head(nft, sd->indication_mi_name);
    nft.cleanup = indicationCleanup;
    nft.authorizeFilter = authorizeFilter;
    nft.mustPoll = mustPoll;
    nft.activateFilter = activateFilter;
    nft.deActivateFilter = deactivateFilter;
    nft.enableIndications = enableIndications;
    nft.disableIndications = disableIndications;
    sd->indication_mi.hdl = sd;
    sd->indication_mi.ft = &nft;

    CMPIAssociationMIFT& aft = sd->association_ft;
    _fill_table_head(aft, sd->association_mi_name);
    aft.cleanup = associationCleanup;
    aft.associators = associators;
    aft.associatorNames = associatorNames;
    aft.references = references;
    aft.referenceNames = referenceNames;
    sd->association_mi.hdl = sd;
    sd->association_mi.ft = &aft;
}

CMPI_Adapter* CMPI_Adapter::from_handle(void* hdl) {
    CMPI_Static_Data* sd = static_cast<CMPI_Static_Data*>(hdl);
    if (!sd || sd->magic != CMPI_STATIC_DATA_MAGIC)
        return nullptr;
    return sd->adapter;
}

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
        static_data->adapter->_mi_count++;
    else
        new CMPI_Adapter(broker, context, provider_name, registration, static_data);

    switch (kind) {
        case 'I': *mi = &static_data->instance_mi; break;
        case 'M': *mi = &static_data->method_mi; break;
        case 'A': *mi = &static_data->association_mi; break;
        default: *mi = &static_data->indication_mi; break;
    }
    TVRN_LOG(LL_DBG, "return: %s()", "cimple_cmpi_adapter");
    return 0;
}

void* __create_mi(CMPI_Static_Data* static_data, const Registration* registration,
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

CMPIStatus CMPI_Adapter::cleanup(CMPI_Adapter* adapter, const CMPIContext*, bool terminating) {
    TVRN_LOG(LL_DBG, "enter: %s()", "cleanup");
    CMPIStatus status = {CMPI_RC_OK, nullptr};
    std::lock_guard<std::recursive_mutex> guard(_module_mutex());

    if (!terminating && !adapter->_unload_allowed) {
        TVRN_LOG(LL_DBG, "cleanup do not unload");
        status.rc = CMPI_RC_DO_NOT_UNLOAD;
    } else if (adapter->_mi_count == 1) {
        try {
            adapter->unload();
        } catch (...) {
            TVRN_LOG(LL_ERR, "unload of %s failed", adapter->registration()->provider_name);
        }
        TVRN_LOG(LL_DBG, "cleanup unload");
        delete adapter;
    } else {
        adapter->_mi_count--;
        TVRN_LOG(LL_DBG, "cleanup decrement");
    }
    TVRN_LOG(LL_DBG, "return: %s(): %s", "cleanup", _rc_to_str(status.rc));
    return status;
}

namespace {

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
            return CMPI_Adapter::cleanup(adapter, context, terminating != 0);
        Context_Scope scope(adapter->broker(), context, adapter);
        return CMPI_Adapter::cleanup(adapter, context, terminating != 0);
    } catch (const std::exception& e) {
        _log_return("cleanup", Entry_Status(CMPI_RC_ERR_FAILED, e.what()));
    } catch (...) {
        _log_return("cleanup", Entry_Status(CMPI_RC_ERR_FAILED, "unexpected exception"));
    }
    CMPIStatus status = {CMPI_RC_ERR_FAILED, nullptr};
    return status;
}

}  // namespace

CMPIStatus CMPI_Adapter::instanceCleanup(CMPIInstanceMI* mi, const CMPIContext* context,
                                         CMPIBoolean terminating) {
    return _cleanup_entry(mi ? mi->hdl : nullptr, context, terminating, true);
}

CMPIStatus CMPI_Adapter::methodCleanup(CMPIMethodMI* mi, const CMPIContext* context,
                                       CMPIBoolean terminating) {
    return _cleanup_entry(mi ? mi->hdl : nullptr, context, terminating, true);
}

CMPIStatus CMPI_Adapter::indicationCleanup(CMPIIndicationMI* mi, const CMPIContext* context,
                                           CMPIBoolean terminating) {
    return _cleanup_entry(mi ? mi->hdl : nullptr, context, terminating, true);
}

CMPIStatus CMPI_Adapter::associationCleanup(CMPIAssociationMI* mi, const CMPIContext* context,
                                            CMPIBoolean terminating) {
    return _cleanup_entry(mi ? mi->hdl : nullptr, context, terminating, false);
}

//------------------------------------------------------------------------------
// Instance entries
//------------------------------------------------------------------------------

CMPIStatus CMPI_Adapter::enumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* context,
                                           const CMPIResult* result, const CMPIObjectPath* op) {
    return run_entry(
        "enumInstanceNames", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
            const Meta_Class* mc = nullptr;
            Entry_Status cls = _target_class(adapter, op, mc);
            if (cls.rc != CMPI_RC_OK)
                return cls;
            Instance* model = nullptr;
            int rc = make_cimple_reference(adapter->_broker, mc, op, model);
            if (rc != CMPI_RC_OK)
                return rc;
            Ref<> hold(model);
            __set_null_flags(model, false, true, true);  // only the keys are wanted

            Result_Data data = {adapter->_broker, result, name_space_of(op), nullptr, false};
            Enum_Instances_Status status =
                adapter->enum_instances(model, _enum_instance_names_proc, &data);
            if (status == ENUM_INSTANCES_FAILED)
                return CMPI_RC_ERR_FAILED;
            if (status == ENUM_INSTANCES_ACCESS_DENIED)
                return CMPI_RC_ERR_ACCESS_DENIED;
            return _done(result);
        });
}

CMPIStatus CMPI_Adapter::enumInstances(CMPIInstanceMI* mi, const CMPIContext* context,
                                       const CMPIResult* result, const CMPIObjectPath* op,
                                       const char** properties) {
    return run_entry(
        "enumInstances", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
            const Meta_Class* mc = nullptr;
            Entry_Status cls = _target_class(adapter, op, mc);
            if (cls.rc != CMPI_RC_OK)
                return cls;
            Instance* model = nullptr;
            int rc = make_cimple_reference(adapter->_broker, mc, op, model);
            if (rc != CMPI_RC_OK)
                return rc;
            Ref<> hold(model);
            if (properties)
                filter_properties(model, properties, true);

            Result_Data data = {adapter->_broker, result, name_space_of(op), properties, false};
            Enum_Instances_Status status =
                adapter->enum_instances(model, _enum_instances_proc, &data);
            if (status == ENUM_INSTANCES_FAILED)
                return CMPI_RC_ERR_FAILED;
            if (status == ENUM_INSTANCES_ACCESS_DENIED)
                return CMPI_RC_ERR_ACCESS_DENIED;
            return _done(result);
        });
}

CMPIStatus CMPI_Adapter::getInstance(CMPIInstanceMI* mi, const CMPIContext* context,
                                     const CMPIResult* result, const CMPIObjectPath* op,
                                     const char** properties) {
    return run_entry(
        "getInstance", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
            const Meta_Class* mc = nullptr;
            Entry_Status cls = _target_class(adapter, op, mc);
            if (cls.rc != CMPI_RC_OK)
                return cls;
            Instance* model = nullptr;
            int rc = make_cimple_reference(adapter->_broker, mc, op, model);
            if (rc != CMPI_RC_OK)
                return rc;
            Ref<> hold(model);
            filter_properties(model, nullptr, true);
            if (properties)
                filter_properties(model, properties, true);

            Instance* found = nullptr;
            Get_Instance_Status status = adapter->get_instance(model, found);
            Ref<> hold_found(found);
            switch (status) {
                case GET_INSTANCE_NOT_FOUND: return CMPI_RC_ERR_NOT_FOUND;
                case GET_INSTANCE_UNSUPPORTED: return CMPI_RC_ERR_FAILED;
                case GET_INSTANCE_INVALID_PARAMETER: return CMPI_RC_ERR_INVALID_PARAMETER;
                case GET_INSTANCE_ACCESS_DENIED: return CMPI_RC_ERR_ACCESS_DENIED;
                case GET_INSTANCE_FAILED: return CMPI_RC_ERR_FAILED;
                default: break;
            }
            if (!found)
                return Entry_Status(CMPI_RC_ERR_FAILED, "provider returned no instance");
            Result_Data data = {adapter->_broker, result, name_space_of(op), properties, false};
            rc = _return_instance(&data, found);
            if (rc != CMPI_RC_OK)
                return rc;
            return _done(result);
        });
}

CMPIStatus CMPI_Adapter::createInstance(CMPIInstanceMI* mi, const CMPIContext* context,
                                        const CMPIResult* result, const CMPIObjectPath* op,
                                        const CMPIInstance* cmpi_instance) {
    return run_entry(
        "createInstance", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
            const Meta_Class* mc = nullptr;
            Entry_Status cls = _target_class(adapter, op, mc);
            if (cls.rc != CMPI_RC_OK)
                return cls;
            Instance* instance = nullptr;
            int rc = make_cimple_instance(adapter->_broker, mc, op, cmpi_instance, instance);
            if (rc != CMPI_RC_OK)
                return rc;
            Ref<> hold(instance);

            switch (adapter->create_instance(instance)) {
                case CREATE_INSTANCE_DUPLICATE: return CMPI_RC_ERR_ALREADY_EXISTS;
                case CREATE_INSTANCE_UNSUPPORTED: return CMPI_RC_ERR_NOT_SUPPORTED;
                case CREATE_INSTANCE_INVALID_PARAMETER: return CMPI_RC_ERR_INVALID_PARAMETER;
                case CREATE_INSTANCE_ACCESS_DENIED: return CMPI_RC_ERR_ACCESS_DENIED;
                case CREATE_INSTANCE_FAILED: return CMPI_RC_ERR_FAILED;
                default: break;
            }
            String ns = name_space_of(op);
            CMPIObjectPath* created = nullptr;
            rc = make_cmpi_object_path(adapter->_broker, instance, ns.c_str(), created);
            if (rc != CMPI_RC_OK)
                return rc;
            Cmpi_Ptr<CMPIObjectPath> hold_path(created);
            CMReturnObjectPath(result, created);
            return _done(result);
        });
}

CMPIStatus CMPI_Adapter::modifyInstance(CMPIInstanceMI* mi, const CMPIContext* context,
                                        const CMPIResult* result, const CMPIObjectPath* op,
                                        const CMPIInstance* cmpi_instance,
                                        const char** properties) {
    return run_entry("modifyInstance", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
                         const Meta_Class* mc = nullptr;
                         Entry_Status cls = _target_class(adapter, op, mc);
                         if (cls.rc != CMPI_RC_OK)
                             return cls;
                         Instance* instance = nullptr;
                         int rc = make_cimple_instance(adapter->_broker, mc, op, cmpi_instance,
                                                       instance);
                         if (rc != CMPI_RC_OK)
                             return rc;
                         Ref<> hold(instance);
                         Ref<> model(clone(instance));
                         if (!model)
                             return CMPI_RC_ERR_FAILED;
                         if (properties)
                             filter_properties(model.ptr(), properties, true);

                         switch (adapter->modify_instance(model.ptr(), instance)) {
                             case MODIFY_INSTANCE_NOT_FOUND: return CMPI_RC_ERR_NOT_FOUND;
                             case MODIFY_INSTANCE_UNSUPPORTED: return CMPI_RC_ERR_NOT_SUPPORTED;
                             case MODIFY_INSTANCE_INVALID_PARAMETER:
                                 return CMPI_RC_ERR_INVALID_PARAMETER;
                             case MODIFY_INSTANCE_ACCESS_DENIED: return CMPI_RC_ERR_ACCESS_DENIED;
                             case MODIFY_INSTANCE_FAILED: return CMPI_RC_ERR_FAILED;
                             default: break;
                         }
                         return _done(result);
                     });
}

CMPIStatus CMPI_Adapter::deleteInstance(CMPIInstanceMI* mi, const CMPIContext* context,
                                        const CMPIResult* result, const CMPIObjectPath* op) {
    return run_entry("deleteInstance", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
                         const Meta_Class* mc = nullptr;
                         Entry_Status cls = _target_class(adapter, op, mc);
                         if (cls.rc != CMPI_RC_OK)
                             return cls;
                         Instance* instance = nullptr;
                         int rc = make_cimple_reference(adapter->_broker, mc, op, instance);
                         if (rc != CMPI_RC_OK)
                             return rc;
                         Ref<> hold(instance);

                         switch (adapter->delete_instance(instance)) {
                             case DELETE_INSTANCE_NOT_FOUND: return CMPI_RC_ERR_NOT_FOUND;
                             case DELETE_INSTANCE_UNSUPPORTED: return CMPI_RC_ERR_NOT_SUPPORTED;
                             case DELETE_INSTANCE_ACCESS_DENIED: return CMPI_RC_ERR_ACCESS_DENIED;
                             case DELETE_INSTANCE_FAILED: return CMPI_RC_ERR_FAILED;
                             default: break;
                         }
                         return _done(result);
                     });
}

CMPIStatus CMPI_Adapter::execQuery(CMPIInstanceMI* mi, const CMPIContext* context,
                                   const CMPIResult*, const CMPIObjectPath*, const char*,
                                   const char*) {
    return run_entry(
        "execQuery", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter*, Entry_Scope&) -> Entry_Status { return CMPI_RC_ERR_NOT_SUPPORTED; });
}

}  // namespace CPTA
