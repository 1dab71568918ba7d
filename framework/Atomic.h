// Reference counts shared between threads: plain 32-bit words changed only
// through these atomic helpers, so that the records holding them can stay
// plain structures.
#ifndef CPTA_FRAMEWORK_ATOMIC_H
#define CPTA_FRAMEWORK_ATOMIC_H

#include "framework/Types.h"

namespace CPTA {

inline void atomic_inc(uint32* count) {
    __atomic_add_fetch(count, 1, __ATOMIC_RELAXED);
}

// Returns true when the count dropped to zero; the caller then owns the
// last reference and frees the object.
inline bool atomic_dec_and_test(uint32* count) {
    return __atomic_sub_fetch(count, 1, __ATOMIC_ACQ_REL) == 0;
}

inline uint32 atomic_get(const uint32* count) {
    return __atomic_load_n(count, __ATOMIC_ACQUIRE);
}

inline void atomic_set(uint32* count, uint32 value) {
    __atomic_store_n(count, value, __ATOMIC_RELEASE);
}

}  // namespace CPTA

#endif
