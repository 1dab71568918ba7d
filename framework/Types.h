// Scalar types of the CIM model and their type codes.
#ifndef CPTA_FRAMEWORK_TYPES_H
#define CPTA_FRAMEWORK_TYPES_H

#include <cstddef>
#include <cstdint>

namespace CPTA {

typedef bool boolean;
typedef uint8_t uint8;
typedef int8_t sint8;
typedef uint16_t uint16;
typedef int16_t sint16;
typedef uint32_t uint32;
typedef int32_t sint32;
typedef uint64_t uint64;
typedef int64_t sint64;
typedef float real32;
typedef double real64;

// A 16-bit character code, compared and copied as that number.
struct char16 {
    uint16 code;

    char16() : code(0) {}
    char16(uint16 c) : code(c) {}
    operator uint16() const { return code; }
};

inline bool operator==(char16 a, char16 b) {
    return a.code == b.code;
}
inline bool operator!=(char16 a, char16 b) {
    return a.code != b.code;
}

// The CIM scalar type of a property or parameter.
enum Type {
    BOOLEAN = 0,
    UINT8 = 1,
    SINT8 = 2,
    UINT16 = 3,
    SINT16 = 4,
    UINT32 = 5,
    SINT32 = 6,
    UINT64 = 7,
    SINT64 = 8,
    REAL32 = 9,
    REAL64 = 10,
    CHAR16 = 11,
    STRING = 12,
    DATETIME = 13
};

const int NUM_TYPES = 14;

}  // namespace CPTA

#endif
