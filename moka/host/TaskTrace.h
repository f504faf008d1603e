// TaskTrace: records the tasks of a queue as events of a trace, named by kind. Consecutive tasks of one kind
// that take less than kShort each become one event with their count, so that thousands of requests stay
// readable and cheap.
// Owner:  the queue's loop, on its stack. The destructor adds the pending event.
// Cost:   reads the clock once for each task. A queue creates one only while a trace is on.
#pragma once

#include "moka/base/Trace.h"

#include <typeinfo>

namespace Moka {

class ITask;

namespace detail {

class TaskTrace {
public:
    static constexpr std::int64_t kShort = 100'000; // nanoseconds

    TaskTrace() = default;
    ~TaskTrace() { AddPending(); }
    TaskTrace(TaskTrace const&) = delete;
    TaskTrace& operator=(TaskTrace const&) = delete;

    // Call these before and after running and deleting a task.
    void Begin(ITask const& task);
    void End();
    // Adds an event for the pending tasks.
    void AddPending();

private:
    std::type_info const* mType = nullptr; // of the current task
    std::type_info const* mPendingType = nullptr;
    char const* mPendingName = nullptr; // the name that the task has set, or null
    std::uint64_t mCount = 0;           // the number of pending tasks
    std::int64_t mPendingBegin = 0;
    std::int64_t mLast = Trace::GetTime(); // the end of the last task and the beginning of the next
};

} // namespace detail
} // namespace Moka
