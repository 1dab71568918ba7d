#include "framework/String.h"

#include <cctype>
#include <cstdlib>
#include <cstring>
#include <new>
#include <stdexcept>

#include "framework/Atomic.h"

namespace CPTA {

// The count starts at 2 so that the representation never looks unshared and
// is never modified in place; it is never counted or freed either.
String_Rep String::_empty = {2, 0, 0, {0}};

namespace {

const size_t MAX_STRING_SIZE = 0x7FFFFFFF;

// Capacity for n bytes: 32 below 32, otherwise the next power of two.
size_t _next_pow_2(size_t n) {
    if (n > MAX_STRING_SIZE)
        throw std::length_error("String too long");
    if (n < 32)
        return 32;
    size_t p = 32;
    while (p < n)
        p <<= 1;
    return p;
}

String_Rep* _new_rep(size_t cap) {
    void* p = std::malloc(offsetof(String_Rep, data) + cap + 1);
    if (!p)
        throw std::bad_alloc();
    String_Rep* rep = static_cast<String_Rep*>(p);
    rep->refs = 1;
    rep->size = 0;
    rep->cap = uint32(cap);
    rep->data[0] = '\0';
    return rep;
}

bool _eqi(const char* a, const char* b, size_t n) {
    for (size_t i = 0; i < n; i++) {
        if (std::tolower(static_cast<unsigned char>(a[i])) !=
            std::tolower(static_cast<unsigned char>(b[i])))
            return false;
    }
    return true;
}

}  // namespace

struct String_Access {
    static void ref(String_Rep* rep) {
        if (rep != &String::_empty)
            atomic_inc(&rep->refs);
    }

    static void unref(String_Rep* rep) {
        if (rep != &String::_empty && atomic_dec_and_test(&rep->refs))
            std::free(rep);
    }

    static bool unshared(const String_Rep* rep) {
        return rep != &String::_empty && atomic_get(&rep->refs) == 1;
    }

    // A new representation holding s1 (n1 bytes) followed by s2 (n2 bytes),
    // with room for at least min_cap bytes.
    static String_Rep* make(const char* s1, size_t n1, const char* s2, size_t n2,
                            size_t min_cap = 0) {
        if (n1 > MAX_STRING_SIZE || n2 > MAX_STRING_SIZE - n1)
            throw std::length_error("String too long");
        size_t n = n1 + n2;
        if (n == 0 && min_cap == 0)
            return &String::_empty;
        String_Rep* rep = _new_rep(_next_pow_2(n > min_cap ? n : min_cap));
        if (n1)
            std::memcpy(rep->data, s1, n1);
        if (n2)
            std::memcpy(rep->data + n1, s2, n2);
        rep->size = uint32(n);
        rep->data[n] = '\0';
        return rep;
    }

    // Gives s its own representation with room for at least cap bytes.
    static void unshare(String& s, size_t cap) {
        String_Rep* old = s._rep;
        if (unshared(old) && old->cap >= cap)
            return;
        s._rep = make(old->data, old->size, nullptr, 0, cap > old->cap ? cap : old->cap);
        unref(old);
    }
};

String::String() : _rep(&_empty) {}

String::String(const String& x) : _rep(x._rep) {
    String_Access::ref(_rep);
}

String::String(String&& x) noexcept : _rep(x._rep) {
    x._rep = &_empty;
}

String::String(const char* s) : _rep(String_Access::make(s, s ? std::strlen(s) : 0, nullptr, 0)) {}

String::String(const char* s, size_t n) : _rep(String_Access::make(s, s ? n : 0, nullptr, 0)) {}

String::String(const char* s1, const char* s2)
    : _rep(String_Access::make(s1, s1 ? std::strlen(s1) : 0, s2, s2 ? std::strlen(s2) : 0)) {}

String::String(const char* s1, const char* s2, const char* s3) : _rep(&_empty) {
    size_t n1 = s1 ? std::strlen(s1) : 0;
    size_t n2 = s2 ? std::strlen(s2) : 0;
    size_t n3 = s3 ? std::strlen(s3) : 0;
    if (n1 + n2 + n3 == 0)
        return;
    _rep = String_Access::make(s1, n1, s2, n2, n1 + n2 + n3);
    append(s3, n3);
}

String::~String() {
    String_Access::unref(_rep);
}

String& String::operator=(const String& x) {
    assign(x);
    return *this;
}

String& String::operator=(String&& x) noexcept {
    if (this != &x) {
        String_Access::unref(_rep);
        _rep = x._rep;
        x._rep = &_empty;
    }
    return *this;
}

String& String::operator=(const char* s) {
    assign(s);
    return *this;
}

uint32 String::ref_count() const {
    return atomic_get(&_rep->refs);
}

void String::set(size_t i, char c) {
    if (i >= _rep->size)
        return;
    String_Access::unshare(*this, _rep->cap);
    _rep->data[i] = c;
}

void String::assign(const String& x) {
    if (x._rep == _rep)
        return;
    String_Access::ref(x._rep);
    String_Access::unref(_rep);
    _rep = x._rep;
}

void String::assign(const char* s) {
    assign(s, s ? std::strlen(s) : 0);
}

void String::assign(const char* s, size_t n) {
    if (!s)
        n = 0;
    if (String_Access::unshared(_rep) && _rep->cap >= n) {
        std::memmove(_rep->data, s, n);
        _rep->size = uint32(n);
        _rep->data[n] = '\0';
        return;
    }
    // s may point into the old representation: copy before releasing it.
    String_Rep* old = _rep;
    _rep = String_Access::make(s, n, nullptr, 0);
    String_Access::unref(old);
}

void String::append(char c) {
    if (String_Access::unshared(_rep) && _rep->size < _rep->cap) {
        _rep->data[_rep->size++] = c;
        _rep->data[_rep->size] = '\0';
        return;
    }
    size_t cap = _rep->cap ? _next_pow_2(size_t(_rep->cap) * 2) : 32;
    String_Rep* old = _rep;
    _rep = String_Access::make(old->data, old->size, &c, 1, cap);
    String_Access::unref(old);
}

void String::append(const char* s) {
    if (s)
        append(s, std::strlen(s));
}

void String::append(const char* s, size_t n) {
    if (!s || n == 0)
        return;
    if (n > MAX_STRING_SIZE - _rep->size)
        throw std::length_error("String too long");
    size_t size = _rep->size + n;
    if (String_Access::unshared(_rep) && _rep->cap >= size) {
        std::memmove(_rep->data + _rep->size, s, n);
        _rep->size = uint32(size);
        _rep->data[size] = '\0';
        return;
    }
    // s may point into the old representation: copy before releasing it.
    String_Rep* old = _rep;
    _rep = String_Access::make(old->data, old->size, s, n, size);
    String_Access::unref(old);
}

void String::append(const String& x) {
    // Keeps x's representation alive even when x is this string.
    String keep(x);
    append(keep.c_str(), keep.size());
}

void String::reserve(size_t n) {
    if (n == 0 && _rep->size == 0)
        return;
    String_Access::unshare(*this, n);
}

void String::clear() {
    if (_rep->size == 0)
        return;
    if (String_Access::unshared(_rep)) {
        _rep->size = 0;
        _rep->data[0] = '\0';
        return;
    }
    String_Access::unref(_rep);
    _rep = &_empty;
}

void String::remove(size_t pos, size_t n) {
    size_t size = _rep->size;
    if (pos >= size)
        return;
    if (n > size - pos)
        n = size - pos;
    if (n == 0)
        return;
    String_Access::unshare(*this, _rep->cap);
    std::memmove(_rep->data + pos, _rep->data + pos + n, size - pos - n + 1);
    _rep->size = uint32(size - n);
}

String String::substr(size_t pos, size_t n) const {
    size_t size = _rep->size;
    if (pos >= size)
        return String();
    if (n > size - pos)
        n = size - pos;
    if (pos == 0 && n == size)
        return *this;
    return String(_rep->data + pos, n);
}

bool String::equal(const String& x) const {
    return x._rep == _rep || equal(x.c_str(), x.size());
}

bool String::equal(const char* s) const {
    return equal(s, s ? std::strlen(s) : 0);
}

bool String::equal(const char* s, size_t n) const {
    return _rep->size == n && (n == 0 || std::memcmp(_rep->data, s, n) == 0);
}

bool String::equal(size_t pos, const char* s, size_t n) const {
    return pos <= _rep->size && n <= _rep->size - pos &&
           (n == 0 || std::memcmp(_rep->data + pos, s, n) == 0);
}

bool String::equali(const String& x) const {
    return x._rep == _rep || equali(x.c_str(), x.size());
}

bool String::equali(const char* s) const {
    return equali(s, s ? std::strlen(s) : 0);
}

bool String::equali(const char* s, size_t n) const {
    return _rep->size == n && _eqi(_rep->data, s, n);
}

bool String::equali(size_t pos, const char* s, size_t n) const {
    return pos <= _rep->size && n <= _rep->size - pos && _eqi(_rep->data + pos, s, n);
}

size_t String::find(char c) const {
    return find(c, 0);
}

size_t String::find(char c, size_t pos) const {
    if (pos >= _rep->size)
        return npos;
    const void* p = std::memchr(_rep->data + pos, c, _rep->size - pos);
    return p ? size_t(static_cast<const char*>(p) - _rep->data) : npos;
}

static size_t _find(const char* hay, size_t hay_n, const char* needle, size_t n) {
    if (n == 0)
        return 0;
    const void* p = memmem(hay, hay_n, needle, n);
    return p ? size_t(static_cast<const char*>(p) - hay) : String::npos;
}

size_t String::find(const char* s) const {
    if (!s)
        return npos;
    return _find(_rep->data, _rep->size, s, std::strlen(s));
}

size_t String::find(const String& x) const {
    return _find(_rep->data, _rep->size, x.c_str(), x.size());
}

size_t strlcpy(char* dest, const char* src, size_t size) {
    size_t n = src ? std::strlen(src) : 0;
    if (size == 0)
        return n;
    size_t k = n < size - 1 ? n : size - 1;
    if (k)
        std::memcpy(dest, src, k);
    dest[k] = '\0';
    return n;
}

size_t strlcat(char* dest, const char* src, size_t size) {
    size_t n = src ? std::strlen(src) : 0;
    size_t d = strnlen(dest, size);
    if (d == size)
        return size + n;
    size_t room = size - d - 1;
    size_t k = n < room ? n : room;
    if (k)
        std::memcpy(dest + d, src, k);
    dest[d + k] = '\0';
    return d + n;
}

}  // namespace CPTA
