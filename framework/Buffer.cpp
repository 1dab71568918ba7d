#include "framework/Buffer.h"

#include <cctype>
#include <cstdlib>
#include <cstring>
#include <new>
#include <stdexcept>

namespace CPTA {

namespace {

const size_t MIN_CAPACITY = 4096;
const size_t FORMAT_ROOM = 128;
// vsnprintf reports errors (not lack of room) with a negative result, so
// more room rarely helps; stop doubling here.
const size_t MAX_FORMAT_ROOM = 65536;

size_t _capacity_for(size_t n) {
    size_t cap = MIN_CAPACITY;
    while (cap < n) {
        if (cap > (size_t(-1) >> 2))
            throw std::length_error("Buffer too long");
        cap <<= 1;
    }
    return cap;
}

template <class T>
void _append_decimal(Buffer& b, T x) {
    char digits[24];
    char* p = digits + sizeof(digits);
    do {
        *--p = char('0' + x % 10);
        x /= 10;
    } while (x);
    b.append(p, size_t(digits + sizeof(digits) - p));
}

}  // namespace

Buffer::Buffer() : _data(nullptr), _size(0), _cap(0) {}

Buffer::Buffer(const Buffer& x) : _data(nullptr), _size(0), _cap(0) {
    append(x._data, x._size);
}

Buffer& Buffer::operator=(const Buffer& x) {
    if (this != &x) {
        _size = 0;
        append(x._data, x._size);
    }
    return *this;
}

Buffer::~Buffer() {
    std::free(_data);
}

void Buffer::reserve(size_t capacity) {
    if (capacity <= _cap)
        return;
    size_t cap = _capacity_for(capacity);
    char* p = static_cast<char*>(std::realloc(_data, cap + 1));
    if (!p)
        throw std::bad_alloc();
    _data = p;
    _cap = cap;
}

void Buffer::append(char c) {
    if (_size == _cap)
        reserve(_size + 1);
    _data[_size++] = c;
}

void Buffer::append(const char* data, size_t size) {
    insert(_size, data, size);
}

void Buffer::append_uint16(uint16 x) {
    _append_decimal(*this, x);
}

void Buffer::append_uint32(uint32 x) {
    _append_decimal(*this, x);
}

void Buffer::append_uint64(uint64 x) {
    _append_decimal(*this, x);
}

int Buffer::format(const char* format, ...) {
    va_list ap;
    va_start(ap, format);
    int n = vformat(format, ap);
    va_end(ap);
    return n;
}

int Buffer::vformat(const char* format, va_list ap) {
    size_t room = FORMAT_ROOM;
    for (;;) {
        reserve(_size + room);
        // The spare byte behind the capacity takes the formatter's NUL.
        size_t avail = _cap - _size + 1;
        va_list aq;
        va_copy(aq, ap);
        int n = vsnprintf(_data + _size, avail, format, aq);
        va_end(aq);
        if (n < 0) {
            if (room >= MAX_FORMAT_ROOM)
                return -1;
            room *= 2;
            continue;
        }
        if (size_t(n) >= avail) {
            reserve(_size + size_t(n) + 1);
            va_copy(aq, ap);
            n = vsnprintf(_data + _size, _cap - _size + 1, format, aq);
            va_end(aq);
            if (n < 0)
                return -1;
        }
        _size += size_t(n);
        return n;
    }
}

void Buffer::insert(size_t pos, const char* data, size_t size) {
    if (size == 0 || !data)
        return;
    if (pos > _size)
        pos = _size;
    if (_data && data >= _data && data < _data + _cap) {
        // Growing may move the storage: insert a copy.
        Buffer tmp;
        tmp.append(data, size);
        insert(pos, tmp._data, size);
        return;
    }
    if (size > size_t(-1) / 2 - _size)
        throw std::length_error("Buffer too long");
    reserve(_size + size);
    std::memmove(_data + pos + size, _data + pos, _size - pos);
    std::memcpy(_data + pos, data, size);
    _size += size;
}

void Buffer::remove(size_t pos, size_t size) {
    if (pos >= _size)
        return;
    if (size > _size - pos)
        size = _size - pos;
    std::memmove(_data + pos, _data + pos + size, _size - pos - size);
    _size -= size;
}

const char* Buffer::c_str() {
    if (!_data)
        return "";
    _data[_size] = '\0';
    return _data;
}

void Buffer::dump(FILE* os) const {
    for (size_t line = 0; line < _size; line += 16) {
        fputs(" >", os);
        for (size_t i = 0; i < 16; i++) {
            if (line + i < _size)
                fprintf(os, " %02X", static_cast<unsigned char>(_data[line + i]));
            else
                fputs("   ", os);
            if (i % 4 == 3)
                fputc(' ', os);
        }
        fputc(' ', os);
        for (size_t i = 0; i < 16 && line + i < _size; i++) {
            unsigned char c = static_cast<unsigned char>(_data[line + i]);
            fputc(isprint(c) ? c : '.', os);
        }
        fprintf(os, " %08lX\n", static_cast<unsigned long>(line));
    }
}

}  // namespace CPTA
