#include "cmpi/CMPI_Entry.h"

#include <cmpimacs.h>

#include "cmpi/Cmpi_Ptr.h"
#include "cmpi/Converter.h"
#include "framework/Log.h"
#include "framework/Meta_Lookup.h"

namespace CPTA {

namespace {

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

}  // namespace

CMPIStatus _make_status(const CMPIBroker* broker, const Entry_Status& status) {
    CMPIStatus result = {CMPIrc(status.rc), nullptr};
    if (status.message.size() && broker) {
        try {
            result.msg = CMNewString(broker, status.message.c_str(), nullptr);
        } catch (...) {
        }
    }
    return result;
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

}  // namespace CPTA
