#include "cmpi/CMPI_Containers.h"

#include <cstring>
#include <limits>

#include "cmpi/Cmpi_Ptr.h"
#include "cmpi/Conversion_Log.h"
#include "framework/Slot.h"

namespace CPTA {

namespace {

const uint32 EMBEDDED = FLAG_EMBEDDED_OBJECT | FLAG_EMBEDDED_INSTANCE;

// Copies the text of a CMPI string that we own and releases the string;
// false when there is no text.
bool _take_string(CMPIString* s, String& out) {
    Cmpi_Ptr<CMPIString> hold(s);
    if (!s)
        return false;
    const char* chars = CMGetCharsPtr(s, nullptr);
    if (!chars)
        return false;
    out = chars;
    return true;
}

// Reads an element's name through fetch, a CMGet*At call that stores the
// name string: 0, or -1 when the call fails or gives no text.
template <class F>
int _fetch_name(String& name, F fetch) {
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIString* s = nullptr;
    fetch(&s, &rc);
    if (rc.rc != CMPI_RC_OK) {
        if (s)
            CMRelease(s);
        return -1;
    }
    return _take_string(s, name) ? 0 : -1;
}

// Value tag of a scalar CMPI type; NONE for the types we do not take.
Value::Type _tag_of(CMPIType type) {
    switch (type) {
        case CMPI_boolean: return Value::BOOLEAN;
        case CMPI_uint8: return Value::UINT8;
        case CMPI_sint8: return Value::SINT8;
        case CMPI_uint16: return Value::UINT16;
        case CMPI_sint16: return Value::SINT16;
        case CMPI_uint32: return Value::UINT32;
        case CMPI_sint32: return Value::SINT32;
        case CMPI_uint64: return Value::UINT64;
        case CMPI_sint64: return Value::SINT64;
        case CMPI_real32: return Value::REAL32;
        case CMPI_real64: return Value::REAL64;
        case CMPI_char16: return Value::CHAR16;
        case CMPI_string: return Value::STRING;
        case CMPI_dateTime: return Value::DATETIME;
        case CMPI_ref:
        case CMPI_instance: return Value::INSTANCE;
        default: return Value::NONE;
    }
}

// CMPI type of a scalar tag; CMPI_null for an unknown tag.
CMPIType _cmpi_type_of(int tag, uint32 flags) {
    switch (tag) {
        case Value::BOOLEAN: return CMPI_boolean;
        case Value::UINT8: return CMPI_uint8;
        case Value::SINT8: return CMPI_sint8;
        case Value::UINT16: return CMPI_uint16;
        case Value::SINT16: return CMPI_sint16;
        case Value::UINT32: return CMPI_uint32;
        case Value::SINT32: return CMPI_sint32;
        case Value::UINT64: return CMPI_uint64;
        case Value::SINT64: return CMPI_sint64;
        case Value::REAL32: return CMPI_real32;
        case Value::REAL64: return CMPI_real64;
        case Value::CHAR16: return CMPI_char16;
        case Value::STRING: return CMPI_string;
        case Value::DATETIME: return CMPI_dateTime;
        case Value::INSTANCE: return (flags & EMBEDDED) ? CMPI_instance : CMPI_ref;
        default: return CMPI_null;
    }
}

bool _is_integer(int tag) {
    return tag >= Value::UINT8 && tag <= Value::SINT64;
}

// Sets value to the zero payload of a tag (used for null CMPI data).
void _set_empty(Value& value, Value::Type tag) {
    switch (tag) {
        case Value::BOOLEAN: value.set_value(boolean(false)); break;
        case Value::UINT8: value.set_value(uint8(0)); break;
        case Value::SINT8: value.set_value(sint8(0)); break;
        case Value::UINT16: value.set_value(uint16(0)); break;
        case Value::SINT16: value.set_value(sint16(0)); break;
        case Value::UINT32: value.set_value(uint32(0)); break;
        case Value::SINT32: value.set_value(sint32(0)); break;
        case Value::UINT64: value.set_value(uint64(0)); break;
        case Value::SINT64: value.set_value(sint64(0)); break;
        case Value::REAL32: value.set_value(real32(0)); break;
        case Value::REAL64: value.set_value(real64(0)); break;
        case Value::CHAR16: value.set_value(char16(0)); break;
        case Value::STRING: value.set_value(String()); break;
        case Value::DATETIME: value.set_value(Datetime()); break;
        case Value::INSTANCE: value.set_value(static_cast<Instance*>(nullptr)); break;
        case Value::BOOLEAN_ARRAY: value.set_value(Array<boolean>()); break;
        case Value::UINT8_ARRAY: value.set_value(Array<uint8>()); break;
        case Value::SINT8_ARRAY: value.set_value(Array<sint8>()); break;
        case Value::UINT16_ARRAY: value.set_value(Array<uint16>()); break;
        case Value::SINT16_ARRAY: value.set_value(Array<sint16>()); break;
        case Value::UINT32_ARRAY: value.set_value(Array<uint32>()); break;
        case Value::SINT32_ARRAY: value.set_value(Array<sint32>()); break;
        case Value::UINT64_ARRAY: value.set_value(Array<uint64>()); break;
        case Value::SINT64_ARRAY: value.set_value(Array<sint64>()); break;
        case Value::REAL32_ARRAY: value.set_value(Array<real32>()); break;
        case Value::REAL64_ARRAY: value.set_value(Array<real64>()); break;
        case Value::CHAR16_ARRAY: value.set_value(Array<char16>()); break;
        case Value::STRING_ARRAY: value.set_value(Array<String>()); break;
        case Value::DATETIME_ARRAY: value.set_value(Array<Datetime>()); break;
        case Value::INSTANCE_ARRAY: value.set_value(Array<Instance*>()); break;
        default: value.clear(); break;
    }
}

// A model instance of the object behind a reference (keys only) or an
// embedded instance (every property).
int _object_to_instance(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                        const char* name_space, const CMPIObjectPath* ref,
                        const CMPIInstance* embedded, Instance*& instance) {
    instance = nullptr;
    Cmpi_Ptr<CMPIObjectPath> embedded_path;
    if (embedded) {
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        embedded_path.reset(CMGetObjectPath(embedded, &rc));
        if (rc.rc != CMPI_RC_OK || !embedded_path) {
            TVRN_WARN("CMGetObjectPath() failed");
            return -1;
        }
        ref = embedded_path.get();
    }
    if (!ref) {
        TVRN_WARN("null instance argument");
        return -1;
    }

    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    String class_name;
    CMPIString* cn = CMGetClassName(ref, &rc);
    if (rc.rc != CMPI_RC_OK || !_take_string(cn, class_name)) {
        TVRN_WARN("CMGetClassName() failed");
        return -1;
    }
    const Meta_Class* mc = find_meta_class(meta_repository, class_name.c_str());
    if (!mc) {
        TVRN_WARN("failed to find meta class: %s", class_name.c_str());
        return -1;
    }

    String own_name_space;
    _take_string(CMGetNameSpace(ref, nullptr), own_name_space);
    const char* ns = own_name_space.size() ? own_name_space.c_str() : name_space;

    int r;
    if (embedded) {
        CMPIInstance_Container container(meta_repository, broker, ns, embedded);
        r = container.convert(mc, 0, instance);
    } else {
        CMPIObjectPath_Container container(meta_repository, broker, ns, ref);
        r = container.convert(mc, FLAG_KEY, instance);
    }
    if (r != 0 || !instance) {
        unref(instance);
        instance = nullptr;
        TVRN_WARN("failed to create CIMPLE instance");
        return -1;
    }
    if (own_name_space.size())
        instance->__name_space = own_name_space;
    return 0;
}

// One element of a CMPI array, converted and appended to a typed array.
template <class T>
int _read_elements(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                   const char* name_space, const CMPIArray* array, CMPIType element_type,
                   Value& value) {
    Array<T> elements;
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPICount n = CMGetArrayCount(array, &rc);
    if (rc.rc != CMPI_RC_OK)
        return -1;
    for (CMPICount i = 0; i < n; i++) {
        CMPIData element = CMGetArrayElementAt(array, i, &rc);
        if (rc.rc != CMPI_RC_OK)
            return -1;
        if (element.type != element_type) {
            TVRN_WARN("array element type mismatch");
            return -1;
        }
        if (element.state & CMPI_nullValue) {
            TVRN_WARN("encountered null array element");
            return -1;
        }
        Value x;
        T t;
        if (cmpi_to_cimple_value(meta_repository, broker, name_space, element, x) != 0 ||
            x.get_value(t) != 0)
            return -1;
        elements.append(t);
    }
    value.set_value(elements);
    return 0;
}

// Instances: the value takes over one reference per element.
int _read_instance_elements(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                            const char* name_space, const CMPIArray* array, CMPIType element_type,
                            Value& value) {
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPICount n = CMGetArrayCount(array, &rc);
    if (rc.rc != CMPI_RC_OK)
        return -1;
    Array<Instance*> elements;
    auto fail = [&elements]() {
        for (size_t k = 0; k < elements.size(); k++)
            unref(elements[k]);
        return -1;
    };
    for (CMPICount i = 0; i < n; i++) {
        CMPIData element = CMGetArrayElementAt(array, i, &rc);
        if (rc.rc != CMPI_RC_OK)
            return fail();
        if (element.type != element_type) {
            TVRN_WARN("array element type mismatch");
            return fail();
        }
        if ((element.state & CMPI_nullValue) || !element.value.ref) {
            TVRN_WARN("encountered null instance element");
            return fail();
        }
        Value x;
        Instance* instance = nullptr;
        if (cmpi_to_cimple_value(meta_repository, broker, name_space, element, x) != 0 ||
            x.get_value(instance) != 0 || !instance)
            return fail();
        ref(instance);
        elements.append(instance);
    }
    value.set_value(elements);
    return 0;
}

int _read_array(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                const char* name_space, const CMPIData& data, Value& value) {
    CMPIType element_type = CMPIType(data.type & ~CMPI_ARRAY);
    Value::Type tag = _tag_of(element_type);
    if (tag == Value::NONE) {
        TVRN_WARN("unknown cmpi type %u", unsigned(data.type));
        return -1;
    }
    Value::Type array_tag = Value::Type(Value::ARRAY + tag);
    if ((data.state & CMPI_nullValue) || !data.value.array) {
        _set_empty(value, array_tag);
        value.null(true);
        return 0;
    }
    const CMPIArray* a = data.value.array;
    switch (tag) {
        case Value::BOOLEAN:
            return _read_elements<boolean>(meta_repository, broker, name_space, a, element_type,
                                           value);
        case Value::UINT8:
            return _read_elements<uint8>(meta_repository, broker, name_space, a, element_type,
                                         value);
        case Value::SINT8:
            return _read_elements<sint8>(meta_repository, broker, name_space, a, element_type,
                                         value);
        case Value::UINT16:
            return _read_elements<uint16>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::SINT16:
            return _read_elements<sint16>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::UINT32:
            return _read_elements<uint32>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::SINT32:
            return _read_elements<sint32>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::UINT64:
            return _read_elements<uint64>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::SINT64:
            return _read_elements<sint64>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::REAL32:
            return _read_elements<real32>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::REAL64:
            return _read_elements<real64>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::CHAR16:
            return _read_elements<char16>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::STRING:
            return _read_elements<String>(meta_repository, broker, name_space, a, element_type,
                                          value);
        case Value::DATETIME:
            return _read_elements<Datetime>(meta_repository, broker, name_space, a, element_type,
                                            value);
        case Value::INSTANCE:
            return _read_instance_elements(meta_repository, broker, name_space, a, element_type,
                                           value);
        default: break;
    }
    TVRN_WARN("type mismatch");
    return -1;
}

// An instance as an object path (its own name space, else name_space) and,
// for an embedded object, as a CMPI instance on that path.
int _instance_to_cmpi(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                      const char* name_space, const Instance* instance, bool embedded,
                      CMPIValue& cmpi_value) {
    if (!instance) {
        TVRN_WARN("null instance argument");
        return -1;
    }
    const char* ns = instance->__name_space.size() ? instance->__name_space.c_str() : name_space;
    if (!ns || !*ns) {
        TVRN_WARN("null namespace");
        return -1;
    }
    const char* class_name = instance->meta_class ? instance->meta_class->name : nullptr;
    if (!class_name) {
        TVRN_WARN("null classname");
        return -1;
    }
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    Cmpi_Ptr<CMPIObjectPath> op(CMNewObjectPath(broker, ns, class_name, &rc));
    if (!op || rc.rc != CMPI_RC_OK) {
        TVRN_WARN("CMNewObjectPath() failed");
        return -1;
    }
    {
        CMPIObjectPath_Container keys(meta_repository, broker, ns, op.get());
        if (keys.convert(instance, FLAG_KEY) != 0) {
            TVRN_WARN("Container::convert() failed");
            return -1;
        }
    }
    if (!embedded) {
        cmpi_value.ref = op.release();
        return 0;
    }
    Cmpi_Ptr<CMPIInstance> ci(CMNewInstance(broker, op.get(), &rc));
    if (!ci || rc.rc != CMPI_RC_OK) {
        TVRN_WARN("CMNewInstance() failed");
        return -1;
    }
    CMPIInstance_Container properties(meta_repository, broker, ns, ci.get());
    if (properties.convert(instance, 0) != 0) {
        TVRN_WARN("Container::convert() failed");
        return -1;
    }
    cmpi_value.inst = ci.release();
    return 0;
}

template <class T>
int _write_elements(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                    const char* name_space, const Value& value, uint32 flags, CMPIType element_type,
                    CMPIArray*& out, Cmpi_Objects* made) {
    Array<T> elements;
    if (value.get_value(elements) != 0)
        return -1;
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    Cmpi_Ptr<CMPIArray> array(CMNewArray(broker, CMPICount(elements.size()), element_type, &rc));
    if (!array || rc.rc != CMPI_RC_OK) {
        TVRN_WARN("CMNewArray() failed");
        return -1;
    }
    for (size_t i = 0; i < elements.size(); i++) {
        Value x;
        x.set_value(elements[i]);
        CMPIValue cv;
        CMPIType ct;
        if (to_cmpi_scalar(meta_repository, broker, name_space, x, flags, cv, ct, made) != 0) {
            TVRN_WARN("element conversion failed");
            return -1;
        }
        // Some servers keep the element object itself in the array: it lives
        // as long as the array.
        CMPIStatus st = CMSetArrayElementAt(array.get(), CMPICount(i), &cv, ct);
        if (st.rc != CMPI_RC_OK) {
            TVRN_WARN("CMSetArrayElementAt() failed");
            return -1;
        }
    }
    out = array.release();
    return 0;
}

template <>
int _write_elements<Instance*>(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                               const char* name_space, const Value& value, uint32 flags,
                               CMPIType element_type, CMPIArray*& out, Cmpi_Objects* made) {
    Array<Instance*> elements;
    if (value.get_value(elements) != 0)
        return -1;
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    Cmpi_Ptr<CMPIArray> array(CMNewArray(broker, CMPICount(elements.size()), element_type, &rc));
    if (!array || rc.rc != CMPI_RC_OK) {
        TVRN_WARN("CMNewArray() failed");
        return -1;
    }
    for (size_t i = 0; i < elements.size(); i++) {
        CMPIValue cv;
        if (_instance_to_cmpi(meta_repository, broker, name_space, elements[i],
                              (flags & EMBEDDED) != 0, cv) != 0) {
            TVRN_WARN("element conversion failed");
            return -1;
        }
        if (made) {
            if (flags & EMBEDDED)
                made->add(cv.inst);
            else
                made->add(cv.ref);
        }
        CMPIStatus st = CMSetArrayElementAt(array.get(), CMPICount(i), &cv, element_type);
        if (st.rc != CMPI_RC_OK) {
            TVRN_WARN("CMSetArrayElementAt() failed");
            return -1;
        }
    }
    out = array.release();
    return 0;
}

int _write_array(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                 const char* name_space, const Value& value, uint32 flags, CMPIType element_type,
                 CMPIArray*& out, Cmpi_Objects* made) {
    switch (value.type() - Value::ARRAY) {
        case Value::BOOLEAN:
            return _write_elements<boolean>(meta_repository, broker, name_space, value, flags,
                                            element_type, out, made);
        case Value::UINT8:
            return _write_elements<uint8>(meta_repository, broker, name_space, value, flags,
                                          element_type, out, made);
        case Value::SINT8:
            return _write_elements<sint8>(meta_repository, broker, name_space, value, flags,
                                          element_type, out, made);
        case Value::UINT16:
            return _write_elements<uint16>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::SINT16:
            return _write_elements<sint16>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::UINT32:
            return _write_elements<uint32>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::SINT32:
            return _write_elements<sint32>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::UINT64:
            return _write_elements<uint64>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::SINT64:
            return _write_elements<sint64>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::REAL32:
            return _write_elements<real32>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::REAL64:
            return _write_elements<real64>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::CHAR16:
            return _write_elements<char16>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::STRING:
            return _write_elements<String>(meta_repository, broker, name_space, value, flags,
                                           element_type, out, made);
        case Value::DATETIME:
            return _write_elements<Datetime>(meta_repository, broker, name_space, value, flags,
                                             element_type, out, made);
        case Value::INSTANCE:
            return _write_elements<Instance*>(meta_repository, broker, name_space, value, flags,
                                              element_type, out, made);
        default: break;
    }
    TVRN_WARN("missing type");
    return -1;
}

// Stores a 64-bit integer (given as its magnitude and sign) as T when T can
// hold it; a key that does not fit is refused rather than cut to another
// key's value.
template <class T>
bool _store_if_fits(Value& value, uint64 magnitude, bool negative) {
    typedef std::numeric_limits<T> limits;
    if (negative) {
        if (!limits::is_signed || magnitude - 1 > uint64(limits::max()))
            return false;
        value.set_value(T(-sint64(magnitude - 1) - 1));
    } else {
        if (magnitude > uint64(limits::max()))
            return false;
        value.set_value(T(magnitude));
    }
    return true;
}

// A 64-bit integer as another integer type, keeping its null flag.
bool _narrow_integer(Value& value, Value::Type expected) {
    uint64 magnitude;
    bool negative = false;
    if (value.type() == Value::UINT64) {
        value.get_value(magnitude);
    } else if (value.type() == Value::SINT64) {
        sint64 s;
        value.get_value(s);
        negative = s < 0;
        magnitude = negative ? uint64(-(s + 1)) + 1 : uint64(s);
    } else {
        return false;
    }
    bool null = value.null();
    bool stored = false;
    switch (expected) {
        case Value::UINT8: stored = _store_if_fits<uint8>(value, magnitude, negative); break;
        case Value::SINT8: stored = _store_if_fits<sint8>(value, magnitude, negative); break;
        case Value::UINT16: stored = _store_if_fits<uint16>(value, magnitude, negative); break;
        case Value::SINT16: stored = _store_if_fits<sint16>(value, magnitude, negative); break;
        case Value::UINT32: stored = _store_if_fits<uint32>(value, magnitude, negative); break;
        case Value::SINT32: stored = _store_if_fits<sint32>(value, magnitude, negative); break;
        case Value::UINT64: stored = _store_if_fits<uint64>(value, magnitude, negative); break;
        case Value::SINT64: stored = _store_if_fits<sint64>(value, magnitude, negative); break;
        default: return false;
    }
    if (stored)
        value.null(null);
    return stored;
}

}  // namespace

//------------------------------------------------------------------------------
// CMPI data to Value
//------------------------------------------------------------------------------

int cmpi_to_cimple_value(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                         const char* name_space, const CMPIData& data, Value& value) {
    if (data.type & CMPI_ARRAY)
        return _read_array(meta_repository, broker, name_space, data, value);

    Value::Type tag = _tag_of(data.type);
    if (tag == Value::NONE) {
        TVRN_WARN("unknown cmpi type %u", unsigned(data.type));
        return -1;
    }
    if (data.state & CMPI_nullValue) {
        _set_empty(value, tag);
        value.null(true);
        return 0;
    }

    const CMPIValue& v = data.value;
    switch (data.type) {
        case CMPI_boolean: value.set_value(boolean(v.boolean != 0)); return 0;
        case CMPI_uint8: value.set_value(uint8(v.uint8)); return 0;
        case CMPI_sint8: value.set_value(sint8(v.sint8)); return 0;
        case CMPI_uint16: value.set_value(uint16(v.uint16)); return 0;
        case CMPI_sint16: value.set_value(sint16(v.sint16)); return 0;
        case CMPI_uint32: value.set_value(uint32(v.uint32)); return 0;
        case CMPI_sint32: value.set_value(sint32(v.sint32)); return 0;
        case CMPI_uint64: value.set_value(uint64(v.uint64)); return 0;
        case CMPI_sint64: value.set_value(sint64(v.sint64)); return 0;
        case CMPI_real32: value.set_value(real32(v.real32)); return 0;
        case CMPI_real64: value.set_value(real64(v.real64)); return 0;
        case CMPI_char16: value.set_value(char16(v.char16)); return 0;

        case CMPI_string: {
            if (!v.string) {
                TVRN_NOTE("ignored null CMPI string");
                value.set_value(String());
                return 0;
            }
            const char* chars = CMGetCharsPtr(v.string, nullptr);
            if (!chars) {
                TVRN_WARN("CMGetCharsPtr() failed");
                return -1;
            }
            value.set_value(chars);
            return 0;
        }

        case CMPI_dateTime: {
            String text;
            if (!v.dateTime || !_take_string(CMGetStringFormat(v.dateTime, nullptr), text)) {
                TVRN_WARN("CMGetStringFormat() failed");
                return -1;
            }
            Datetime dt;
            if (!dt.set(text.c_str())) {
                TVRN_WARN("conversion error");
                return -1;
            }
            value.set_value(dt);
            return 0;
        }

        case CMPI_ref:
        case CMPI_instance: {
            Instance* instance = nullptr;
            int r = data.type == CMPI_ref ? _object_to_instance(meta_repository, broker, name_space,
                                                                v.ref, nullptr, instance)
                                          : _object_to_instance(meta_repository, broker, name_space,
                                                                nullptr, v.inst, instance);
            if (r != 0)
                return -1;
            value.set_value(instance);
            return 0;
        }

        default: break;
    }
    TVRN_WARN("type mismatch");
    return -1;
}

//------------------------------------------------------------------------------
// Value to CMPI data
//------------------------------------------------------------------------------

int to_cmpi_scalar(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                   const char* name_space, const Value& value, uint32 flags, CMPIValue& cv,
                   CMPIType& ct, Cmpi_Objects* made) {
    std::memset(&cv, 0, sizeof(cv));
    ct = _cmpi_type_of(value.type(), flags);
    CMPIStatus rc = {CMPI_RC_OK, nullptr};

    switch (value.type()) {
        case Value::BOOLEAN: {
            boolean x = false;
            value.get_value(x);
            cv.boolean = x;
            return 0;
        }
        case Value::UINT8: value.get_value(cv.uint8); return 0;
        case Value::SINT8: value.get_value(cv.sint8); return 0;
        case Value::UINT16: value.get_value(cv.uint16); return 0;
        case Value::SINT16: value.get_value(cv.sint16); return 0;
        case Value::UINT32: value.get_value(cv.uint32); return 0;
        case Value::SINT32: value.get_value(cv.sint32); return 0;
        case Value::UINT64: {
            uint64 x = 0;
            value.get_value(x);
            cv.uint64 = x;
            return 0;
        }
        case Value::SINT64: {
            sint64 x = 0;
            value.get_value(x);
            cv.sint64 = x;
            return 0;
        }
        case Value::REAL32: value.get_value(cv.real32); return 0;
        case Value::REAL64: value.get_value(cv.real64); return 0;
        case Value::CHAR16: {
            char16 x;
            value.get_value(x);
            cv.char16 = x.code;
            return 0;
        }

        case Value::STRING: {
            String s;
            value.get_value(s);
            cv.string = CMNewString(broker, s.c_str(), &rc);
            if (!cv.string || rc.rc != CMPI_RC_OK) {
                TVRN_WARN("CMNewString() failed");
                return -1;
            }
            if (made)
                made->add(cv.string);
            return 0;
        }

        case Value::DATETIME: {
            Datetime dt;
            value.get_value(dt);
            char text[Datetime::BUFFER_SIZE];
            dt.ascii(text);
            cv.dateTime = CMNewDateTimeFromChars(broker, text, &rc);
            if (!cv.dateTime || rc.rc != CMPI_RC_OK) {
                TVRN_WARN("CMNewDateTimeFromChars() failed");
                return -1;
            }
            if (made)
                made->add(cv.dateTime);
            return 0;
        }

        case Value::INSTANCE: {
            Instance* instance = nullptr;
            value.get_value(instance);
            bool embedded = (flags & EMBEDDED) != 0;
            if (_instance_to_cmpi(meta_repository, broker, name_space, instance, embedded, cv) != 0)
                return -1;
            if (made) {
                if (embedded)
                    made->add(cv.inst);
                else
                    made->add(cv.ref);
            }
            return 0;
        }

        default: break;
    }
    TVRN_WARN("unexpected type");
    return -1;
}

int _to_cmpi_data(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                  const char* name_space, const Value& value, uint32 flags, CMPIData& data,
                  Cmpi_Objects* made) {
    std::memset(&data, 0, sizeof(data));
    data.state = CMPI_goodValue;

    int tag = value.type();
    bool is_array = tag >= Value::ARRAY;
    CMPIType type = _cmpi_type_of(is_array ? tag - Value::ARRAY : tag, flags);
    if (type == CMPI_null) {
        TVRN_WARN("%s", is_array ? "missing type" : "unexpected type");
        return -1;
    }
    if (value.null()) {
        data.type = CMPIType(is_array ? (type | CMPI_ARRAY) : type);
        data.state = CMPI_nullValue;
        return 0;
    }
    if (is_array) {
        CMPIArray* array = nullptr;
        if (_write_array(meta_repository, broker, name_space, value, flags, type, array, made) != 0)
            return -1;
        if (made)
            made->add(array);
        data.type = CMPIType(type | CMPI_ARRAY);
        data.value.array = array;
        return 0;
    }
    return to_cmpi_scalar(meta_repository, broker, name_space, value, flags, data.value, data.type,
                          made);
}

//------------------------------------------------------------------------------
// Containers
//------------------------------------------------------------------------------

CMPI_Container::CMPI_Container(const Meta_Repository* meta_repository, const CMPIBroker* broker,
                               const char* name_space)
    : Container(meta_repository), _broker(broker), _name_space(name_space) {}

bool CMPI_Container::_repair(Value&, Value::Type) {
    return false;
}

template <class F>
int CMPI_Container::_get_value(size_t pos, Value::Type expected, Value& value, const char* what,
                               F fetch) {
    size_t size = get_size();
    if (pos >= size) {
        TVRN_WARN("bounds error");
        return -1;
    }
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData data;
    try {
        data = fetch(CMPICount(pos), &rc);
    } catch (...) {
        TVRN_WARN("%s threw exception: index=%u size=%u", what, unsigned(pos), unsigned(size));
        return -1;
    }
    if (rc.rc != CMPI_RC_OK) {
        TVRN_WARN("%s failed", what);
        return -1;
    }
    if (cmpi_to_cimple_value(meta_repository(), _broker, _name_space.c_str(), data, value) != 0) {
        TVRN_WARN("cmpi_to_cimple_value() failed");
        return -1;
    }
    if (value.type() != expected && !_repair(value, expected)) {
        String name;
        get_name(pos, name);
        TVRN_WARN("type mismatch on %s: %s/%s", name.c_str(), name_of(value.type()),
                  name_of(expected));
        return -1;
    }
    return 0;
}

// Instances

CMPIInstance_Container::CMPIInstance_Container(const Meta_Repository* meta_repository,
                                               const CMPIBroker* broker, const char* name_space,
                                               const CMPIInstance* instance)
    : CMPI_Container(meta_repository, broker, name_space), _instance(instance) {}

size_t CMPIInstance_Container::get_size() {
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPICount n = CMGetPropertyCount(_instance, &rc);
    return rc.rc == CMPI_RC_OK ? n : 0;
}

int CMPIInstance_Container::get_name(size_t pos, String& name) {
    return _fetch_name(name, [&](CMPIString** s, CMPIStatus* rc) {
        CMGetPropertyAt(_instance, CMPICount(pos), s, rc);
    });
}

int CMPIInstance_Container::get_value(size_t pos, Value::Type expected, Value& value) {
    return _get_value(
        pos, expected, value, "CMGetPropertyAt()",
        [this](CMPICount i, CMPIStatus* rc) { return CMGetPropertyAt(_instance, i, nullptr, rc); });
}

int CMPIInstance_Container::set_value(const char* name, const Value& value, uint32 flags) {
    CMPIData data;
    Cmpi_Objects made;
    if (_to_cmpi_data(meta_repository(), _broker, _name_space.c_str(), value, flags, data, &made) !=
        0) {
        TVRN_WARN("_to_cmpi_data() failed: feature=%s", name);
        return -1;
    }
    CMPIStatus rc = CMSetProperty(_instance, name,
                                  (data.state & CMPI_nullValue) ? nullptr : &data.value, data.type);
    if (rc.rc != CMPI_RC_OK) {
        TVRN_WARN("CMSetProperty() failed: %s", name);
        return -1;
    }
    return 0;
}

// Object paths

CMPIObjectPath_Container::CMPIObjectPath_Container(const Meta_Repository* meta_repository,
                                                   const CMPIBroker* broker, const char* name_space,
                                                   const CMPIObjectPath* object_path)
    : CMPI_Container(meta_repository, broker, name_space), _object_path(object_path) {}

size_t CMPIObjectPath_Container::get_size() {
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPICount n = CMGetKeyCount(_object_path, &rc);
    return rc.rc == CMPI_RC_OK ? n : 0;
}

int CMPIObjectPath_Container::get_name(size_t pos, String& name) {
    return _fetch_name(name, [&](CMPIString** s, CMPIStatus* rc) {
        CMGetKeyAt(_object_path, CMPICount(pos), s, rc);
    });
}

int CMPIObjectPath_Container::get_value(size_t pos, Value::Type expected, Value& value) {
    return _get_value(pos, expected, value, "CMGetKeyAt()", [this](CMPICount i, CMPIStatus* rc) {
        return CMGetKeyAt(_object_path, i, nullptr, rc);
    });
}

bool CMPIObjectPath_Container::_repair(Value& value, Value::Type expected) {
    // Servers hand integer keys over as 64-bit integers.
    return _is_integer(expected) && _narrow_integer(value, expected);
}

int CMPIObjectPath_Container::set_value(const char* name, const Value& value, uint32 flags) {
    CMPIData data;
    Cmpi_Objects made;
    if (_to_cmpi_data(meta_repository(), _broker, _name_space.c_str(), value, flags, data, &made) !=
        0) {
        TVRN_WARN("_to_cmpi_data() failed: feature=%s", name);
        return -1;
    }
    CMPIStatus rc = CMAddKey(const_cast<CMPIObjectPath*>(_object_path), name,
                             (data.state & CMPI_nullValue) ? nullptr : &data.value, data.type);
    if (rc.rc != CMPI_RC_OK) {
        TVRN_WARN("CMAddKey() failed");
        return -1;
    }
    return 0;
}

// Arguments

CMPIArgs_Container::CMPIArgs_Container(const Meta_Repository* meta_repository,
                                       const CMPIBroker* broker, const char* name_space,
                                       const CMPIArgs* args)
    : CMPI_Container(meta_repository, broker, name_space), _args(args), _has_return_value(false) {
    std::memset(&_return_value, 0, sizeof(_return_value));
}

size_t CMPIArgs_Container::get_size() {
    if (!_args)
        return 0;
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPICount n = CMGetArgCount(_args, &rc);
    return rc.rc == CMPI_RC_OK ? n : 0;
}

int CMPIArgs_Container::get_name(size_t pos, String& name) {
    return _fetch_name(
        name, [&](CMPIString** s, CMPIStatus* rc) { CMGetArgAt(_args, CMPICount(pos), s, rc); });
}

int CMPIArgs_Container::get_value(size_t pos, Value::Type expected, Value& value) {
    return _get_value(pos, expected, value, "CMGetArgAt()", [this](CMPICount i, CMPIStatus* rc) {
        return CMGetArgAt(_args, i, nullptr, rc);
    });
}

bool CMPIArgs_Container::_repair(Value& value, Value::Type expected) {
    // An empty array of references arrives from some clients as a boolean.
    if (value.type() == Value::BOOLEAN && expected == Value::INSTANCE_ARRAY) {
        value.set_value(Array<Instance*>());
        value.null(true);
        return true;
    }
    return false;
}

int CMPIArgs_Container::set_value(const char* name, const Value& value, uint32 flags) {
    CMPIData data;
    Cmpi_Objects made;
    if (_to_cmpi_data(meta_repository(), _broker, _name_space.c_str(), value, flags, data, &made) !=
        0) {
        TVRN_WARN("_to_cmpi_data() failed: feature=%s", name);
        return -1;
    }
    if (std::strcmp(name, "return_value") == 0) {
        _return_objects.release();
        _return_objects.take(made);
        _return_value = data;
        _has_return_value = true;
        return 0;
    }
    CMPIStatus rc =
        CMAddArg(_args, name, (data.state & CMPI_nullValue) ? nullptr : &data.value, data.type);
    if (rc.rc != CMPI_RC_OK) {
        TVRN_WARN("CMAddArg() failed");
        return -1;
    }
    return 0;
}

bool CMPIArgs_Container::take_return_value(CMPIValue& value, CMPIType& type, Cmpi_Objects* made) {
    if (!_has_return_value)
        return false;
    value = _return_value.value;
    type = _return_value.type;
    if (made)
        made->take(_return_objects);
    else
        _return_objects.forget();
    _has_return_value = false;
    return true;
}

}  // namespace CPTA
