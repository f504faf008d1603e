// TaskTrace: the tasks of a queue as events of a trace, by kind. Neighbours of one kind become one event with their
// count, so that thousands of requests stay readable and cheap, unless kReading of them take longer than kShort.
// Owner:  the queue's loop, on its stack. Destruction adds what is pending.
// Cost:   one reading of the clock for each change of kind, and for each kReading tasks: reading it takes as long as
//         everything else together. A queue makes one only while a trace is on.
#pragma once

#include "moka/base/Trace.h"

#include <typeinfo>

namespace Moka {

class ITask;

namespace detail {

class TaskTrace {
public:
    static constexpr std::int64_t kShort = 100'000; // nanoseconds
    static constexpr std::uint64_t kReading = 8;    // tasks

    TaskTrace() { Trace::TakeTaskName(); }
    ~TaskTrace() { AddPending(); }
    TaskTrace(TaskTrace const&) = delete;
    TaskTrace& operator=(TaskTrace const&) = delete;

    // Around running and freeing a task.
    void Begin(ITask const& task);
    void End();
    // Adds the event of the tasks since the last one.
    void AddPending();

private:
    void ReadClock();
    void Add(std::uint64_t count);

    std::type_info const* mType = nullptr; // of the task at hand, and of the pending ones
    char const* mName = nullptr;           // as the pending tasks named themselves, or null
    std::uint64_t mCount = 0;              // pending
    std::uint64_t mUnread = 0;             // of these, those since the clock was read
    std::int64_t mBegin = 0;               // of the pending ones
    std::int64_t mLast = Trace::GetTime(); // when the clock was read, between two tasks
};

} // namespace detail
} // namespace Moka
