// Shared, copy-on-write byte string.
//
// A String is one pointer to a representation holding an atomic reference
// count, the length, the capacity and the NUL-terminated characters. Copies
// share the representation; an operation that modifies a shared string first
// makes its own copy. All empty strings share one static representation that
// is never counted or freed, so an empty string costs no allocation.
#ifndef CPTA_FRAMEWORK_STRING_H
#define CPTA_FRAMEWORK_STRING_H

#include <cstddef>

#include "framework/Types.h"

namespace CPTA {

struct String_Rep {
    uint32 refs;
    uint32 size;
    uint32 cap;
    char data[1];
};

class String {
public:
    static constexpr size_t npos = size_t(-1);

    String();
    String(const String& x);
    String(String&& x) noexcept;
    String(const char* s);  // a null pointer gives the empty string
    String(const char* s, size_t n);
    String(const char* s1, const char* s2);
    String(const char* s1, const char* s2, const char* s3);
    ~String();

    String& operator=(const String& x);
    String& operator=(String&& x) noexcept;
    String& operator=(const char* s);

    size_t size() const { return _rep->size; }
    size_t capacity() const { return _rep->cap; }
    const char* c_str() const { return _rep->data; }
    char operator[](size_t i) const { return _rep->data[i]; }

    // Replaces the byte at i; an index at or beyond the end is ignored.
    void set(size_t i, char c);

    // Shares x's representation.
    void assign(const String& x);
    // Copies the text, reusing the own representation when it is unshared
    // and large enough.
    void assign(const char* s);
    void assign(const char* s, size_t n);

    void append(char c);
    void append(const char* s);
    void append(const char* s, size_t n);
    void append(const String& x);

    void reserve(size_t n);
    void clear();
    // Removes n bytes at pos (npos: to the end); out-of-range parts are ignored.
    void remove(size_t pos, size_t n = npos);
    // The n bytes at pos (npos: the rest); empty when pos is beyond the end.
    String substr(size_t pos, size_t n = npos) const;

    bool equal(const String& x) const;
    bool equal(const char* s) const;
    bool equal(const char* s, size_t n) const;
    bool equal(size_t pos, const char* s, size_t n) const;
    bool equali(const String& x) const;
    bool equali(const char* s) const;
    bool equali(const char* s, size_t n) const;
    bool equali(size_t pos, const char* s, size_t n) const;

    // Byte position of the first match, or npos.
    size_t find(char c) const;
    size_t find(char c, size_t pos) const;
    size_t find(const char* s) const;
    size_t find(const String& x) const;

    // Whether this string uses the shared empty representation (no storage).
    bool is_static_empty() const { return _rep == &_empty; }
    // Number of String objects sharing the representation (2 for the static
    // empty one, which is never counted).
    uint32 ref_count() const;

    void swap(String& x) noexcept {
        String_Rep* t = _rep;
        _rep = x._rep;
        x._rep = t;
    }

private:
    static String_Rep _empty;
    String_Rep* _rep;

    friend struct String_Access;
};

inline bool operator==(const String& a, const String& b) {
    return a.equal(b);
}
inline bool operator==(const String& a, const char* b) {
    return a.equal(b);
}
inline bool operator==(const char* a, const String& b) {
    return b.equal(a);
}
inline bool operator!=(const String& a, const String& b) {
    return !a.equal(b);
}
inline bool operator!=(const String& a, const char* b) {
    return !a.equal(b);
}
inline bool operator!=(const char* a, const String& b) {
    return !b.equal(a);
}

// Bounded copy and concatenation into a buffer of size bytes; the result is
// always NUL-terminated (when size > 0). Both return the length of the string
// they tried to create, so a result >= size means truncation.
size_t strlcpy(char* dest, const char* src, size_t size);
size_t strlcat(char* dest, const char* src, size_t size);

}  // namespace CPTA

#endif
