// Messages of the conversion between CMPI data and model instances. Like the
// warnings (TVRN_WARN), they are issued only while _log_enabled_state holds.
#ifndef CPTA_CMPI_CONVERSION_LOG_H
#define CPTA_CMPI_CONVERSION_LOG_H

#include "framework/Log.h"

// A note at LL_INFO.
#define TVRN_NOTE(fmt, ...)                                                     \
    do {                                                                        \
        if (::CPTA::_log_enabled_state)                                         \
            ::CPTA::Log_Call_Frame(::CPTA::LL_INFO, TVRN_SOURCE_FILE, __LINE__) \
                .invoke(fmt, ##__VA_ARGS__);                                    \
    } while (0)

#endif
