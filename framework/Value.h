// A tagged holder of one value of any CIM type: a scalar, a string, a
// date-time, an instance or an array of any of them.
//
// Ownership: strings and date-times are shared, arrays copied element by
// element. Setting an instance (or an array of instances) hands the caller's
// reference(s) over to the Value; copying a Value adds one reference per
// instance; clear() and destruction release exactly those references.
#ifndef CPTA_FRAMEWORK_VALUE_H
#define CPTA_FRAMEWORK_VALUE_H

#include <cstdio>

#include "framework/Array.h"
#include "framework/Datetime.h"
#include "framework/Meta.h"
#include "framework/String.h"
#include "framework/Types.h"

namespace CPTA {

struct Instance;

class Value {
public:
    enum Type {
        NONE = -1,
        BOOLEAN = 0,
        UINT8 = 1,
        SINT8 = 2,
        UINT16 = 3,
        SINT16 = 4,
        UINT32 = 5,
        SINT32 = 6,
        UINT64 = 7,
        SINT64 = 8,
        REAL32 = 9,
        REAL64 = 10,
        CHAR16 = 11,
        STRING = 12,
        DATETIME = 13,
        INSTANCE = 14,
        ARRAY = 128,
        BOOLEAN_ARRAY = ARRAY + BOOLEAN,
        UINT8_ARRAY = ARRAY + UINT8,
        SINT8_ARRAY = ARRAY + SINT8,
        UINT16_ARRAY = ARRAY + UINT16,
        SINT16_ARRAY = ARRAY + SINT16,
        UINT32_ARRAY = ARRAY + UINT32,
        SINT32_ARRAY = ARRAY + SINT32,
        UINT64_ARRAY = ARRAY + UINT64,
        SINT64_ARRAY = ARRAY + SINT64,
        REAL32_ARRAY = ARRAY + REAL32,
        REAL64_ARRAY = ARRAY + REAL64,
        CHAR16_ARRAY = ARRAY + CHAR16,
        STRING_ARRAY = ARRAY + STRING,
        DATETIME_ARRAY = ARRAY + DATETIME,
        INSTANCE_ARRAY = ARRAY + INSTANCE
    };

    Value();  // tag NONE, not null
    Value(const Value& x);
    ~Value();
    Value& operator=(const Value& x);

    Type type() const { return Type(_type); }
    bool null() const { return _null != 0; }
    void null(bool flag) { _null = flag; }

    // Releases the payload; leaves tag NONE and the null flag set.
    void clear();

    // Each set_value clears, stores a copy of x and clears the null flag.
    void set_value(boolean x);
    void set_value(uint8 x);
    void set_value(sint8 x);
    void set_value(uint16 x);
    void set_value(sint16 x);
    void set_value(uint32 x);
    void set_value(sint32 x);
    void set_value(uint64 x);
    void set_value(sint64 x);
    void set_value(real32 x);
    void set_value(real64 x);
    void set_value(char16 x);
    void set_value(const char* x);  // stored as a String (null: empty)
    void set_value(const String& x);
    void set_value(const Datetime& x);
    void set_value(Instance* x);  // takes over the caller's reference
    void set_value(const Array<boolean>& x);
    void set_value(const Array<uint8>& x);
    void set_value(const Array<sint8>& x);
    void set_value(const Array<uint16>& x);
    void set_value(const Array<sint16>& x);
    void set_value(const Array<uint32>& x);
    void set_value(const Array<sint32>& x);
    void set_value(const Array<uint64>& x);
    void set_value(const Array<sint64>& x);
    void set_value(const Array<real32>& x);
    void set_value(const Array<real64>& x);
    void set_value(const Array<char16>& x);
    void set_value(const Array<String>& x);
    void set_value(const Array<Datetime>& x);
    void set_value(const Array<Instance*>& x);  // takes over one reference per element

    template <class C>
    void set_value(const Array<C*>& x) {
        _set_instances(x.rep());
    }

    // Copies the value out when the tag is exactly the requested type and
    // returns 0; otherwise -1 with x unchanged. Instances are lent, not
    // referenced.
    int get_value(boolean& x) const;
    int get_value(uint8& x) const;
    int get_value(sint8& x) const;
    int get_value(uint16& x) const;
    int get_value(sint16& x) const;
    int get_value(uint32& x) const;
    int get_value(sint32& x) const;
    int get_value(uint64& x) const;
    int get_value(sint64& x) const;
    int get_value(real32& x) const;
    int get_value(real64& x) const;
    int get_value(char16& x) const;
    int get_value(String& x) const;
    int get_value(Datetime& x) const;
    int get_value(Instance*& x) const;
    int get_value(Array<boolean>& x) const;
    int get_value(Array<uint8>& x) const;
    int get_value(Array<sint8>& x) const;
    int get_value(Array<uint16>& x) const;
    int get_value(Array<sint16>& x) const;
    int get_value(Array<uint32>& x) const;
    int get_value(Array<sint32>& x) const;
    int get_value(Array<uint64>& x) const;
    int get_value(Array<sint64>& x) const;
    int get_value(Array<real32>& x) const;
    int get_value(Array<real64>& x) const;
    int get_value(Array<char16>& x) const;
    int get_value(Array<String>& x) const;
    int get_value(Array<Datetime>& x) const;
    int get_value(Array<Instance*>& x) const;

    // Stores this value into the slot of feature in instance: the tag must be
    // type_of(feature); a referenced instance must be of the reference's class
    // or a subclass. The slot takes its own references. 0 or -1 (with a
    // warning in the log).
    int get(Instance* instance, const Meta_Feature* feature) const;

    // Reads the slot of feature in instance into this value, with the slot's
    // null flag (a single reference has none: null when empty). 0 or -1.
    int set(const Instance* instance, const Meta_Feature* feature);

    void print(bool prettify = false) const;
    void fprint(FILE* os, bool prettify = false) const;

    void swap(Value& x) noexcept;

    // "NONE", "BOOLEAN" ... "INSTANCE_ARRAY"; "UNKNOWN" for other tags.
    static const char* _type_name(int type);

private:
    void _set_scalar(Type type, const void* p, size_t n);
    void _set_array(Type type, const __Array_Rep* rep);
    void _set_instances(const __Array_Rep* rep);
    int _get_scalar(Type type, void* p, size_t n) const;
    int _get_array(Type type, __Array_Rep*& rep) const;

    sint32 _type;
    uint8 _null;
    union {
        boolean b;
        uint8 u8;
        sint8 s8;
        uint16 u16;
        sint16 s16;
        uint32 u32;
        sint32 s32;
        uint64 u64;
        sint64 s64;
        real32 r32;
        real64 r64;
        uint16 c16;
        void* ptr;  // String, Datetime, __Array_Rep or Instance
        unsigned char bytes[8];
    } _u;
};

// "none", "boolean" ... "instance_array" (lower case, for messages).
const char* name_of(int type);

// The Value tag of a feature: a property's type (+128 for an array), 14 for
// a single reference, 142 for a reference array, -1 otherwise.
int type_of(const Meta_Feature* feature);

}  // namespace CPTA

#endif
