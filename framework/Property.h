// Storage of one property of a model instance or one parameter of a method
// record: the value, then a one-byte null flag right behind it.
#ifndef CPTA_FRAMEWORK_PROPERTY_H
#define CPTA_FRAMEWORK_PROPERTY_H

#include "framework/Array.h"
#include "framework/Datetime.h"
#include "framework/String.h"
#include "framework/Types.h"

namespace CPTA {

template <class T>
struct Property {
    T value;
    uint8 null;

    // A free-standing property starts null; instance slots are set up by
    // create() instead, never by this constructor.
    Property() : value(), null(1) {}
    Property(const T& x) : value(x), null(0) {}

    void set(const T& x) {
        value = x;
        null = 0;
    }
    void clear() {
        value = T();
        null = 1;
    }
};

// The null flag of every slot lies directly behind the value.
static_assert(offsetof(Property<boolean>, null) == 1, "boolean slot");
static_assert(offsetof(Property<uint16>, null) == 2, "uint16 slot");
static_assert(offsetof(Property<char16>, null) == 2, "char16 slot");
static_assert(offsetof(Property<real32>, null) == 4, "real32 slot");
static_assert(offsetof(Property<uint64>, null) == 8, "uint64 slot");
static_assert(sizeof(String) == 8 && sizeof(Datetime) == 8, "one-pointer values");
static_assert(sizeof(Array<uint8>) == sizeof(void*), "one-pointer arrays");

}  // namespace CPTA

#endif
