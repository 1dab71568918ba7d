// Traces and fatal assertions, written to standard error.
#ifndef CPTA_FRAMEWORK_ASSERT_H
#define CPTA_FRAMEWORK_ASSERT_H

namespace CPTA {

// Writes "TRACE: file(line): function".
void __cimple_trace(const char* file, int line, const char* function);

// Writes "file(line): function(): assert: condition" and aborts the process.
[[noreturn]] void __cimple_assert(const char* file, int line, const char* function,
                                  const char* condition);

}  // namespace CPTA

// Always checked: the conditions guard states that cannot be recovered from.
#define CPTA_ASSERT(COND)                                                 \
    do {                                                                  \
        if (!(COND))                                                      \
            ::CPTA::__cimple_assert(__FILE__, __LINE__, __func__, #COND); \
    } while (0)

#define CPTA_TRACE ::CPTA::__cimple_trace(__FILE__, __LINE__, __func__)

#endif
