// The entry of the method MI: invoking an extrinsic method.
#include "cmpi/CMPI_Method_MI.h"

#include "cmpi/CMPI_Containers.h"
#include "cmpi/CMPI_Entry.h"
#include "cmpi/Converter.h"
#include "framework/Meta_Lookup.h"

namespace CPTA {

namespace {

CMPIStatus invokeMethod(CMPIMethodMI* mi, const CMPIContext* context, const CMPIResult* result,
                        const CMPIObjectPath* op, const char* method, const CMPIArgs* in,
                        CMPIArgs* out) {
    return run_entry("invokeMethod", mi ? mi->hdl : nullptr, context,
                     [&](CMPI_Adapter* adapter, Entry_Scope&) -> Entry_Status {
                         const Meta_Class* mc = nullptr;
                         Entry_Status cls = _target_class(adapter, op, mc);
                         if (cls.rc == CMPI_RC_ERR_FAILED)
                             return Entry_Status(CMPI_RC_ERR_FAILED, "MetaClass not found");
                         if (cls.rc != CMPI_RC_OK)
                             return cls;

                         const Meta_Method* mm = method ? find_method(mc, method) : nullptr;
                         if (!mm)
                             return Entry_Status(CMPI_RC_ERR_METHOD_NOT_FOUND,
                                                 String(method ? method : ""));

                         Instance* target = nullptr;
                         int rc = make_cimple_reference(adapter->broker(), mc, op, target);
                         if (rc != CMPI_RC_OK)
                             return Entry_Status(rc, "CIMPLE reference creation failed");
                         Ref<> hold_target(target);

                         Instance* meth = nullptr;
                         rc = make_cimple_method(adapter->broker(), mc, mm, op, in, meth);
                         if (rc != CMPI_RC_OK)
                             return Entry_Status(rc, "CIMPLE make_cimple_method function failed");
                         Ref<> hold_meth(meth);

                         switch (adapter->invoke_method(target, meth)) {
                             case INVOKE_METHOD_UNSUPPORTED: return CMPI_RC_ERR_NOT_SUPPORTED;
                             case INVOKE_METHOD_ACCESS_DENIED: return CMPI_RC_ERR_ACCESS_DENIED;
                             case INVOKE_METHOD_FAILED: return CMPI_RC_ERR_FAILED;
                             case -1:
                                 // The provider does not know the method (a subclass's method
                                 // on a provider of its superclass).
                                 return Entry_Status(CMPI_RC_ERR_METHOD_NOT_FOUND, mm->name);
                             default: break;
                         }

                         String ns = name_space_of(op);
                         CMPIValue return_value;
                         CMPIType return_type;
                         Cmpi_Objects made;
                         rc = make_cmpi_method(adapter->broker(), ns.c_str(), meth, out,
                                               return_value, return_type, &made);
                         if (rc != CMPI_RC_OK)
                             return rc;
                         if (return_type != CMPI_null)
                             CMReturnData(result, &return_value, return_type);
                         CMReturnDone(result);
                         return CMPI_RC_OK;
                     });
}

}  // namespace

void set_method_entries(CMPIMethodMIFT& ft) {
    ft.invokeMethod = invokeMethod;
}

}  // namespace CPTA
