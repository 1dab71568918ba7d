#include "framework/Assert.h"

#include <cstdio>
#include <cstdlib>

namespace CPTA {

void __cimple_trace(const char* file, int line, const char* function) {
    fprintf(stderr, "TRACE: %s(%d): %s\n", file, line, function);
}

void __cimple_assert(const char* file, int line, const char* function, const char* condition) {
    fprintf(stderr, "%s(%d): %s(): assert: %s\n\n", file, line, function, condition);
    fflush(stderr);
    abort();
}

}  // namespace CPTA
