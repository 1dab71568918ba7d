// Model instances and the generic operations on them.
//
// Every instance (and every method parameter record) starts with the
// Instance header; the slots of its features follow at the offsets that its
// meta class records. The operations here work on any instance by walking
// that meta-data: a Property<T> per property (for arrays the value is one
// Array), a pointer per single reference (null means no reference), and an
// Array of instance pointers plus a null flag per reference array.
//
// Ownership: create() and clone() return an instance with count 1 that
// belongs to the caller; storing an instance in a reference slot or a Value
// hands over one reference; unref() of the last reference and destroy()
// release every referenced instance too.
#ifndef CPTA_FRAMEWORK_INSTANCE_H
#define CPTA_FRAMEWORK_INSTANCE_H

#include <cstdio>

#include "framework/Meta.h"
#include "framework/Meta_Lookup.h"
#include "framework/Property.h"
#include "framework/String.h"

namespace CPTA {

const uint32 INSTANCE_MAGIC = 0xF00DFACE;

struct Instance {
    uint32 magic;
    uint32 refs;  // changed only atomically
    const Meta_Class* meta_class;
    String __name_space;

    // The root class "Instance": no features, no superclass.
    static const Meta_Class static_meta_class;
};

// Offset of a slot in a generated class type. The class types derive from
// Instance and add members, so they are not standard-layout; offsetof works
// on them with GCC and Clang, which only warn (-Winvalid-offsetof). Files
// that use this for meta-data initialisers disable that warning.
#define CPTA_SLOT_OFFSET(CLASS, FIELD) uint32(offsetof(CLASS, FIELD))

// Allocates an instance of the class and default-constructs it: with defaults
// every property holds its default value or is null; without, every
// property is present with a zero or empty value. Returns null on a missing
// class or when memory runs out.
Instance* create(const Meta_Class* meta_class, bool defaults);

// An empty parameter record of the method (every parameter present, zero).
Instance* create(const Meta_Method* meta_method);

template <class C>
inline C* create(bool defaults) {
    return static_cast<C*>(create(&C::static_meta_class, defaults));
}

// A deep copy with count 1 (referenced instances are cloned too); null when
// instance is null or memory runs out.
Instance* clone(const Instance* instance);

template <class C>
inline C* clone(const C* instance) {
    return static_cast<C*>(clone(static_cast<const Instance*>(instance)));
}

// Frees the instance at once, whatever its count, releasing every
// referenced instance.
void destroy(Instance* instance);

void ref(const Instance* instance);
// Releases one reference; the last one destroys the instance.
void unref(const Instance* instance);

// Default construction of the storage of an instance (create() calls it with
// clear set, which zero-fills the storage first).
void __default_construct(const Meta_Class* meta_class, Instance* instance, bool clear,
                         bool defaults);

// Key equality: every key of a's class is present in b's class and equal.
// A class without keys makes every pair equal.
bool key_eq(const Instance* a, const Instance* b);

// Full equality: same class, name space, properties and references
// (compared recursively).
bool identical(const Instance* a, const Instance* b);

// Marks the wanted properties of a request model (non-null = wanted).
// names is a list closed by a null entry, or null for "every property".
// Returns -1 when a name denotes a method, otherwise 0.
int filter_properties(Instance* instance, const char* const* names, bool keep_keys);

// Sets the null flag of every key property (when keys) and every non-key
// property and reference array (when non_keys) to value.
void __set_null_flags(Instance* instance, bool keys, bool non_keys, bool value);

// Gives the instance and every instance reachable through its references
// the name space: always when it has none, otherwise only when force is set.
void __set_name_space_recursive(Instance* instance, const char* name_space, bool force);

// Writes the object-path text form Class.Key1=value,Key2=value; 0, or -1 when
// the class has no keys, a key is null or an array, or a referenced key
// instance cannot be written (path is then left unchanged).
int instance_to_model_path(const Instance* instance, String& path);

// Whether one of the association's single references holds an instance
// key-equal to instance, under the given role (null or empty: any).
bool is_reference_of(const Instance* instance, const Instance* association, const char* role);

// The other ends of an association instance that refers to instance (in
// role, when given), restricted to result_class and result_role when given.
// Writes borrowed pointers to out, which needs room for one entry per
// reference of the association, and returns their number; -1 when the
// association does not refer to instance in that role.
int get_associators(const Instance* instance, const Instance* association, const char* result_class,
                    const char* role, const char* result_role, const Instance** out);

// Diagnostic dump of the instance (only its keys when keys_only).
void print(const Instance* instance, bool keys_only = false);
void fprint(FILE* os, const Instance* instance, bool keys_only = false);

// An owning handle to one instance. Constructing or resetting from a pointer
// takes over that reference; copying adds one; destruction releases it.
template <class T = Instance>
class Ref {
public:
    Ref() : _ptr(nullptr) {}
    explicit Ref(T* ptr) : _ptr(ptr) {}
    Ref(const Ref& x) : _ptr(x._ptr) { ref(_ptr); }
    ~Ref() { unref(_ptr); }

    Ref& operator=(const Ref& x) {
        if (x._ptr != _ptr) {
            ref(x._ptr);
            unref(_ptr);
            _ptr = x._ptr;
        }
        return *this;
    }

    // Takes over the reference held by ptr; the same target does nothing.
    void reset(T* ptr = nullptr) {
        if (ptr != _ptr) {
            unref(_ptr);
            _ptr = ptr;
        }
    }

    // Gives up the reference without releasing it.
    T* steal() {
        T* p = _ptr;
        _ptr = nullptr;
        return p;
    }

    T* ptr() const { return _ptr; }
    T* operator->() const { return _ptr; }
    T& operator*() const { return *_ptr; }
    explicit operator bool() const { return _ptr != nullptr; }

private:
    T* _ptr;
};

}  // namespace CPTA

#endif
