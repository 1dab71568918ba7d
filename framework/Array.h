// Typed, growable array over untyped element operations.
//
// An Array<T> is one pointer to a representation (__Array_Rep) that records
// the element traits, the element count and the capacity, followed by the
// elements. All work is done by the untyped __construct ... __destruct
// functions, driven by the traits: element size and optional construct,
// destruct and equal operations (missing ones mean a byte copy, nothing to
// destroy and a byte comparison). Arrays are never shared; copies are deep.
//
// Elements are moved within and between representations as bytes, so element
// types must be bitwise relocatable (scalars, String, Datetime, pointers and
// plain structures of them are).
#ifndef CPTA_FRAMEWORK_ARRAY_H
#define CPTA_FRAMEWORK_ARRAY_H

#include <cstddef>
#include <new>

#include "framework/Datetime.h"
#include "framework/String.h"
#include "framework/Types.h"

namespace CPTA {

struct __Array_Traits {
    size_t size;                                     // element size in bytes
    void (*construct)(void* dest, const void* src);  // copy into raw storage
    void (*destruct)(void* p);                       // destroy in place
    bool (*equal)(const void* a, const void* b);
};

struct alignas(16) __Array_Rep {
    const __Array_Traits* traits;
    size_t size;
    size_t cap;

    unsigned char* data() { return reinterpret_cast<unsigned char*>(this + 1); }
    const unsigned char* data() const { return reinterpret_cast<const unsigned char*>(this + 1); }
};

// A new representation holding copies of size elements at data; its capacity
// is size, or 8 for an empty array.
void __construct(__Array_Rep*& rep, const __Array_Traits* traits, const void* data, size_t size);
// Makes rep hold copies of other's elements.
void __assign(__Array_Rep*& rep, const __Array_Rep* other);
void __append(__Array_Rep*& rep, const void* data, size_t size);
void __prepend(__Array_Rep*& rep, const void* data, size_t size);
// Inserts copies of size elements at pos (a pos beyond the end appends).
// data may point into the array itself.
void __insert(__Array_Rep*& rep, size_t pos, const void* data, size_t size);
// Removes size elements at pos; parts beyond the end are ignored.
void __remove(__Array_Rep*& rep, size_t pos, size_t size);
// Grows with copies of *fill (zero bytes when fill is null) or shrinks.
void __resize(__Array_Rep*& rep, size_t size, const void* fill);
// Capacity for at least size elements: a power of two, at least 8.
void __reserve(__Array_Rep*& rep, size_t size);
// Index of the first element equal to *x, or size_t(-1).
size_t __find(const __Array_Rep* rep, const void* x);
bool __equal(const __Array_Rep* a, const __Array_Rep* b);
// Destroys the elements and frees the representation (null is ignored).
void __destruct(__Array_Rep* rep);

// Element traits of array properties, indexed by Type code. Signed types
// share the traits of their unsigned twins and char16 those of uint16.
extern const __Array_Traits* const __cim_array_traits[NUM_TYPES];

// Traits of raw pointers: byte copy, byte comparison.
template <class T>
struct __Array_Traits_Factory_Raw {
    static const __Array_Traits* traits() {
        static const __Array_Traits t = {sizeof(T), nullptr, nullptr, nullptr};
        return &t;
    }
};

// Traits of any other element type: its copy constructor, destructor and ==.
template <class T>
struct __Array_Traits_Factory {
    static void construct(void* dest, const void* src) {
        new (dest) T(*static_cast<const T*>(src));
    }
    static void destruct(void* p) { static_cast<T*>(p)->~T(); }
    static bool equal(const void* a, const void* b) {
        return *static_cast<const T*>(a) == *static_cast<const T*>(b);
    }
    static const __Array_Traits* traits() {
        static const __Array_Traits t = {sizeof(T), construct, destruct, equal};
        return &t;
    }
};

template <class T>
struct __Array_Traits_Factory<T*> {
    static const __Array_Traits* traits() { return __Array_Traits_Factory_Raw<void*>::traits(); }
};

#define CPTA_CIM_ARRAY_TRAITS(T, CODE)                                             \
    template <>                                                                    \
    struct __Array_Traits_Factory<T> {                                             \
        static const __Array_Traits* traits() { return __cim_array_traits[CODE]; } \
    }

CPTA_CIM_ARRAY_TRAITS(boolean, BOOLEAN);
CPTA_CIM_ARRAY_TRAITS(uint8, UINT8);
CPTA_CIM_ARRAY_TRAITS(sint8, SINT8);
CPTA_CIM_ARRAY_TRAITS(uint16, UINT16);
CPTA_CIM_ARRAY_TRAITS(sint16, SINT16);
CPTA_CIM_ARRAY_TRAITS(uint32, UINT32);
CPTA_CIM_ARRAY_TRAITS(sint32, SINT32);
CPTA_CIM_ARRAY_TRAITS(uint64, UINT64);
CPTA_CIM_ARRAY_TRAITS(sint64, SINT64);
CPTA_CIM_ARRAY_TRAITS(real32, REAL32);
CPTA_CIM_ARRAY_TRAITS(real64, REAL64);
CPTA_CIM_ARRAY_TRAITS(char16, CHAR16);
CPTA_CIM_ARRAY_TRAITS(String, STRING);
CPTA_CIM_ARRAY_TRAITS(Datetime, DATETIME);

#undef CPTA_CIM_ARRAY_TRAITS

template <class T>
class Array {
public:
    static const __Array_Traits* traits() { return __Array_Traits_Factory<T>::traits(); }

    Array() { __construct(_rep, traits(), nullptr, 0); }
    Array(const Array& x) { __construct(_rep, traits(), x.data(), x.size()); }
    Array(const T* data, size_t size) { __construct(_rep, traits(), data, size); }
    ~Array() { __destruct(_rep); }

    Array& operator=(const Array& x) {
        __assign(_rep, x._rep);
        return *this;
    }
    void assign(const Array& x) { __assign(_rep, x._rep); }
    void assign(const T* data, size_t size) {
        clear();
        __append(_rep, data, size);
    }

    size_t size() const { return _rep->size; }
    size_t capacity() const { return _rep->cap; }
    T* data() { return reinterpret_cast<T*>(_rep->data()); }
    const T* data() const { return reinterpret_cast<const T*>(_rep->data()); }
    T& operator[](size_t i) { return data()[i]; }
    const T& operator[](size_t i) const { return data()[i]; }

    void append(const T& x) { __append(_rep, &x, 1); }
    void append(const T* data, size_t size) { __append(_rep, data, size); }
    void prepend(const T& x) { __prepend(_rep, &x, 1); }
    void prepend(const T* data, size_t size) { __prepend(_rep, data, size); }
    void insert(size_t pos, const T& x) { __insert(_rep, pos, &x, 1); }
    void insert(size_t pos, const T* data, size_t size) { __insert(_rep, pos, data, size); }
    void remove(size_t pos, size_t size = 1) { __remove(_rep, pos, size); }
    void resize(size_t size, const T& fill = T()) { __resize(_rep, size, &fill); }
    void reserve(size_t size) { __reserve(_rep, size); }
    void clear() { __remove(_rep, 0, _rep->size); }

    // Index of the first element equal to x, or size_t(-1).
    size_t find(const T& x) const { return __find(_rep, &x); }

    void swap(Array& x) noexcept {
        __Array_Rep* t = _rep;
        _rep = x._rep;
        x._rep = t;
    }

    __Array_Rep*& rep() { return _rep; }
    const __Array_Rep* rep() const { return _rep; }

private:
    __Array_Rep* _rep;
};

template <class T>
inline bool operator==(const Array<T>& a, const Array<T>& b) {
    return __equal(a.rep(), b.rep());
}

template <class T>
inline bool operator!=(const Array<T>& a, const Array<T>& b) {
    return !__equal(a.rep(), b.rep());
}

}  // namespace CPTA

#endif
