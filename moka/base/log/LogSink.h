/// LogSink.h: passes every log line to a function of the host or a test, instead of writing it to stderr. Not
/// available on Android.
/// Thread: the sink is called on the thread that logs, one line at a time. It may log; that line goes to
///         stderr. It must not wait for another thread that logs. If the sink throws, the line goes to
///         stderr. SetLogSink waits for a running call, except inside of it.
#pragma once

#include "moka/base/Export.h"

#include <functional>
#include <string>

namespace Moka {

/// One line of the log.
struct LogLine {
    int priority;       ///< an android_LogPriority
    std::string tag;    ///< the tag
    std::string format; ///< the format string of the caller
    std::string text;   ///< the formatted line, without a line break
};

/// Receives log lines.
using LogSink = std::function<void(LogLine const&)>;

/// Installs a sink and returns the previous one. With an empty sink, lines go to stderr again.
MOKA_API LogSink SetLogSink(LogSink sink);

/// Sets the lowest priority that is written to stderr. The default is ANDROID_LOG_INFO. A sink gets all
/// lines.
MOKA_API void SetLogPriority(int lowest);

} // namespace Moka
