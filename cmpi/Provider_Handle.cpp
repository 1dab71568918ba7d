#include "cmpi/Provider_Handle.h"

#include <vector>

#include "framework/Log.h"

namespace CPTA {

namespace {

const char* _c_str_or_null(const String& s) {
    return s.size() ? s.c_str() : nullptr;
}

// get_instance through the enumeration: keeps the first instance whose keys
// equal the model's and releases every other one.
struct Get_Instance_Data {
    const Instance* model;
    Instance* found;
};

bool _get_instance_proc(Instance* instance, Enum_Instances_Status, void* client_data) {
    Get_Instance_Data* data = static_cast<Get_Instance_Data*>(client_data);
    if (!instance)
        return false;
    try {
        if (!data->found && key_eq(data->model, instance)) {
            data->found = instance;
            return false;
        }
    } catch (...) {
    }
    unref(instance);
    return !data->found;
}

// enum_associator_names through the enumeration of association instances.
struct Associator_Names_Data {
    const Instance* source;
    const char* result_class;
    const char* role;
    const char* result_role;
    Enum_Associator_Names_Proc proc;
    void* client_data;
    bool stopped;
};

bool _associator_names_proc(Instance* association, Enum_Instances_Status, void* client_data) {
    Associator_Names_Data* data = static_cast<Associator_Names_Data*>(client_data);
    if (!association)
        return false;
    Ref<> hold(association);
    if (data->stopped)
        return false;
    try {
        std::vector<const Instance*> ends(association->meta_class->num_meta_features + 1);
        int n = get_associators(data->source, association, data->result_class, data->role,
                                data->result_role, ends.data());
        for (int i = 0; i < n && !data->stopped; i++) {
            ref(ends[i]);
            if (!data->proc(const_cast<Instance*>(ends[i]), ENUM_ASSOCIATOR_NAMES_OK,
                            data->client_data))
                data->stopped = true;
        }
    } catch (...) {
        TVRN_LOG(LL_ERR, "associator look-up failed");
        data->stopped = true;
    }
    return !data->stopped;
}

// enum_references through the enumeration of association instances.
struct References_Data {
    const Instance* source;
    const char* role;
    Enum_References_Proc proc;
    void* client_data;
    bool stopped;
};

bool _references_proc(Instance* association, Enum_Instances_Status, void* client_data) {
    References_Data* data = static_cast<References_Data*>(client_data);
    if (!association)
        return false;
    bool refers = false;
    if (!data->stopped) {
        try {
            refers = is_reference_of(data->source, association, data->role);
        } catch (...) {
            data->stopped = true;
        }
    }
    if (!refers) {
        unref(association);
        return !data->stopped;
    }
    if (!data->proc(association, ENUM_REFERENCES_OK, data->client_data))
        data->stopped = true;
    return !data->stopped;
}

}  // namespace

Provider_Handle::Provider_Handle(const Registration* registration)
    : _registration(registration), _proc(registration->proc), _provider(nullptr) {
    _proc(_registration, OPERATION_CREATE_PROVIDER, &_provider, nullptr, nullptr, nullptr, nullptr,
          nullptr, nullptr, nullptr);
}

Provider_Handle::~Provider_Handle() {
    if (_provider)
        call(OPERATION_DESTROY_PROVIDER);
}

int Provider_Handle::call(int operation, void* a1, void* a2, void* a3, void* a4, void* a5, void* a6,
                          void* a7) {
    return _proc(_registration, operation, _provider, a1, a2, a3, a4, a5, a6, a7);
}

const Meta_Class* Provider_Handle::get_meta_class() const {
    const Meta_Class* meta_class = nullptr;
    _proc(_registration, OPERATION_GET_META_CLASS, &meta_class, nullptr, nullptr, nullptr, nullptr,
          nullptr, nullptr, nullptr);
    return meta_class;
}

const Meta_Repository* Provider_Handle::get_repository() const {
    const Meta_Repository* repository = nullptr;
    _proc(_registration, OPERATION_GET_REPOSITORY, &repository, nullptr, nullptr, nullptr, nullptr,
          nullptr, nullptr, nullptr);
    return repository;
}

Load_Status Provider_Handle::load() {
    return Load_Status(call(OPERATION_LOAD));
}

Unload_Status Provider_Handle::unload() {
    return Unload_Status(call(OPERATION_UNLOAD));
}

Get_Instance_Status Provider_Handle::get_instance(const Instance* model, Instance*& instance) {
    instance = nullptr;
    Instance* result = nullptr;
    int status = call(OPERATION_GET_INSTANCE, const_cast<Instance*>(model), &result);
    if (status != GET_INSTANCE_UNSUPPORTED) {
        if (status == GET_INSTANCE_OK)
            instance = result;
        else
            unref(result);  // only a found instance is handed over
        return Get_Instance_Status(status);
    }
    unref(result);

    Get_Instance_Data data = {model, nullptr};
    Enum_Instances_Status enum_status = enum_instances(model, _get_instance_proc, &data);
    if (enum_status != ENUM_INSTANCES_OK || !data.found) {
        unref(data.found);
        return GET_INSTANCE_NOT_FOUND;
    }
    instance = data.found;
    return GET_INSTANCE_OK;
}

Enum_Instances_Status Provider_Handle::enum_instances(const Instance* model,
                                                      Enum_Instances_Proc proc, void* client_data) {
    return Enum_Instances_Status(call(OPERATION_ENUM_INSTANCES, const_cast<Instance*>(model),
                                      reinterpret_cast<void*>(proc), client_data));
}

Create_Instance_Status Provider_Handle::create_instance(Instance* instance) {
    return Create_Instance_Status(call(OPERATION_CREATE_INSTANCE, instance));
}

Delete_Instance_Status Provider_Handle::delete_instance(const Instance* instance) {
    return Delete_Instance_Status(call(OPERATION_DELETE_INSTANCE, const_cast<Instance*>(instance)));
}

Modify_Instance_Status Provider_Handle::modify_instance(const Instance* model,
                                                        const Instance* instance) {
    return Modify_Instance_Status(call(OPERATION_MODIFY_INSTANCE, const_cast<Instance*>(model),
                                       const_cast<Instance*>(instance)));
}

int Provider_Handle::invoke_method(const Instance* instance, Instance* meth) {
    return call(OPERATION_INVOKE_METHOD, const_cast<Instance*>(instance), meth);
}

Enable_Indications_Status Provider_Handle::enable_indications(Indication_Proc proc,
                                                              void* client_data) {
    return Enable_Indications_Status(
        call(OPERATION_ENABLE_INDICATIONS, reinterpret_cast<void*>(proc), client_data));
}

Disable_Indications_Status Provider_Handle::disable_indications() {
    return Disable_Indications_Status(call(OPERATION_DISABLE_INDICATIONS));
}

Enum_Associators_Status Provider_Handle::enum_associators(
    const Instance* instance, const String& result_class, const String& role,
    const String& result_role, Enum_Associators_Proc proc, void* client_data) {
    return Enum_Associators_Status(
        call(OPERATION_ENUM_ASSOCIATORS, const_cast<Instance*>(instance),
             const_cast<String*>(&result_class), const_cast<String*>(&role),
             const_cast<String*>(&result_role), reinterpret_cast<void*>(proc), client_data));
}

Enum_Associator_Names_Status Provider_Handle::enum_associator_names(
    const Instance* instance, const String& result_class, const String& role,
    const String& result_role, Enum_Associator_Names_Proc proc, void* client_data) {
    const Meta_Class* meta_class = get_meta_class();
    if (!meta_class || !(meta_class->flags & FLAG_ASSOCIATION))
        return ENUM_ASSOCIATOR_NAMES_FAILED;

    int status =
        call(OPERATION_ENUM_ASSOCIATOR_NAMES, const_cast<Instance*>(instance),
             const_cast<String*>(&result_class), const_cast<String*>(&role),
             const_cast<String*>(&result_role), reinterpret_cast<void*>(proc), client_data);
    if (status == ENUM_ASSOCIATOR_NAMES_OK)
        return ENUM_ASSOCIATOR_NAMES_OK;
    if (status != ENUM_ASSOCIATOR_NAMES_UNSUPPORTED)
        return ENUM_ASSOCIATOR_NAMES_FAILED;

    // Only the keys of the association instances are needed.
    Ref<> model(create(meta_class, false));
    if (!model)
        return ENUM_ASSOCIATOR_NAMES_FAILED;
    __set_null_flags(model.ptr(), false, true, true);

    Associator_Names_Data data = {instance,
                                  _c_str_or_null(result_class),
                                  _c_str_or_null(role),
                                  _c_str_or_null(result_role),
                                  proc,
                                  client_data,
                                  false};
    Enum_Instances_Status enum_status = enum_instances(model.ptr(), _associator_names_proc, &data);

    Enum_Associator_Names_Status result = ENUM_ASSOCIATOR_NAMES_OK;
    if (enum_status == ENUM_INSTANCES_FAILED)
        result = ENUM_ASSOCIATOR_NAMES_FAILED;
    else if (enum_status == ENUM_INSTANCES_ACCESS_DENIED)
        result = ENUM_ASSOCIATOR_NAMES_ACCESS_DENIED;
    proc(nullptr, result, client_data);
    return result;
}

Enum_References_Status Provider_Handle::enum_references(const Instance* instance,
                                                        const Instance* model, const String& role,
                                                        Enum_References_Proc proc,
                                                        void* client_data) {
    const Meta_Class* meta_class = get_meta_class();
    if (!meta_class || !(meta_class->flags & FLAG_ASSOCIATION))
        return ENUM_REFERENCES_FAILED;

    int status = call(OPERATION_ENUM_REFERENCES, const_cast<Instance*>(instance),
                      const_cast<Instance*>(model), const_cast<String*>(&role),
                      reinterpret_cast<void*>(proc), client_data);
    if (status == ENUM_REFERENCES_OK || status == ENUM_REFERENCES_FAILED ||
        status == ENUM_REFERENCES_ACCESS_DENIED)
        return Enum_References_Status(status);
    if (status != ENUM_REFERENCES_UNSUPPORTED)
        return ENUM_REFERENCES_FAILED;

    References_Data data = {instance, _c_str_or_null(role), proc, client_data, false};
    Enum_Instances_Status enum_status = enum_instances(model, _references_proc, &data);

    Enum_References_Status result = ENUM_REFERENCES_OK;
    if (enum_status == ENUM_INSTANCES_FAILED)
        result = ENUM_REFERENCES_FAILED;
    else if (enum_status == ENUM_INSTANCES_ACCESS_DENIED)
        result = ENUM_REFERENCES_ACCESS_DENIED;
    proc(nullptr, result, client_data);
    return result;
}

}  // namespace CPTA
