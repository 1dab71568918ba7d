// The entries of the instance MI: enumerate instances and their names, get,
// create, modify and delete an instance, and queries (not supported).
#include "cmpi/CMPI_Instance_MI.h"

#include "cmpi/CMPI_Entry.h"
#include "cmpi/Cmpi_Ptr.h"
#include "cmpi/Converter.h"

namespace CPTA {

namespace {

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

CMPIStatus enumInstanceNames(CMPIInstanceMI* mi, const CMPIContext* context,
                             const CMPIResult* result, const CMPIObjectPath* op) {
    return run_entry(
        "enumInstanceNames", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
            const Meta_Class* mc = nullptr;
            Entry_Status cls = _target_class(adapter, op, mc);
            if (cls.rc != CMPI_RC_OK)
                return cls;
            Instance* model = nullptr;
            int rc = make_cimple_reference(adapter->broker(), mc, op, model);
            if (rc != CMPI_RC_OK)
                return rc;
            Ref<> hold(model);
            __set_null_flags(model, false, true, true);  // only the keys are wanted

            Result_Data data = {adapter->broker(), result, name_space_of(op), nullptr, false};
            Enum_Instances_Status status =
                adapter->enum_instances(model, _enum_instance_names_proc, &data);
            if (status == ENUM_INSTANCES_FAILED)
                return CMPI_RC_ERR_FAILED;
            if (status == ENUM_INSTANCES_ACCESS_DENIED)
                return CMPI_RC_ERR_ACCESS_DENIED;
            return _done(result);
        });
}

CMPIStatus enumInstances(CMPIInstanceMI* mi, const CMPIContext* context, const CMPIResult* result,
                         const CMPIObjectPath* op, const char** properties) {
    return run_entry(
        "enumInstances", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
            const Meta_Class* mc = nullptr;
            Entry_Status cls = _target_class(adapter, op, mc);
            if (cls.rc != CMPI_RC_OK)
                return cls;
            Instance* model = nullptr;
            int rc = make_cimple_reference(adapter->broker(), mc, op, model);
            if (rc != CMPI_RC_OK)
                return rc;
            Ref<> hold(model);
            if (properties)
                filter_properties(model, properties, true);

            Result_Data data = {adapter->broker(), result, name_space_of(op), properties, false};
            Enum_Instances_Status status =
                adapter->enum_instances(model, _enum_instances_proc, &data);
            if (status == ENUM_INSTANCES_FAILED)
                return CMPI_RC_ERR_FAILED;
            if (status == ENUM_INSTANCES_ACCESS_DENIED)
                return CMPI_RC_ERR_ACCESS_DENIED;
            return _done(result);
        });
}

CMPIStatus getInstance(CMPIInstanceMI* mi, const CMPIContext* context, const CMPIResult* result,
                       const CMPIObjectPath* op, const char** properties) {
    return run_entry(
        "getInstance", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
            const Meta_Class* mc = nullptr;
            Entry_Status cls = _target_class(adapter, op, mc);
            if (cls.rc != CMPI_RC_OK)
                return cls;
            Instance* model = nullptr;
            int rc = make_cimple_reference(adapter->broker(), mc, op, model);
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
            Result_Data data = {adapter->broker(), result, name_space_of(op), properties, false};
            rc = _return_instance(&data, found);
            if (rc != CMPI_RC_OK)
                return rc;
            return _done(result);
        });
}

CMPIStatus createInstance(CMPIInstanceMI* mi, const CMPIContext* context, const CMPIResult* result,
                          const CMPIObjectPath* op, const CMPIInstance* cmpi_instance) {
    return run_entry(
        "createInstance", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
            const Meta_Class* mc = nullptr;
            Entry_Status cls = _target_class(adapter, op, mc);
            if (cls.rc != CMPI_RC_OK)
                return cls;
            Instance* instance = nullptr;
            int rc = make_cimple_instance(adapter->broker(), mc, op, cmpi_instance, instance);
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
            rc = make_cmpi_object_path(adapter->broker(), instance, ns.c_str(), created);
            if (rc != CMPI_RC_OK)
                return rc;
            Cmpi_Ptr<CMPIObjectPath> hold_path(created);
            CMReturnObjectPath(result, created);
            return _done(result);
        });
}

CMPIStatus modifyInstance(CMPIInstanceMI* mi, const CMPIContext* context, const CMPIResult* result,
                          const CMPIObjectPath* op, const CMPIInstance* cmpi_instance,
                          const char** properties) {
    return run_entry("modifyInstance", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
                         const Meta_Class* mc = nullptr;
                         Entry_Status cls = _target_class(adapter, op, mc);
                         if (cls.rc != CMPI_RC_OK)
                             return cls;
                         Instance* instance = nullptr;
                         int rc = make_cimple_instance(adapter->broker(), mc, op, cmpi_instance,
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

CMPIStatus deleteInstance(CMPIInstanceMI* mi, const CMPIContext* context, const CMPIResult* result,
                          const CMPIObjectPath* op) {
    return run_entry("deleteInstance", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
                         const Meta_Class* mc = nullptr;
                         Entry_Status cls = _target_class(adapter, op, mc);
                         if (cls.rc != CMPI_RC_OK)
                             return cls;
                         Instance* instance = nullptr;
                         int rc = make_cimple_reference(adapter->broker(), mc, op, instance);
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

CMPIStatus execQuery(CMPIInstanceMI* mi, const CMPIContext* context, const CMPIResult*,
                     const CMPIObjectPath*, const char*, const char*) {
    return run_entry(
        "execQuery", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter*, Entry_Scope&) -> Entry_Status { return CMPI_RC_ERR_NOT_SUPPORTED; });
}

}  // namespace

void set_instance_entries(CMPIInstanceMIFT& ft) {
    ft.enumerateInstanceNames = enumInstanceNames;
    ft.enumerateInstances = enumInstances;
    ft.getInstance = getInstance;
    ft.createInstance = createInstance;
    ft.modifyInstance = modifyInstance;
    ft.deleteInstance = deleteInstance;
    ft.execQuery = execQuery;
}

}  // namespace CPTA
