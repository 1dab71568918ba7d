// Static meta-data of the class model: feature flags and the records that
// describe classes, properties, references, methods and the repository.
//
// Every meta record begins with the same head (reference count, flags, name,
// qualifiers). Records with a reference count of 0 are static and are never
// counted or freed.
#ifndef CPTA_FRAMEWORK_META_H
#define CPTA_FRAMEWORK_META_H

#include "framework/Types.h"

namespace CPTA {

// Feature flags: bit i is named by flag_names[i].
enum : uint32 {
    FLAG_PROPERTY = 1u << 0,
    FLAG_REFERENCE = 1u << 1,
    FLAG_METHOD = 1u << 2,
    FLAG_CLASS = 1u << 3,
    FLAG_ABSTRACT = 1u << 4,
    FLAG_AGGREGATE = 1u << 5,
    FLAG_AGGREGATION = 1u << 6,
    FLAG_ASSOCIATION = 1u << 7,
    FLAG_COMPOSITION = 1u << 8,
    FLAG_COUNTER = 1u << 9,
    FLAG_DELETE = 1u << 10,
    FLAG_DN = 1u << 11,
    FLAG_EMBEDDED_OBJECT = 1u << 12,
    FLAG_EXCEPTION = 1u << 13,
    FLAG_EXPENSIVE = 1u << 14,
    FLAG_EXPERIMENTAL = 1u << 15,
    FLAG_GAUGE = 1u << 16,
    FLAG_IFDELETED = 1u << 17,
    FLAG_IN = 1u << 18,
    FLAG_INDICATION = 1u << 19,
    FLAG_INVISIBLE = 1u << 20,
    FLAG_KEY = 1u << 21,
    FLAG_LARGE = 1u << 22,
    FLAG_OCTETSTRING = 1u << 23,
    FLAG_OUT = 1u << 24,
    FLAG_READ = 1u << 25,
    FLAG_REQUIRED = 1u << 26,
    FLAG_STATIC = 1u << 27,
    FLAG_TERMINAL = 1u << 28,
    FLAG_WEAK = 1u << 29,
    FLAG_WRITE = 1u << 30,
    FLAG_EMBEDDED_INSTANCE = 1u << 31
};

// Kinds accepted by find_feature().
enum : uint32 {
    FIND_PROPERTY = FLAG_PROPERTY,
    FIND_REFERENCE = FLAG_REFERENCE,
    FIND_METHOD = FLAG_METHOD,
    FIND_ANY = FLAG_PROPERTY | FLAG_REFERENCE | FLAG_METHOD
};

struct Meta_Class;
struct Meta_Repository;

// Qualifiers are not used by this module: every qualifier list is empty.
struct Meta_Qualifier {
    uint32 refs;
    uint32 flags;
    const char* name;
};

// Common head of every meta record.
struct Meta_Feature {
    uint32 refs;
    uint32 flags;
    const char* name;
    const Meta_Qualifier* const* meta_qualifiers;
    size_t num_meta_qualifiers;
};

// Default values. A scalar default holds the value itself (a string default a
// C string, a datetime default its 25-character text); an array default holds
// a pointer to its elements and their count. Meta_Property::value points at one
// of these, cast to the opaque Meta_Value.
struct Meta_Value;

template <class T>
struct Meta_Value_Scalar {
    T value;
};

template <class T>
struct Meta_Value_Array {
    const T* elements;
    size_t num_elements;
};

struct Meta_Property {
    // Meta_Feature head
    uint32 refs;
    uint32 flags;
    const char* name;
    const Meta_Qualifier* const* meta_qualifiers;
    size_t num_meta_qualifiers;
    // Property
    uint16 type;              // Type code
    sint16 subscript;         // 0 scalar, -1 variable-size array, N fixed-size array
    uint32 offset;            // offset of the Property<T> slot in the instance
    const Meta_Value* value;  // default value, or null
};

struct Meta_Reference {
    // Meta_Feature head
    uint32 refs;
    uint32 flags;
    const char* name;
    const Meta_Qualifier* const* meta_qualifiers;
    size_t num_meta_qualifiers;
    // Reference
    sint16 subscript;              // 0 single reference, non-zero reference array
    const Meta_Class* meta_class;  // class of the referenced instances
    uint32 offset;                 // offset of the slot in the instance
};

// A method begins exactly like a Meta_Class so that a parameter record can be
// created from it with the same code as an instance.
struct Meta_Method {
    // Meta_Feature head
    uint32 refs;
    uint32 flags;
    const char* name;
    const Meta_Qualifier* const* meta_qualifiers;
    size_t num_meta_qualifiers;
    // Parameters in declaration order, then "return_value".
    const Meta_Feature* const* meta_features;
    size_t num_meta_features;
    uint32 size;         // size of the parameter record
    uint16 return_type;  // Type code of return_value
};

struct Meta_Class {
    // Meta_Feature head
    uint32 refs;
    uint32 flags;
    const char* name;
    const Meta_Qualifier* const* meta_qualifiers;
    size_t num_meta_qualifiers;
    // Class
    const Meta_Feature* const* meta_features;  // all features, root class first
    size_t num_meta_features;
    uint32 size;                         // instance size in bytes
    const bool* locals;                  // true where the class (re)declares the feature
    const Meta_Class* super_meta_class;  // null for a root class
    size_t num_keys;
    const Meta_Repository* meta_repository;
};

struct Meta_Repository {
    const Meta_Class* const* meta_classes;
    size_t num_meta_classes;
};

}  // namespace CPTA

#endif
