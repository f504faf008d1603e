/// AndroidLog.h: declares __android_log_print, the only function that the libraries log with. On Android the
/// system defines it. On other systems the library of this folder does, and writes "LEVEL tag: text" to
/// stderr.
/// Thread: any. A line is written in one piece.
/// Cost:   formats and writes the text. Not for hot paths.
#pragma once

#ifdef __ANDROID__
#include <android/log.h>
#else
#include "moka/base/Export.h"

/// The priorities in use, with Android's numbers.
enum android_LogPriority {
    ANDROID_LOG_DEBUG = 3,
    ANDROID_LOG_INFO = 4,
    ANDROID_LOG_WARN = 5,
    ANDROID_LOG_ERROR = 6,
    ANDROID_LOG_FATAL = 7,
};

/// Returns the number of bytes written. A null tag or format is written as "(null)".
extern "C" MOKA_API int __android_log_print(int priority, char const* tag, char const* format, ...)
    __attribute__((cold, format(printf, 3, 4)));
#endif
