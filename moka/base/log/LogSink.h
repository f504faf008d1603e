/// LogSink.h: lets a host or a test see every log line instead of having it written to stderr. Not on Android,
/// where the system owns the log.
/// Thread: a sink is called on the thread that logs, one line at a time; it may log itself (that line goes to
///         stderr), but must not wait for another thread that logs. A line whose sink throws goes to stderr.
///         Installing and removing waits for a running call, except from inside it.
#pragma once

#include "moka/base/Export.h"

#include <functional>
#include <string>

namespace Moka {

/// One line of the log.
struct LogLine {
    int priority; ///< an android_LogPriority
    /// The tag.
    std::string tag;    //
    std::string format; ///< the format as the caller wrote it
    std::string text;   ///< the formatted line, without a line end
};

/// Receives log lines.
using LogSink = std::function<void(LogLine const&)>;

/// Replaces the sink; an empty one goes back to stderr. Returns the sink that was installed before.
MOKA_API LogSink SetLogSink(LogSink sink);

/// Lines below this priority are not written to stderr (a sink still sees them). The default is
/// ANDROID_LOG_INFO.
MOKA_API void SetLogPriority(int lowest);

} // namespace Moka
