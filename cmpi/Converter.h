// Conversion of requests and results between CMPI objects and model
// instances. The functions answer a CMPI return code: CMPI_RC_OK, or
// CMPI_RC_ERR_FAILED (or the code of the broker call that failed) when the
// target object cannot be made. Single features that cannot be converted are
// logged and left out.
#ifndef CPTA_CMPI_CONVERTER_H
#define CPTA_CMPI_CONVERTER_H

#include <cmpidt.h>
#include <cmpift.h>

#include "framework/Instance.h"

namespace CPTA {

class Cmpi_Objects;

// CMPI to model. Each result gets (with every instance reachable from it
// that has none yet) the name space of the object path.

// An instance of the class holding the keys of the object path.
int make_cimple_reference(const CMPIBroker* broker, const Meta_Class* meta_class,
                          const CMPIObjectPath* object_path, Instance*& instance);

// An instance of the class holding every property of the CMPI instance.
int make_cimple_instance(const CMPIBroker* broker, const Meta_Class* meta_class,
                         const CMPIObjectPath* object_path, const CMPIInstance* cmpi_instance,
                         Instance*& instance);

// The parameter record of the method, filled from the input arguments.
int make_cimple_method(const CMPIBroker* broker, const Meta_Class* meta_class,
                       const Meta_Method* meta_method, const CMPIObjectPath* object_path,
                       const CMPIArgs* in, Instance*& meth);

// Model to CMPI.

// A path in name_space named after the instance's class, with its non-null
// keys.
int make_cmpi_object_path(const CMPIBroker* broker, const Instance* instance,
                          const char* name_space, CMPIObjectPath*& object_path);

// An instance on object_path (built here when null) with every non-null
// property and reference; restricted to properties (closed by a null entry)
// when given.
int make_cmpi_instance(const CMPIBroker* broker, const Instance* instance, const char* name_space,
                       const CMPIObjectPath* object_path, const char* const* properties,
                       CMPIInstance*& cmpi_instance);

// Adds the non-null output parameters of the record to out and hands the
// return value back separately (return_type CMPI_null when it is null). The
// objects made for the return value go to made (when given; otherwise the
// caller owns the value's object).
int make_cmpi_method(const CMPIBroker* broker, const char* name_space, const Instance* meth,
                     CMPIArgs* out, CMPIValue& return_value, CMPIType& return_type,
                     Cmpi_Objects* made = nullptr);

// The name space of an object path ("" when it has none).
String name_space_of(const CMPIObjectPath* object_path);

}  // namespace CPTA

#endif
