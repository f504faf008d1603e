/// Trace: records the work of each thread and its duration, in a file in the JSON event format that
/// Perfetto and Chrome's about:tracing read. One trace at a time in a process, off until started.
/// Thread:  any. The viewers show one row for each thread, with the thread's system name.
/// Units:   the file has microseconds since the start of the trace; times here are nanoseconds of the steady
///          clock.
/// Cost:    while it is off, one relaxed load for each event. While it is on, the clock is read twice, and a
///          lock is held briefly. The thread that fills the buffer, or finds it older than half a second,
///          writes it to the file.
/// Text:    every `char const*` must stay valid until the trace has stopped, as string literals do.
/// Fails:   Start returns false and the reason if the file cannot be opened. If writing fails later, it logs
///          a warning, truncates the file after the last event that fits, and stops tracing.
/// Lost:    scopes that are still open at Stop() or at the exit of the process, and the last tasks, all of one
///          kind, of a queue that still runs. All earlier events are in the file.
#pragma once

#include "moka/base/Export.h"

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <string>

namespace Moka {

/// An argument of an event: a name with a number or a text.
struct TraceArgument {
    /// The name, and the number.
    char const* key;
    std::int64_t number;
    char const* text; ///< replaces the number unless it is null
};

class MOKA_API Trace {
public:
    /// The most arguments of one event.
    static constexpr int kMaxArguments = 4;

    /// Starts a trace, and replaces the file. Returns false and sets *error if the file cannot be opened or a
    /// trace is running. error may be null.
    static bool Start(std::string const& path, std::string* error);
    /// Writes the remaining events and closes the file. Returns false and sets *error if a part could not be
    /// written. Without a trace it does nothing and returns true. The normal exit of the process stops the
    /// trace as well.
    static bool Stop(std::string* error);

    /// True while a trace is running.
    static bool IsOn() noexcept { return theIsOn.load(std::memory_order_relaxed); }

    /// Nanoseconds of the steady clock.
    static std::int64_t GetTime() noexcept;
    /// Adds an event of this thread. Ignores it if it began before the trace. Uses the first kMaxArguments
    /// arguments.
    static void Add(char const* category, char const* name, std::int64_t begin, std::int64_t end,
                    TraceArgument const* arguments, std::size_t count) noexcept;

    /// Sets the name of the task that this thread is running, for the queue. The first call of a task counts.
    static void NameTask(char const* name) noexcept {
        if (IsOn()) SetTaskName(name);
    }
    /// A task's name and the time at which it became the name.
    struct TaskName {
        char const* name;     ///< the name that was set since the last call, or null
        std::int64_t changed; ///< the time at which it was set, if it differs from the previous name
    };
    /// Returns the name that was set since the last call. A queue calls it after each task.
    static TaskName TakeTaskName() noexcept;

private:
    [[gnu::cold]] static void SetTaskName(char const* name) noexcept;
    static std::atomic<bool> theIsOn;
};

/// Adds an event that lasts from the constructor to the destructor.
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
