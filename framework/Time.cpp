#include "framework/Time.h"

#include <sys/select.h>
#include <sys/time.h>

namespace CPTA {

uint64 Time::now() {
    struct timeval tv;
    if (gettimeofday(&tv, nullptr) != 0)
        return 0;
    return uint64(tv.tv_sec) * SEC + uint64(tv.tv_usec);
}

void Time::sleep(uint64 usec) {
    struct timeval tv;
    tv.tv_sec = time_t(usec / SEC);
    tv.tv_usec = suseconds_t(usec % SEC);
    select(0, nullptr, nullptr, nullptr, &tv);
}

}  // namespace CPTA
