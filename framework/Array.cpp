#include "framework/Array.h"

#include <cstdlib>
#include <cstring>
#include <new>
#include <stdexcept>

namespace CPTA {

namespace {

const size_t MIN_CAPACITY = 8;

size_t _grow_capacity(size_t n) {
    size_t cap = MIN_CAPACITY;
    while (cap < n) {
        if (cap > (size_t(-1) >> 1))
            throw std::length_error("Array too long");
        cap <<= 1;
    }
    return cap;
}

__Array_Rep* _alloc(const __Array_Traits* traits, size_t cap) {
    size_t esize = traits->size;
    if (esize && cap > (size_t(-1) - sizeof(__Array_Rep)) / esize)
        throw std::length_error("Array too long");
    void* p = std::malloc(sizeof(__Array_Rep) + cap * esize);
    if (!p)
        throw std::bad_alloc();
    __Array_Rep* rep = static_cast<__Array_Rep*>(p);
    rep->traits = traits;
    rep->size = 0;
    rep->cap = cap;
    return rep;
}

void _construct_n(const __Array_Traits* t, unsigned char* dest, const void* src, size_t n) {
    if (n == 0)
        return;
    if (!t->construct) {
        std::memcpy(dest, src, n * t->size);
        return;
    }
    const unsigned char* s = static_cast<const unsigned char*>(src);
    for (size_t i = 0; i < n; i++)
        t->construct(dest + i * t->size, s + i * t->size);
}

void _destruct_n(const __Array_Traits* t, unsigned char* p, size_t n) {
    if (!t->destruct)
        return;
    for (size_t i = 0; i < n; i++)
        t->destruct(p + i * t->size);
}

// Whether p points into rep's element storage.
bool _inside(const __Array_Rep* rep, const void* p) {
    const unsigned char* q = static_cast<const unsigned char*>(p);
    return q >= rep->data() && q < rep->data() + rep->cap * rep->traits->size;
}

bool _elements_equal(const __Array_Traits* t, const void* a, const void* b) {
    return t->equal ? t->equal(a, b) : std::memcmp(a, b, t->size) == 0;
}

// Element operations of the CIM types.

template <class T>
bool _float_equal(const void* a, const void* b) {
    return *static_cast<const T*>(a) == *static_cast<const T*>(b);
}

template <class T>
void _copy(void* dest, const void* src) {
    new (dest) T(*static_cast<const T*>(src));
}

template <class T>
void _destroy(void* p) {
    static_cast<T*>(p)->~T();
}

template <class T>
bool _equal(const void* a, const void* b) {
    return *static_cast<const T*>(a) == *static_cast<const T*>(b);
}

const __Array_Traits _traits_8bit = {1, nullptr, nullptr, nullptr};
const __Array_Traits _traits_16bit = {2, nullptr, nullptr, nullptr};
const __Array_Traits _traits_32bit = {4, nullptr, nullptr, nullptr};
const __Array_Traits _traits_64bit = {8, nullptr, nullptr, nullptr};
const __Array_Traits _traits_real32 = {4, nullptr, nullptr, _float_equal<real32>};
const __Array_Traits _traits_real64 = {8, nullptr, nullptr, _float_equal<real64>};
const __Array_Traits _traits_string = {sizeof(String), _copy<String>, _destroy<String>,
                                       _equal<String>};
const __Array_Traits _traits_datetime = {sizeof(Datetime), _copy<Datetime>, _destroy<Datetime>,
                                         _equal<Datetime>};

}  // namespace

const __Array_Traits* const __cim_array_traits[NUM_TYPES] = {
    &_traits_8bit,      // BOOLEAN
    &_traits_8bit,      // UINT8
    &_traits_8bit,      // SINT8
    &_traits_16bit,     // UINT16
    &_traits_16bit,     // SINT16
    &_traits_32bit,     // UINT32
    &_traits_32bit,     // SINT32
    &_traits_64bit,     // UINT64
    &_traits_64bit,     // SINT64
    &_traits_real32,    // REAL32
    &_traits_real64,    // REAL64
    &_traits_16bit,     // CHAR16
    &_traits_string,    // STRING
    &_traits_datetime,  // DATETIME
};

void __construct(__Array_Rep*& rep, const __Array_Traits* traits, const void* data, size_t size) {
    __Array_Rep* r = _alloc(traits, size ? size : MIN_CAPACITY);
    _construct_n(traits, r->data(), data, size);
    r->size = size;
    rep = r;
}

void __assign(__Array_Rep*& rep, const __Array_Rep* other) {
    if (rep == other)
        return;
    _destruct_n(rep->traits, rep->data(), rep->size);
    rep->size = 0;
    __reserve(rep, other->size);
    _construct_n(rep->traits, rep->data(), other->data(), other->size);
    rep->size = other->size;
}

void __append(__Array_Rep*& rep, const void* data, size_t size) {
    __insert(rep, rep->size, data, size);
}

void __prepend(__Array_Rep*& rep, const void* data, size_t size) {
    __insert(rep, 0, data, size);
}

void __insert(__Array_Rep*& rep, size_t pos, const void* data, size_t size) {
    if (size == 0 || !data)
        return;
    if (_inside(rep, data)) {
        // Copy the new elements out first: growing moves the storage.
        __Array_Rep* tmp;
        __construct(tmp, rep->traits, data, size);
        __insert(rep, pos, tmp->data(), size);
        __destruct(tmp);
        return;
    }
    if (pos > rep->size)
        pos = rep->size;
    __reserve(rep, rep->size + size);
    size_t esize = rep->traits->size;
    unsigned char* at = rep->data() + pos * esize;
    std::memmove(at + size * esize, at, (rep->size - pos) * esize);
    _construct_n(rep->traits, at, data, size);
    rep->size += size;
}

void __remove(__Array_Rep*& rep, size_t pos, size_t size) {
    if (pos >= rep->size)
        return;
    if (size > rep->size - pos)
        size = rep->size - pos;
    size_t esize = rep->traits->size;
    unsigned char* at = rep->data() + pos * esize;
    _destruct_n(rep->traits, at, size);
    std::memmove(at, at + size * esize, (rep->size - pos - size) * esize);
    rep->size -= size;
}

void __resize(__Array_Rep*& rep, size_t size, const void* fill) {
    const __Array_Traits* t = rep->traits;
    if (size <= rep->size) {
        __remove(rep, size, rep->size - size);
        return;
    }
    if (fill && _inside(rep, fill)) {
        __Array_Rep* tmp;
        __construct(tmp, t, fill, 1);
        __resize(rep, size, tmp->data());
        __destruct(tmp);
        return;
    }
    __reserve(rep, size);
    for (size_t i = rep->size; i < size; i++) {
        unsigned char* at = rep->data() + i * t->size;
        if (!fill)
            std::memset(at, 0, t->size);
        else if (t->construct)
            t->construct(at, fill);
        else
            std::memcpy(at, fill, t->size);
    }
    rep->size = size;
}

void __reserve(__Array_Rep*& rep, size_t size) {
    if (rep->cap >= size)
        return;
    __Array_Rep* r = _alloc(rep->traits, _grow_capacity(size));
    // Elements are relocatable: move them as bytes.
    std::memcpy(r->data(), rep->data(), rep->size * rep->traits->size);
    r->size = rep->size;
    std::free(rep);
    rep = r;
}

size_t __find(const __Array_Rep* rep, const void* x) {
    const __Array_Traits* t = rep->traits;
    for (size_t i = 0; i < rep->size; i++) {
        if (_elements_equal(t, rep->data() + i * t->size, x))
            return i;
    }
    return size_t(-1);
}

bool __equal(const __Array_Rep* a, const __Array_Rep* b) {
    if (a == b)
        return true;
    if (a->size != b->size)
        return false;
    const __Array_Traits* t = a->traits;
    if (!t->equal)
        return std::memcmp(a->data(), b->data(), a->size * t->size) == 0;
    for (size_t i = 0; i < a->size; i++) {
        if (!t->equal(a->data() + i * t->size, b->data() + i * t->size))
            return false;
    }
    return true;
}

void __destruct(__Array_Rep* rep) {
    if (!rep)
        return;
    _destruct_n(rep->traits, rep->data(), rep->size);
    std::free(rep);
}

}  // namespace CPTA
