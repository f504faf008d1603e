#include "moka/base/log/AndroidLog.h"

#include "moka/base/log/LogSink.h"

#include <atomic>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <mutex>
#include <string>
#include <utility>

namespace Moka {
namespace {

// The mutex is recursive, so that a sink may log. The line of a sink goes to stderr, by the depth.
struct SinkSlot {
    std::recursive_mutex mutex;
    LogSink sink;
    int depth = 0;
};

// Never destroyed, because destructors of other static objects log.
SinkSlot& Slot() {
    static SinkSlot& slot = *new SinkSlot;
    return slot;
}

std::atomic<int> lowestPriority{ANDROID_LOG_INFO};
std::atomic<bool> hasSink{false};

char LevelOf(int priority) {
    switch (priority) {
    case ANDROID_LOG_DEBUG:
        return 'D';
    case ANDROID_LOG_INFO:
        return 'I';
    case ANDROID_LOG_WARN:
        return 'W';
    case ANDROID_LOG_ERROR:
        return 'E';
    case ANDROID_LOG_FATAL:
        return 'F';
    default:
        return 'V';
    }
}

std::string Format(char const* format, va_list arguments) {
    // Long enough for most lines.
    char brief[256];
    va_list again;
    va_copy(again, arguments);
    // NOLINTBEGIN(clang-analyzer-valist.Uninitialized): the caller and va_copy initialise them
    int const length = std::vsnprintf(brief, sizeof brief, format, arguments);
    std::size_t const size = length > 0 ? static_cast<std::size_t>(length) : 0;
    std::string text;
    if (size < sizeof brief) {
        text.assign(brief, size);
    } else {
        text.resize(size);
        std::vsnprintf(text.data(), size + 1, format, again);
    }
    // NOLINTEND(clang-analyzer-valist.Uninitialized)
    va_end(again);
    return text;
}

bool GiveToSink(LogLine const& line) {
    SinkSlot& slot = Slot();
    std::lock_guard<std::recursive_mutex> const lock(slot.mutex);
    if (!slot.sink || slot.depth > 0) return false;
    LogSink const sink = slot.sink; // the sink may replace itself
    ++slot.depth;
    bool taken = true;
    try {
        sink(line);
    } catch (...) {
        taken = false; // logging must not throw, so the line goes to stderr
    }
    --slot.depth;
    return taken;
}

int WriteToStderr(int priority, char const* tag, std::string const& text) {
    std::string whole;
    whole.reserve(std::strlen(tag) + text.size() + 5);
    whole.append(1, LevelOf(priority)).append(1, ' ').append(tag).append(": ");
    whole.append(text).append(1, '\n');
    // One call, because stderr is not buffered: formatted output could be written in pieces.
    return static_cast<int>(std::fwrite(whole.data(), 1, whole.size(), stderr));
}

int Print(int priority, char const* tag, char const* format, va_list arguments) {
    bool const isSeen = priority >= lowestPriority;
    if (!hasSink) return isSeen ? WriteToStderr(priority, tag, Format(format, arguments)) : 0;
    LogLine const line{priority, tag, format, Format(format, arguments)};
    if (GiveToSink(line)) return static_cast<int>(line.text.size());
    return isSeen ? WriteToStderr(priority, tag, line.text) : 0;
}

} // namespace

LogSink SetLogSink(LogSink sink) {
    SinkSlot& slot = Slot();
    std::lock_guard<std::recursive_mutex> lock(slot.mutex);
    std::swap(slot.sink, sink);
    hasSink = static_cast<bool>(slot.sink);
    return sink;
}

void SetLogPriority(int lowest) { lowestPriority = lowest; }

} // namespace Moka

extern "C" int __android_log_print(int priority, char const* tag, char const* format, ...) {
    if (!tag) tag = "(null)";
    if (!format) format = "(null)";
    va_list arguments;
    va_start(arguments, format);
    int written = 0;
    try {
        written = Moka::Print(priority, tag, format, arguments);
    } catch (...) { // out of memory: write the format, which needs none
        written = std::fprintf(stderr, "%c %s: %s\n", Moka::LevelOf(priority), tag, format);
    }
    va_end(arguments);
    return written;
}
