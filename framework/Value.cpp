#include "framework/Value.h"

#include <cstring>
#include <new>

#include "framework/Instance.h"
#include "framework/Log.h"
#include "framework/Meta_Lookup.h"
#include "framework/Slot.h"

namespace CPTA {

namespace {

const char* const _upper_names[] = {
    "BOOLEAN", "UINT8",  "SINT8",  "UINT16", "SINT16", "UINT32",   "SINT32",   "UINT64",
    "SINT64",  "REAL32", "REAL64", "CHAR16", "STRING", "DATETIME", "INSTANCE",
};

const char* const _upper_array_names[] = {
    "BOOLEAN_ARRAY", "UINT8_ARRAY",  "SINT8_ARRAY",  "UINT16_ARRAY",   "SINT16_ARRAY",
    "UINT32_ARRAY",  "SINT32_ARRAY", "UINT64_ARRAY", "SINT64_ARRAY",   "REAL32_ARRAY",
    "REAL64_ARRAY",  "CHAR16_ARRAY", "STRING_ARRAY", "DATETIME_ARRAY", "INSTANCE_ARRAY",
};

const char* const _lower_names[] = {
    "boolean", "uint8",  "sint8",  "uint16", "sint16", "uint32",   "sint32",   "uint64",
    "sint64",  "real32", "real64", "char16", "string", "datetime", "instance",
};

const char* const _lower_array_names[] = {
    "boolean_array", "uint8_array",  "sint8_array",  "uint16_array",   "sint16_array",
    "uint32_array",  "sint32_array", "uint64_array", "sint64_array",   "real32_array",
    "real64_array",  "char16_array", "string_array", "datetime_array", "instance_array",
};

const int NUM_TAGS = Value::INSTANCE + 1;

const char* _name(int type, const char* const* scalars, const char* const* arrays,
                  const char* none) {
    if (type == Value::NONE)
        return none;
    if (type >= 0 && type < NUM_TAGS)
        return scalars[type];
    if (type >= Value::ARRAY && type < Value::ARRAY + NUM_TAGS)
        return arrays[type - Value::ARRAY];
    return nullptr;
}

bool _is_array(int type) {
    return type >= Value::ARRAY && type <= Value::INSTANCE_ARRAY;
}

String& _string(void* p) {
    return *static_cast<String*>(p);
}

Datetime& _datetime(void* p) {
    return *static_cast<Datetime*>(p);
}

void _ref_elements(const __Array_Rep* rep) {
    Instance* const* p = reinterpret_cast<Instance* const*>(rep->data());
    for (size_t i = 0; i < rep->size; i++)
        ref(p[i]);
}

void _unref_elements(const __Array_Rep* rep) {
    Instance* const* p = reinterpret_cast<Instance* const*>(rep->data());
    for (size_t i = 0; i < rep->size; i++)
        unref(p[i]);
}

}  // namespace

const char* Value::_type_name(int type) {
    const char* s = _name(type, _upper_names, _upper_array_names, "NONE");
    return s ? s : "UNKNOWN";
}

const char* name_of(int type) {
    const char* s = _name(type, _lower_names, _lower_array_names, "none");
    return s ? s : "unknown";
}

int type_of(const Meta_Feature* feature) {
    if (!feature)
        return Value::NONE;
    if (feature->flags & FLAG_PROPERTY) {
        const Meta_Property* mp = reinterpret_cast<const Meta_Property*>(feature);
        if (mp->type >= NUM_TYPES)
            return Value::NONE;
        return mp->subscript ? Value::ARRAY + mp->type : mp->type;
    }
    if (feature->flags & FLAG_REFERENCE) {
        const Meta_Reference* mr = reinterpret_cast<const Meta_Reference*>(feature);
        return mr->subscript ? Value::INSTANCE_ARRAY : Value::INSTANCE;
    }
    return Value::NONE;
}

//------------------------------------------------------------------------------
// Life cycle
//------------------------------------------------------------------------------

Value::Value() : _type(NONE), _null(0) {
    _u.u64 = 0;
}

Value::Value(const Value& x) : _type(NONE), _null(0) {
    _u.u64 = 0;
    switch (x._type) {
        case STRING:
            new (&_u) String(_string(const_cast<void*>(static_cast<const void*>(&x._u))));
            break;
        case DATETIME:
            new (&_u) Datetime(_datetime(const_cast<void*>(static_cast<const void*>(&x._u))));
            break;
        case INSTANCE:
            ref(static_cast<Instance*>(x._u.ptr));
            _u.ptr = x._u.ptr;
            break;
        default:
            if (_is_array(x._type)) {
                const __Array_Rep* rep = static_cast<const __Array_Rep*>(x._u.ptr);
                __Array_Rep* copy;
                __construct(copy, rep->traits, rep->data(), rep->size);
                if (x._type == INSTANCE_ARRAY)
                    _ref_elements(copy);
                _u.ptr = copy;
            } else {
                _u = x._u;
            }
            break;
    }
    _type = x._type;
    _null = x._null;
}

Value::~Value() {
    clear();
}

Value& Value::operator=(const Value& x) {
    if (this != &x) {
        Value tmp(x);
        swap(tmp);
    }
    return *this;
}

void Value::swap(Value& x) noexcept {
    // Every payload (including a String or Datetime) is one relocatable word.
    sint32 type = _type;
    uint8 null = _null;
    unsigned char bytes[sizeof(_u)];
    std::memcpy(bytes, &_u, sizeof(_u));
    _type = x._type;
    _null = x._null;
    std::memcpy(&_u, &x._u, sizeof(_u));
    x._type = type;
    x._null = null;
    std::memcpy(&x._u, bytes, sizeof(_u));
}

void Value::clear() {
    switch (_type) {
        case STRING: _string(&_u).~String(); break;
        case DATETIME: _datetime(&_u).~Datetime(); break;
        case INSTANCE: unref(static_cast<Instance*>(_u.ptr)); break;
        default:
            if (_is_array(_type)) {
                __Array_Rep* rep = static_cast<__Array_Rep*>(_u.ptr);
                if (_type == INSTANCE_ARRAY)
                    _unref_elements(rep);
                __destruct(rep);
            }
            break;
    }
    _type = NONE;
    _null = 1;
    _u.u64 = 0;
}

//------------------------------------------------------------------------------
// set_value / get_value
//------------------------------------------------------------------------------

// Each setter builds the new payload in a temporary and swaps it in, so that
// the old payload is released only after the new one is complete.

void Value::_set_scalar(Type type, const void* p, size_t n) {
    Value tmp;
    std::memcpy(&tmp._u, p, n);
    tmp._type = type;
    swap(tmp);
}

void Value::_set_array(Type type, const __Array_Rep* rep) {
    Value tmp;
    __Array_Rep* copy;
    __construct(copy, rep->traits, rep->data(), rep->size);
    tmp._u.ptr = copy;
    tmp._type = type;
    swap(tmp);
}

void Value::_set_instances(const __Array_Rep* rep) {
    _set_array(INSTANCE_ARRAY, rep);
}

int Value::_get_scalar(Type type, void* p, size_t n) const {
    if (_type != type)
        return -1;
    std::memcpy(p, &_u, n);
    return 0;
}

int Value::_get_array(Type type, __Array_Rep*& rep) const {
    if (_type != type)
        return -1;
    __assign(rep, static_cast<const __Array_Rep*>(_u.ptr));
    return 0;
}

#define CPTA_VALUE_SCALAR(T, TAG)                \
    void Value::set_value(T x) {                 \
        _set_scalar(TAG, &x, sizeof(x));         \
    }                                            \
    int Value::get_value(T& x) const {           \
        return _get_scalar(TAG, &x, sizeof(x));  \
    }                                            \
    void Value::set_value(const Array<T>& x) {   \
        _set_array(TAG##_ARRAY, x.rep());        \
    }                                            \
    int Value::get_value(Array<T>& x) const {    \
        return _get_array(TAG##_ARRAY, x.rep()); \
    }

CPTA_VALUE_SCALAR(boolean, BOOLEAN)
CPTA_VALUE_SCALAR(uint8, UINT8)
CPTA_VALUE_SCALAR(sint8, SINT8)
CPTA_VALUE_SCALAR(uint16, UINT16)
CPTA_VALUE_SCALAR(sint16, SINT16)
CPTA_VALUE_SCALAR(uint32, UINT32)
CPTA_VALUE_SCALAR(sint32, SINT32)
CPTA_VALUE_SCALAR(uint64, UINT64)
CPTA_VALUE_SCALAR(sint64, SINT64)
CPTA_VALUE_SCALAR(real32, REAL32)
CPTA_VALUE_SCALAR(real64, REAL64)
CPTA_VALUE_SCALAR(char16, CHAR16)

#undef CPTA_VALUE_SCALAR

void Value::set_value(const char* x) {
    set_value(String(x));
}

void Value::set_value(const String& x) {
    Value tmp;
    new (&tmp._u) String(x);
    tmp._type = STRING;
    swap(tmp);
}

void Value::set_value(const Datetime& x) {
    Value tmp;
    new (&tmp._u) Datetime(x);
    tmp._type = DATETIME;
    swap(tmp);
}

void Value::set_value(Instance* x) {
    Value tmp;
    tmp._u.ptr = x;
    tmp._type = INSTANCE;
    swap(tmp);
}

void Value::set_value(const Array<String>& x) {
    _set_array(STRING_ARRAY, x.rep());
}

void Value::set_value(const Array<Datetime>& x) {
    _set_array(DATETIME_ARRAY, x.rep());
}

void Value::set_value(const Array<Instance*>& x) {
    _set_instances(x.rep());
}

int Value::get_value(String& x) const {
    if (_type != STRING)
        return -1;
    x = _string(const_cast<void*>(static_cast<const void*>(&_u)));
    return 0;
}

int Value::get_value(Datetime& x) const {
    if (_type != DATETIME)
        return -1;
    x = _datetime(const_cast<void*>(static_cast<const void*>(&_u)));
    return 0;
}

int Value::get_value(Instance*& x) const {
    if (_type != INSTANCE)
        return -1;
    x = static_cast<Instance*>(_u.ptr);
    return 0;
}

int Value::get_value(Array<String>& x) const {
    return _get_array(STRING_ARRAY, x.rep());
}

int Value::get_value(Array<Datetime>& x) const {
    return _get_array(DATETIME_ARRAY, x.rep());
}

int Value::get_value(Array<Instance*>& x) const {
    return _get_array(INSTANCE_ARRAY, x.rep());
}

//------------------------------------------------------------------------------
// Instance slots
//------------------------------------------------------------------------------

namespace {

const char* _class_name(const Instance* instance) {
    return instance && instance->meta_class ? instance->meta_class->name : "?";
}

// Whether an instance may be stored in a reference to target.
bool _assignable(const Meta_Class* target, const Instance* x) {
    return !x || !target || is_subclass(target, x->meta_class);
}

}  // namespace

int Value::get(Instance* instance, const Meta_Feature* feature) const {
    if (!instance) {
        TVRN_WARN("null instance argument");
        return -1;
    }
    if (!feature)
        return -1;
    if (type_of(feature) != _type) {
        TVRN_WARN("type mismatch: %s.%s", _class_name(instance), feature->name);
        return -1;
    }

    if (feature->flags & FLAG_PROPERTY) {
        const Meta_Property* mp = reinterpret_cast<const Meta_Property*>(feature);
        unsigned char* slot = slot_of(instance, mp->offset);
        if (mp->subscript)
            __assign(array_rep_in(slot), static_cast<const __Array_Rep*>(_u.ptr));
        else if (mp->type == STRING)
            *reinterpret_cast<String*>(slot) =
                _string(const_cast<void*>(static_cast<const void*>(&_u)));
        else if (mp->type == DATETIME)
            *reinterpret_cast<Datetime*>(slot) =
                _datetime(const_cast<void*>(static_cast<const void*>(&_u)));
        else
            std::memcpy(slot, &_u, type_size(mp->type));
        null_flag(slot, mp) = _null;
        return 0;
    }

    const Meta_Reference* mr = reinterpret_cast<const Meta_Reference*>(feature);
    unsigned char* slot = slot_of(instance, mr->offset);
    const char* target = mr->meta_class ? mr->meta_class->name : "Instance";

    if (!mr->subscript) {
        Instance* x = _null ? nullptr : static_cast<Instance*>(_u.ptr);
        if (!_assignable(mr->meta_class, x)) {
            TVRN_WARN("failed to assign instance of %s to %s.%s", _class_name(x), target,
                      feature->name);
            return -1;
        }
        Instance*& p = reference_in(slot);
        Instance* old = p;
        ref(x);
        p = x;
        unref(old);
        return 0;
    }

    const __Array_Rep* rep = static_cast<const __Array_Rep*>(_u.ptr);
    Instance* const* elements = reinterpret_cast<Instance* const*>(rep->data());
    for (size_t i = 0; i < rep->size; i++) {
        if (!_assignable(mr->meta_class, elements[i])) {
            TVRN_WARN("failed to assign instance of %s to %s.%s", _class_name(elements[i]), target,
                      feature->name);
            return -1;
        }
    }
    // Build the new contents before releasing the old ones: they may share
    // elements.
    __Array_Rep* copy;
    __construct(copy, __Array_Traits_Factory_Raw<void*>::traits(), rep->data(), rep->size);
    _ref_elements(copy);
    __Array_Rep*& old = array_rep_in(slot);
    _unref_elements(old);
    __destruct(old);
    old = copy;
    ref_array_null(slot) = _null;
    return 0;
}

int Value::set(const Instance* instance, const Meta_Feature* feature) {
    if (!instance) {
        TVRN_WARN("null instance argument");
        return -1;
    }
    int type = type_of(feature);
    if (type == NONE)
        return -1;

    Value tmp;
    if (feature->flags & FLAG_PROPERTY) {
        const Meta_Property* mp = reinterpret_cast<const Meta_Property*>(feature);
        const unsigned char* slot = slot_of(instance, mp->offset);
        if (mp->subscript) {
            const __Array_Rep* rep = array_rep_in(slot);
            __Array_Rep* copy;
            __construct(copy, rep->traits, rep->data(), rep->size);
            tmp._u.ptr = copy;
        } else if (mp->type == STRING) {
            new (&tmp._u) String(*reinterpret_cast<const String*>(slot));
        } else if (mp->type == DATETIME) {
            new (&tmp._u) Datetime(*reinterpret_cast<const Datetime*>(slot));
        } else {
            std::memcpy(&tmp._u, slot, type_size(mp->type));
        }
        tmp._type = type;
        tmp._null = null_flag(slot, mp);
    } else {
        const Meta_Reference* mr = reinterpret_cast<const Meta_Reference*>(feature);
        const unsigned char* slot = slot_of(instance, mr->offset);
        if (mr->subscript) {
            const __Array_Rep* rep = array_rep_in(slot);
            __Array_Rep* copy;
            __construct(copy, rep->traits, rep->data(), rep->size);
            _ref_elements(copy);
            tmp._u.ptr = copy;
            tmp._null = ref_array_null(slot);
        } else {
            Instance* p = reference_in(slot);
            ref(p);
            tmp._u.ptr = p;
            tmp._null = p == nullptr;
        }
        tmp._type = type;
    }
    swap(tmp);
    return 0;
}

//------------------------------------------------------------------------------
// Diagnostics
//------------------------------------------------------------------------------

void Value::print(bool prettify) const {
    fprint(stdout, prettify);
}

void Value::fprint(FILE* os, bool prettify) const {
    fprintf(os, "%s ", _type_name(_type));
    if (_null) {
        fputs("NULL\n", os);
        return;
    }
    if (_type == NONE) {
        fputc('\n', os);
    } else if (_type == INSTANCE) {
        fputc('\n', os);
        if (_u.ptr)
            CPTA::fprint(os, static_cast<const Instance*>(_u.ptr));
    } else if (_type == INSTANCE_ARRAY) {
        const __Array_Rep* rep = static_cast<const __Array_Rep*>(_u.ptr);
        fprintf(os, "[%zu]\n", rep->size);
        for (size_t i = 0; i < rep->size; i++) {
            const Instance* p = reinterpret_cast<Instance* const*>(rep->data())[i];
            if (p)
                CPTA::fprint(os, p);
        }
    } else if (_is_array(_type)) {
        print_array(os, _type - ARRAY, static_cast<const __Array_Rep*>(_u.ptr), prettify);
        fputc('\n', os);
    } else {
        print_scalar(os, _type, &_u, prettify);
        fputc('\n', os);
    }
}

}  // namespace CPTA
