/// Trace: records the work of each thread and its duration, in a file in the JSON event format that
/// Perfetto and Chrome's about:tracing read. One trace at a time in a process, off until started.
/// Thread:  any. A row of the picture is a thread, under the name that the system has for it.
/// Units:   the file counts microseconds from the start of the trace; times here are nanoseconds of the
///          steady clock.
/// Cost:    off, one relaxed load for each event. On, two readings of the clock and a short lock; whichever
///          thread fills the buffer, or finds it older than half a second, writes it out.
/// Text:    every `char const*` must stay valid until the trace has stopped; string literals do.
/// Fails:   a file that cannot be opened is false with the reason. When writing fails later, one warning is
///          logged, the file is cut after the last event that fits, and tracing stops; the program goes on.
/// Lost:    nothing that ended before Stop() or the normal end of the process. A scope that is open then is
///          not in the file, nor are the last tasks of one kind of a queue that is at work.
#pragma once

#include "moka/base/Export.h"

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <string>

namespace Moka {

/// A named number or text of an event.
struct TraceArgument {
    /// The name, and the number unless text is set.
    char const* key;
    std::int64_t number;
    char const* text; ///< in the place of the number unless null
};

class MOKA_API Trace {
public:
    /// The most arguments of one event.
    static constexpr int kMaxArguments = 4;

    /// Replaces the file. False, with the reason, when it cannot be opened or a trace is running. error may
    /// be null.
    static bool Start(std::string const& path, std::string* error);
    /// Writes the remaining events and closes the file. False, with the reason, when a part could not be
    /// written. Without a trace it does nothing: true. The end of the process stops the trace, too.
    static bool Stop(std::string* error);

    /// Whether a trace is running.
    static bool IsOn() noexcept { return theIsOn.load(std::memory_order_relaxed); }

    /// Nanoseconds of the steady clock.
    static std::int64_t GetTime() noexcept;
    /// An event of this thread. Ignored when it began before the trace. Of more arguments than kMaxArguments
    /// the first are taken.
    static void Add(char const* category, char const* name, std::int64_t begin, std::int64_t end,
                    TraceArgument const* arguments, std::size_t count) noexcept;

    /// Names the task that this thread runs, for the queue that runs it. The first name counts.
    static void NameTask(char const* name) noexcept {
        if (IsOn()) SetTaskName(name);
    }
    /// The name given since the last call, or null. Changed: when it was given, if it differs from the name before.
    struct TaskName {
        char const* name;
        std::int64_t changed;
    };
    static TaskName TakeTaskName() noexcept;

private:
    static void SetTaskName(char const* name) noexcept;
    static std::atomic<bool> theIsOn;
};

/// An event from here to the end of the scope.
class TraceScope {
public:
    // cppcheck-suppress uninitMemberVar ; only mIsOn is written while the trace is off
    /// Begins the event.
    TraceScope(char const* category, char const* name) noexcept : TraceScope(Trace::IsOn(), category, name) {}
    /// The same with an argument.
    TraceScope(char const* category, char const* name, char const* key, std::uint64_t number) noexcept
        : TraceScope(category, name) {
        Set(key, number);
    }
    ~TraceScope() {
        if (mIsOn) Trace::Add(mCategory, mName, mBegin, Trace::GetTime(), mArguments, mCount);
    }
    TraceScope(TraceScope const&) = delete;
    TraceScope& operator=(TraceScope const&) = delete;

    /// Adds an argument.
    void Set(char const* key, std::uint64_t number) noexcept {
        Append({key, static_cast<std::int64_t>(number), nullptr});
    }
    void Set(char const* key, char const* text) noexcept { Append({key, 0, text}); }

private:
    // cppcheck-suppress uninitMemberVarPrivate ; only mIsOn is written while the trace is off
    TraceScope(bool isOn, char const* category, char const* name) noexcept : mIsOn(isOn) {
        if (!isOn) return;
        mCategory = category;
        mName = name;
        mCount = 0;
        mBegin = Trace::GetTime();
    }

    void Append(TraceArgument const& argument) noexcept {
        if (mIsOn && mCount < Trace::kMaxArguments) mArguments[mCount++] = argument;
    }

    bool const mIsOn;
    char const* mCategory;
    char const* mName;
    std::size_t mCount;
    std::int64_t mBegin;
    TraceArgument mArguments[Trace::kMaxArguments];
};

} // namespace Moka
