/// AndroidLog.h: the one way this tree logs, __android_log_print. On Android it is the system's; elsewhere the
/// library built from this folder supplies the symbol and writes "LEVEL tag: text" to stderr.
/// Thread: any. A line is written in one piece. Cost: a format and a write; never called on a hot path.
#pragma once

#ifdef __ANDROID__
#include <android/log.h>
#else
#include "moka/base/Export.h"

/// The priorities that are used; the numbers are the platform's.
enum android_LogPriority {
    ANDROID_LOG_DEBUG = 3,
    ANDROID_LOG_INFO = 4,
    ANDROID_LOG_WARN = 5,
    ANDROID_LOG_ERROR = 6,
    ANDROID_LOG_FATAL = 7,
};

/// Returns the number of bytes written. A null tag or format is written as "(null)".
extern "C" MOKA_API int __android_log_print(int priority, char const* tag, char const* format, ...)
    __attribute__((format(printf, 3, 4)));
#endif
