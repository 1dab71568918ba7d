// Raw access to the feature slots of an instance, by meta-data.
#ifndef CPTA_FRAMEWORK_SLOT_H
#define CPTA_FRAMEWORK_SLOT_H

#include <cstdio>

#include "framework/Array.h"
#include "framework/Instance.h"
#include "framework/Meta.h"
#include "framework/Type_Info.h"

namespace CPTA {

inline bool is_property(const Meta_Feature* mf) {
    return (mf->flags & FLAG_PROPERTY) != 0;
}
inline bool is_reference(const Meta_Feature* mf) {
    return (mf->flags & FLAG_REFERENCE) != 0;
}
inline bool is_key(const Meta_Feature* mf) {
    return (mf->flags & FLAG_KEY) != 0;
}

inline const Meta_Property* as_property(const Meta_Feature* mf) {
    return reinterpret_cast<const Meta_Property*>(mf);
}
inline const Meta_Reference* as_reference(const Meta_Feature* mf) {
    return reinterpret_cast<const Meta_Reference*>(mf);
}

inline unsigned char* slot_of(Instance* instance, uint32 offset) {
    return reinterpret_cast<unsigned char*>(instance) + offset;
}
inline const unsigned char* slot_of(const Instance* instance, uint32 offset) {
    return reinterpret_cast<const unsigned char*>(instance) + offset;
}

// Property slots: the value, then the null flag.
inline size_t property_value_size(const Meta_Property* mp) {
    return mp->subscript ? ARRAY_SLOT_SIZE : type_size(mp->type);
}
inline uint8& null_flag(unsigned char* slot, const Meta_Property* mp) {
    return slot[property_value_size(mp)];
}
inline uint8 null_flag(const unsigned char* slot, const Meta_Property* mp) {
    return slot[property_value_size(mp)];
}

// Array values (array properties and reference arrays).
inline __Array_Rep*& array_rep_in(unsigned char* slot) {
    return *reinterpret_cast<__Array_Rep**>(slot);
}
inline const __Array_Rep* array_rep_in(const unsigned char* slot) {
    return *reinterpret_cast<const __Array_Rep* const*>(slot);
}

// Single references: one instance pointer.
inline Instance*& reference_in(unsigned char* slot) {
    return *reinterpret_cast<Instance**>(slot);
}
inline Instance* reference_in(const unsigned char* slot) {
    return *reinterpret_cast<Instance* const*>(slot);
}

// Reference arrays: an Array of instance pointers, then the null flag.
inline uint8& ref_array_null(unsigned char* slot) {
    return slot[ARRAY_SLOT_SIZE];
}
inline uint8 ref_array_null(const unsigned char* slot) {
    return slot[ARRAY_SLOT_SIZE];
}
inline Instance* const* ref_array_data(const unsigned char* slot) {
    return reinterpret_cast<Instance* const*>(array_rep_in(slot)->data());
}

// Equality of two scalars of a type: integers and char16 by value, reals by
// floating ==, strings by bytes, date-times by microseconds, offset and kind.
bool scalar_equal(int type, const void* a, const void* b);

// Equality of two property values of the same type and subscript (their
// null flags are not looked at).
bool property_value_equal(const Meta_Property* mp, const unsigned char* a, const unsigned char* b);

// Prints one scalar: numbers as numbers, a string in double quotes.
void print_scalar(FILE* os, int type, const void* p, bool prettify = false);

// Prints the elements of an array of a scalar type as {a, b, ...}.
void print_array(FILE* os, int type, const __Array_Rep* rep, bool prettify = false);

}  // namespace CPTA

#endif
