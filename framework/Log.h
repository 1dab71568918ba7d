// The process-wide log.
//
// Logging is off unless $HOME/.cimplerc holds a line LOG_LEVEL=<level>; then
// every message at or above that severity is appended, time-stamped, to
// $HOME/.cimple/messages under an advisory lock on $HOME/.cimple/messages.lock.
#ifndef CPTA_FRAMEWORK_LOG_H
#define CPTA_FRAMEWORK_LOG_H

#include <atomic>
#include <cstdarg>

#include "framework/String.h"

namespace CPTA {

// Severity: a message is written when its level is not greater than the
// configured one.
enum Log_Level { LL_FATAL = 0, LL_ERR = 1, LL_WARN = 2, LL_INFO = 3, LL_DBG = 4 };

const int NUM_LOG_LEVELS = 5;

// "FATAL", "ERR", "WARN", "INFO", "DBG".
extern const char* const _log_level_strings[NUM_LOG_LEVELS];

// Whether the conversion warnings of the CMPI layer are issued (log() itself
// does not look at it). Initially true.
extern std::atomic<bool> _log_enabled_state;

// Writes one message; file and line name the caller's source position.
void log(Log_Level level, const char* file, int line, const char* format, ...)
    __attribute__((format(printf, 4, 5)));
void vlog(Log_Level level, const char* file, int line, const char* format, va_list ap)
    __attribute__((format(printf, 4, 0)));

// Whether a message at `level` would be written (reads the configuration
// as a message would). For callers that must prepare what they log.
bool log_enabled(Log_Level level);

// Sets the level by name (case-insensitive): 0, or -1 for an unknown name.
int log_set_level(const String& name);

// Stores the flag of _log_enabled_state: -1 when it already had that value.
int log_enable(bool flag);

// Releases the files; the next message reads the configuration again.
void close_log();

// A source position and level waiting for a message.
struct Log_Call_Frame {
    Log_Level level;
    const char* file;
    int line;

    Log_Call_Frame(Log_Level level_, const char* file_, int line_)
        : level(level_), file(file_), line(line_) {}

    void invoke(const char* format, ...) __attribute__((format(printf, 2, 3)));
};

}  // namespace CPTA

#if defined(__FILE_NAME__)
#define TVRN_SOURCE_FILE __FILE_NAME__
#else
#define TVRN_SOURCE_FILE __FILE__
#endif

// Logs with the caller's source file name and line.
#define TVRN_LOG(level, fmt, ...) ::CPTA::log(level, TVRN_SOURCE_FILE, __LINE__, fmt, ##__VA_ARGS__)

// A conversion warning: logged at LL_WARN, only while _log_enabled_state holds.
#define TVRN_WARN(fmt, ...)                                                     \
    do {                                                                        \
        if (::CPTA::_log_enabled_state)                                         \
            ::CPTA::Log_Call_Frame(::CPTA::LL_WARN, TVRN_SOURCE_FILE, __LINE__) \
                .invoke(fmt, ##__VA_ARGS__);                                    \
    } while (0)

#endif
