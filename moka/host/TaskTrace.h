// TaskTrace: the tasks of a queue as events of a trace, by kind. Neighbours of one kind that take less than
// kShort each become one event with their count, so that thousands of requests stay readable and cheap.
// Owner:  the queue's loop, on its stack. Destruction adds what is pending.
// Cost:   one reading of the clock for each task. A queue makes one only while a trace is on.
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

    // Around running and freeing a task.
    void Begin(ITask const& task);
    void End();
    // Adds the event of the tasks since the last one.
    void AddPending();

private:
    std::type_info const* mType = nullptr; // of the task at hand
    std::type_info const* mPendingType = nullptr;
    char const* mPendingName = nullptr; // as the task named itself, or null
    std::uint64_t mCount = 0;           // pending
    std::int64_t mPendingBegin = 0;
    std::int64_t mLast = Trace::GetTime(); // end of the last task, which is the beginning of the next
};

} // namespace detail
} // namespace Moka
