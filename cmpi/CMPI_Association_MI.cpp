// The entries of the association MI: associators, associator names,
// references and reference names, each with the fallbacks of the provider
// handle (cmpi/Provider_Handle.h).
#include "cmpi/CMPI_Association_MI.h"

#include "cmpi/CMPI_Entry.h"
#include "cmpi/Cmpi_Ptr.h"
#include "cmpi/Converter.h"
#include "framework/Slot.h"

namespace CPTA {

namespace {

String _string_or_empty(const char* s) {
    return String(s ? s : "");
}

// What the association callbacks of one request share.
struct Association_Data {
    const CMPIBroker* broker;
    const CMPIContext* context;
    const CMPIResult* result;
    String name_space;
    const char* const* properties;
    bool stopped;
};

// The name space that a delivered object goes out with: its own, else the
// request's.
const char* _name_space_for(const Association_Data* data, const Instance* instance) {
    return instance->__name_space.size() ? instance->__name_space.c_str()
                                         : data->name_space.c_str();
}

int _return_path(Association_Data* data, const Instance* instance) {
    CMPIObjectPath* op = nullptr;
    int rc = make_cmpi_object_path(data->broker, instance, _name_space_for(data, instance), op);
    if (rc != CMPI_RC_OK)
        return rc;
    Cmpi_Ptr<CMPIObjectPath> hold(op);
    return CMReturnObjectPath(data->result, op).rc;
}

int _return_instance(Association_Data* data, const Instance* instance) {
    return _return_cmpi_instance(data->broker, data->result, instance,
                                 _name_space_for(data, instance), data->properties);
}

// Runs one result through f unless an earlier one failed.
template <class F>
bool _deliver(Instance* instance, void* client_data, F f) {
    Association_Data* data = static_cast<Association_Data*>(client_data);
    if (!instance)
        return false;
    Ref<> hold(instance);
    if (data->stopped)
        return false;
    try {
        if (f(data, instance) != CMPI_RC_OK)
            data->stopped = true;
    } catch (...) {
        data->stopped = true;
    }
    return !data->stopped;
}

bool _associator_names_proc(Instance* instance, Enum_Associator_Names_Status, void* data) {
    return _deliver(instance, data, _return_path);
}

bool _associators_proc(Instance* instance, Enum_Associators_Status, void* data) {
    return _deliver(instance, data, _return_instance);
}

// The fallback of associators: the full instance of each associated object,
// from the server.
bool _associator_instances_proc(Instance* instance, Enum_Associator_Names_Status, void* data) {
    return _deliver(instance, data, [](Association_Data* d, Instance* object) -> int {
        CMPIObjectPath* op = nullptr;
        int rc = make_cmpi_object_path(d->broker, object, _name_space_for(d, object), op);
        if (rc != CMPI_RC_OK)
            return rc;
        Cmpi_Ptr<CMPIObjectPath> hold_op(op);
        CMPIStatus st = {CMPI_RC_OK, nullptr};
        CMPIInstance* ci =
            CBGetInstance(d->broker, d->context, op, const_cast<const char**>(d->properties), &st);
        if (!ci)
            return CMPI_RC_ERR_NOT_FOUND;
        Cmpi_Ptr<CMPIInstance> hold_ci(ci);
        if (st.rc != CMPI_RC_OK)
            return st.rc;
        return CMReturnInstance(d->result, ci).rc;
    });
}

bool _reference_names_proc(Instance* instance, Enum_References_Status, void* data) {
    return _deliver(instance, data, _return_path);
}

bool _names_listed(const char* const* properties, const char* name) {
    for (; *properties; properties++) {
        if (String(*properties).equali(name))
            return true;
    }
    return false;
}

// Leaves only the listed properties (and reference arrays) of a result
// instance; the listed ones keep their values, null or not.
void _restrict_properties(Instance* instance, const char* const* properties) {
    const Meta_Class* mc = instance->meta_class;
    for (size_t i = 0; i < mc->num_meta_features; i++) {
        const Meta_Feature* mf = mc->meta_features[i];
        if (_names_listed(properties, mf->name))
            continue;
        if (is_property(mf)) {
            const Meta_Property* mp = as_property(mf);
            null_flag(slot_of(instance, mp->offset), mp) = 1;
        } else if (is_reference(mf) && as_reference(mf)->subscript) {
            ref_array_null(slot_of(instance, as_reference(mf)->offset)) = 1;
        }
    }
}

bool _references_proc(Instance* instance, Enum_References_Status, void* data) {
    return _deliver(instance, data, [](Association_Data* d, Instance* association) -> int {
        const char* ns = _name_space_for(d, association);
        CMPIObjectPath* op = nullptr;
        int rc = make_cmpi_object_path(d->broker, association, ns, op);
        if (rc != CMPI_RC_OK)
            return rc;
        Cmpi_Ptr<CMPIObjectPath> hold_op(op);
        if (d->properties)
            _restrict_properties(association, d->properties);
        CMPIInstance* ci = nullptr;
        rc = make_cmpi_instance(d->broker, association, ns, op, d->properties, ci);
        if (rc != CMPI_RC_OK)
            return rc;
        Cmpi_Ptr<CMPIInstance> hold_ci(ci);
        return CMReturnInstance(d->result, ci).rc;
    });
}

Entry_Status _map_associator_names(Enum_Associator_Names_Status status, const CMPIResult* result) {
    switch (status) {
        case ENUM_ASSOCIATOR_NAMES_FAILED: return CMPI_RC_ERR_FAILED;
        case ENUM_ASSOCIATOR_NAMES_UNSUPPORTED: return CMPI_RC_ERR_NOT_SUPPORTED;
        case ENUM_ASSOCIATOR_NAMES_ACCESS_DENIED: return CMPI_RC_ERR_ACCESS_DENIED;
        default: break;
    }
    CMReturnDone(result);
    return CMPI_RC_OK;
}

Entry_Status _map_references(Enum_References_Status status, const CMPIResult* result) {
    switch (status) {
        case ENUM_REFERENCES_FAILED: return CMPI_RC_ERR_FAILED;
        case ENUM_REFERENCES_UNSUPPORTED: return CMPI_RC_ERR_NOT_SUPPORTED;
        case ENUM_REFERENCES_ACCESS_DENIED: return CMPI_RC_ERR_ACCESS_DENIED;
        default: break;
    }
    CMReturnDone(result);
    return CMPI_RC_OK;
}

// The key-only source object of an association request.
int _source(CMPI_Adapter* adapter, const CMPIObjectPath* op, Instance*& source) {
    source = nullptr;
    const Meta_Class* mc = nullptr;
    if (_request_class(adapter, op, mc) != CMPI_RC_OK)
        return CMPI_RC_ERR_INVALID_CLASS;
    return make_cimple_reference(adapter->broker(), mc, op, source);
}

CMPIStatus associators(CMPIAssociationMI* mi, const CMPIContext* context, const CMPIResult* result,
                       const CMPIObjectPath* op, const char*, const char* result_class,
                       const char* role, const char* result_role, const char** properties) {
    return run_entry("associators", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope& scope) -> Entry_Status {
                         Instance* source = nullptr;
                         int rc = _source(adapter, op, source);
                         if (rc == CMPI_RC_ERR_INVALID_CLASS)
                             return CMPI_RC_OK;  // nothing is associated with an unknown class
                         if (rc != CMPI_RC_OK)
                             return rc;
                         Ref<> hold(source);

                         String rcls = _string_or_empty(result_class), rl = _string_or_empty(role),
                                rrl = _string_or_empty(result_role);
                         Association_Data data = {adapter->broker(), scope.cmpi_context(), result,
                                                  name_space_of(op), properties,           false};
                         Enum_Associators_Status status = adapter->enum_associators(
                             source, rcls, rl, rrl, _associators_proc, &data);
                         switch (status) {
                             case ENUM_ASSOCIATORS_FAILED: return CMPI_RC_ERR_FAILED;
                             case ENUM_ASSOCIATORS_ACCESS_DENIED: return CMPI_RC_ERR_ACCESS_DENIED;
                             case ENUM_ASSOCIATORS_UNSUPPORTED: break;
                             default: CMReturnDone(result); return CMPI_RC_OK;
                         }
                         return _map_associator_names(
                             adapter->enum_associator_names(source, rcls, rl, rrl,
                                                            _associator_instances_proc, &data),
                             result);
                     });
}

CMPIStatus associatorNames(CMPIAssociationMI* mi, const CMPIContext* context,
                           const CMPIResult* result, const CMPIObjectPath* op, const char*,
                           const char* result_class, const char* role, const char* result_role) {
    return run_entry(
        "associatorNames", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope& scope) -> Entry_Status {
            Instance* source = nullptr;
            int rc = _source(adapter, op, source);
            if (rc != CMPI_RC_OK)
                return rc;
            Ref<> hold(source);

            Association_Data data = {
                adapter->broker(), scope.cmpi_context(), result, name_space_of(op), nullptr, false};
            return _map_associator_names(
                adapter->enum_associator_names(
                    source, _string_or_empty(result_class), _string_or_empty(role),
                    _string_or_empty(result_role), _associator_names_proc, &data),
                result);
        });
}

CMPIStatus references(CMPIAssociationMI* mi, const CMPIContext* context, const CMPIResult* result,
                      const CMPIObjectPath* op, const char*, const char* role,
                      const char** properties) {
    return run_entry(
        "references", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope& scope) -> Entry_Status {
            Instance* source = nullptr;
            int rc = _source(adapter, op, source);
            if (rc != CMPI_RC_OK)
                return rc;
            Ref<> hold(source);
            Ref<> model(create(adapter->meta_class(), false));  // every property wanted
            if (!model)
                return CMPI_RC_ERR_FAILED;

            Association_Data data = {adapter->broker(), scope.cmpi_context(), result,
                                     name_space_of(op), properties,           false};
            return _map_references(
                adapter->enum_references(source, model.ptr(), _string_or_empty(role),
                                         _references_proc, &data),
                result);
        });
}

CMPIStatus referenceNames(CMPIAssociationMI* mi, const CMPIContext* context,
                          const CMPIResult* result, const CMPIObjectPath* op, const char*,
                          const char* role) {
    return run_entry(
        "referenceNames", mi ? mi->hdl : nullptr, context,
        [&](CMPI_Adapter* adapter, Entry_Scope& scope) -> Entry_Status {
            Instance* source = nullptr;
            int rc = _source(adapter, op, source);
            if (rc != CMPI_RC_OK)
                return rc;
            Ref<> hold(source);
            Ref<> model(create(adapter->meta_class(), false));
            if (!model)
                return CMPI_RC_ERR_FAILED;
            __set_null_flags(model.ptr(), false, true, true);  // only the keys are wanted

            Association_Data data = {
                adapter->broker(), scope.cmpi_context(), result, name_space_of(op), nullptr, false};
            return _map_references(
                adapter->enum_references(source, model.ptr(), _string_or_empty(role),
                                         _reference_names_proc, &data),
                result);
        });
}

}  // namespace

void set_association_entries(CMPIAssociationMIFT& ft) {
    ft.associators = associators;
    ft.associatorNames = associatorNames;
    ft.references = references;
    ft.referenceNames = referenceNames;
}

}  // namespace CPTA
