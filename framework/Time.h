// Clock and sleep on microsecond counts.
#ifndef CPTA_FRAMEWORK_TIME_H
#define CPTA_FRAMEWORK_TIME_H

#include "framework/Types.h"

namespace CPTA {

struct Time {
    static constexpr uint64 USEC = 1;
    static constexpr uint64 MSEC = 1000;
    static constexpr uint64 SEC = 1000000;
    static constexpr uint64 MIN = 60000000;
    static constexpr uint64 HOUR = 3600000000ULL;
    static constexpr uint64 DAY = 86400000000ULL;

    // Microseconds since the epoch, from the system clock.
    static uint64 now();

    // Waits for usec microseconds (returns early when a signal arrives).
    static void sleep(uint64 usec);
};

}  // namespace CPTA

#endif
