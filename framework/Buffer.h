// A growable byte buffer for building text.
//
// The data is not NUL-terminated by itself, but every allocation has one
// spare byte behind the capacity so that c_str() can terminate it.
// Capacities are powers of two of at least 4096 bytes.
#ifndef CPTA_FRAMEWORK_BUFFER_H
#define CPTA_FRAMEWORK_BUFFER_H

#include <cstdarg>
#include <cstddef>
#include <cstdio>

#include "framework/Types.h"

namespace CPTA {

class Buffer {
public:
    Buffer();
    Buffer(const Buffer& x);
    Buffer& operator=(const Buffer& x);
    ~Buffer();

    void append(char c);
    void append(const char* data, size_t size);
    // Decimal digits, no padding.
    void append_uint16(uint16 x);
    void append_uint32(uint32 x);
    void append_uint64(uint64 x);

    // printf-style append; returns the number of bytes appended, or -1 when
    // the format cannot be applied (nothing is appended then).
    int format(const char* format, ...) __attribute__((format(printf, 2, 3)));
    int vformat(const char* format, va_list ap) __attribute__((format(printf, 2, 0)));

    // Inserts at pos (a pos beyond the end appends); data may point into the
    // buffer itself.
    void insert(size_t pos, const char* data, size_t size);
    // Removes size bytes at pos; parts beyond the end are ignored.
    void remove(size_t pos, size_t size);
    void reserve(size_t capacity);
    void clear() { _size = 0; }

    char* data() { return _data; }
    const char* data() const { return _data; }
    size_t size() const { return _size; }
    size_t capacity() const { return _cap; }

    // The contents, NUL-terminated in the spare byte.
    const char* c_str();

    // Hex dump: per line " >", 16 bytes in hex (a blank after every fourth),
    // the printable characters ('.' for others), then the offset.
    void dump(FILE* os = stdout) const;

private:
    char* _data;
    size_t _size;
    size_t _cap;
};

}  // namespace CPTA

#endif
