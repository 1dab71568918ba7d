#include "cmpi/Converter.h"

#include <cstring>
#include <vector>

#include "cmpi/CMPI_Containers.h"
#include "cmpi/Conversion_Log.h"
#include "framework/Slot.h"

namespace CPTA {

namespace {

const Meta_Repository* _repository_of(const Meta_Class* meta_class) {
    return (meta_class->flags & FLAG_METHOD) ? nullptr : meta_class->meta_repository;
}

// Shared tail of the three CMPI-to-model conversions.
int _finish(Instance* instance, const String& name_space, Instance*& out) {
    __set_name_space_recursive(instance, name_space.c_str(), false);
    out = instance;
    return CMPI_RC_OK;
}

}  // namespace

String name_space_of(const CMPIObjectPath* object_path) {
    String result;
    if (!object_path)
        return result;
    CMPIString* ns = CMGetNameSpace(object_path, nullptr);
    if (ns) {
        if (const char* chars = CMGetCharsPtr(ns, nullptr))
            result = chars;
        CMRelease(ns);
    }
    return result;
}

int make_cimple_reference(const CMPIBroker* broker, const Meta_Class* meta_class,
                          const CMPIObjectPath* object_path, Instance*& instance) {
    instance = nullptr;
    if (!meta_class || !object_path)
        return CMPI_RC_ERR_FAILED;
    String ns = name_space_of(object_path);
    CMPIObjectPath_Container container(_repository_of(meta_class), broker, ns.c_str(), object_path);
    Instance* result = nullptr;
    if (container.convert(meta_class, FLAG_KEY, result) != 0 || !result)
        return CMPI_RC_ERR_FAILED;
    return _finish(result, ns, instance);
}

int make_cimple_instance(const CMPIBroker* broker, const Meta_Class* meta_class,
                         const CMPIObjectPath* object_path, const CMPIInstance* cmpi_instance,
                         Instance*& instance) {
    instance = nullptr;
    if (!meta_class || !cmpi_instance)
        return CMPI_RC_ERR_FAILED;
    String ns = name_space_of(object_path);
    CMPIInstance_Container container(_repository_of(meta_class), broker, ns.c_str(), cmpi_instance);
    Instance* result = nullptr;
    if (container.convert(meta_class, 0, result) != 0 || !result)
        return CMPI_RC_ERR_FAILED;
    return _finish(result, ns, instance);
}

int make_cimple_method(const CMPIBroker* broker, const Meta_Class* meta_class,
                       const Meta_Method* meta_method, const CMPIObjectPath* object_path,
                       const CMPIArgs* in, Instance*& meth) {
    meth = nullptr;
    if (!meta_class || !meta_method)
        return CMPI_RC_ERR_FAILED;
    String ns = name_space_of(object_path);
    Instance* result = create(meta_method);
    if (!result)
        return CMPI_RC_ERR_FAILED;
    __set_null_flags(result, true, true, true);
    CMPIArgs_Container container(_repository_of(meta_class), broker, ns.c_str(), in);
    if (container.convert(reinterpret_cast<const Meta_Class*>(meta_method), FLAG_IN, result) != 0) {
        destroy(result);
        return CMPI_RC_ERR_FAILED;
    }
    return _finish(result, ns, meth);
}

int make_cmpi_object_path(const CMPIBroker* broker, const Instance* instance,
                          const char* name_space, CMPIObjectPath*& object_path) {
    object_path = nullptr;
    if (!instance || !instance->meta_class)
        return CMPI_RC_ERR_FAILED;
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIObjectPath* op = CMNewObjectPath(broker, name_space, instance->meta_class->name, &rc);
    if (!op || rc.rc != CMPI_RC_OK)
        return CMPI_RC_ERR_FAILED;
    CMPIObjectPath_Container container(_repository_of(instance->meta_class), broker, name_space,
                                       op);
    if (container.convert(instance, FLAG_KEY) != 0 || container.failures() != 0) {
        CMRelease(op);
        return CMPI_RC_ERR_FAILED;
    }
    object_path = op;
    return CMPI_RC_OK;
}

int make_cmpi_instance(const CMPIBroker* broker, const Instance* instance, const char* name_space,
                       const CMPIObjectPath* object_path, const char* const* properties,
                       CMPIInstance*& cmpi_instance) {
    cmpi_instance = nullptr;
    if (!instance || !instance->meta_class)
        return CMPI_RC_ERR_FAILED;

    CMPIObjectPath* own_path = nullptr;
    if (!object_path) {
        TVRN_WARN("No ObjectPath built before call to make_CMPI_instance");
        if (make_cmpi_object_path(broker, instance, name_space, own_path) != CMPI_RC_OK)
            return CMPI_RC_ERR_FAILED;
        object_path = own_path;
    }

    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIInstance* ci = CMNewInstance(broker, object_path, &rc);
    if (own_path)
        CMRelease(own_path);
    if (!ci || rc.rc != CMPI_RC_OK)
        return CMPI_RC_ERR_FAILED;

    if (properties) {
        // The key properties stay whatever the list says.
        const Meta_Class* mc = instance->meta_class;
        std::vector<const char*> keys;
        for (size_t i = 0; i < mc->num_meta_features; i++) {
            if (is_key(mc->meta_features[i]))
                keys.push_back(mc->meta_features[i]->name);
        }
        keys.push_back(nullptr);
        rc = CMSetPropertyFilter(ci, const_cast<const char**>(properties), keys.data());
        if (rc.rc != CMPI_RC_OK) {
            CMRelease(ci);
            return rc.rc;
        }
    }

    CMPIInstance_Container container(_repository_of(instance->meta_class), broker, name_space, ci);
    if (container.convert(instance, 0) != 0) {
        CMRelease(ci);
        return CMPI_RC_ERR_FAILED;
    }
    cmpi_instance = ci;
    return CMPI_RC_OK;
}

int make_cmpi_method(const CMPIBroker* broker, const char* name_space, const Instance* meth,
                     CMPIArgs* out, CMPIValue& return_value, CMPIType& return_type,
                     Cmpi_Objects* made) {
    std::memset(&return_value, 0, sizeof(return_value));
    return_type = CMPI_null;
    if (!meth || !out)
        return CMPI_RC_ERR_FAILED;
    CMPIArgs_Container container(nullptr, broker, name_space, out);
    if (container.convert(meth, FLAG_OUT) != 0)
        return CMPI_RC_ERR_FAILED;
    if (!container.take_return_value(return_value, return_type, made))
        return_type = CMPI_null;
    return CMPI_RC_OK;
}

}  // namespace CPTA
