// TaskTrace: records the tasks of a queue as events of a trace, named by kind. Consecutive tasks of one kind
// become one event with their count, unless kReading of them take longer than kShort. So thousands of
// requests stay readable and cheap.
// Owner:  the queue's loop, on its stack. The destructor adds the pending event.
// Cost:   reads the clock at each change of kind and after each kReading tasks; a reading takes as long as
//         the rest of the work. A queue creates one only while a trace is on.
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

    // Call these before and after running and deleting a task.
    void Begin(ITask const& task);
    void End();
    // Adds an event for the pending tasks.
    void AddPending();

private:
    void ReadClock();
    void Add(std::uint64_t count);

    std::type_info const* mType = nullptr; // of the current and the pending tasks
    char const* mName = nullptr;           // the name that the pending tasks have set, or null
    std::uint64_t mCount = 0;              // the number of pending tasks
    std::uint64_t mUnread = 0;             // the number of pending tasks since the clock was read
    std::int64_t mBegin = 0;               // the beginning of the pending tasks
    std::int64_t mLast = Trace::GetTime(); // when the clock was read, between two tasks
};

} // namespace detail
} // namespace Moka
