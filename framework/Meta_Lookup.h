// Look-ups over the static meta-data: flag names, classes by name, class
// ancestry and features by name. Names are compared without regard to case.
#ifndef CPTA_FRAMEWORK_META_LOOKUP_H
#define CPTA_FRAMEWORK_META_LOOKUP_H

#include "framework/Meta.h"

namespace CPTA {

// flag_names[i] names bit i of the feature flags ("Property" ... "EmbeddedInstance").
extern const char* const flag_names[32];

// The bit index of a flag name, or -1.
int flag_name_to_index(const char* name);

// The first class of the repository with that name, or null.
const Meta_Class* find_meta_class(const Meta_Repository* meta_repository, const char* name);

// The class itself or its nearest ancestor of that name, otherwise the
// look-up in the class's repository.
const Meta_Class* find_meta_class(const Meta_Class* meta_class, const char* name);

// True when ancestor is the root class (or named "Instance"), or when
// descendant or one of its ancestors is ancestor (the same record or the same
// name). A class is its own subclass.
bool is_subclass(const Meta_Class* ancestor, const Meta_Class* descendant);

// 0 when the class named ancestor is an ancestor of the class named
// descendant, 1 when it is not, -1 when a name is unknown or missing.
int is_subclass(const Meta_Repository* meta_repository, const char* ancestor,
                const char* descendant);

// The first feature with that name whose flags share a bit with kinds
// (FIND_PROPERTY, FIND_REFERENCE, FIND_METHOD or FIND_ANY), or null.
const Meta_Feature* find_feature(const Meta_Class* meta_class, const char* name,
                                 uint32 kinds = FIND_ANY);
const Meta_Property* find_property(const Meta_Class* meta_class, const char* name);
const Meta_Reference* find_reference(const Meta_Class* meta_class, const char* name);
const Meta_Method* find_method(const Meta_Class* meta_class, const char* name);

// The same over the parameters of a method.
const Meta_Feature* find_parameter(const Meta_Method* meta_method, const char* name);
const Meta_Reference* find_reference(const Meta_Method* meta_method, const char* name);

// Whether any feature of the class has one of the flag bits.
bool has_feature(const Meta_Class* meta_class, uint32 flags);

// The superclass, or null for a root class and for a method record (whose
// meta-data ends after the fields it shares with a class).
const Meta_Class* super_meta_class_of(const Meta_Class* meta_class);

// Count a dynamically made meta class; static meta-data (count 0) is left
// alone. unref() returns the count left (0 for static meta-data), so that
// the code that made a dynamic class can free it.
void ref(const Meta_Class* meta_class);
uint32 unref(const Meta_Class* meta_class);

}  // namespace CPTA

#endif
