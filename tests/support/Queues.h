// Queues.h: queues for tests, which run tasks when the test says so, or refuse them.
#pragma once

#include "moka/graphics/task/IGLMsgQueue.h"
#include "moka/graphics/task/ITask.h"

#include <deque>
#include <functional>
#include <memory>
#include <mutex>

namespace Moka::Testing {

// HandPumpedQueue: only stores tasks, until a thread of the test's choice runs them.
// Owner:  the test; tasks never run are freed with the queue.
// Thread: any operation from any thread; one thread at a time runs tasks. No lock is held while one runs.
// Fails:  an exception out of a task reaches the caller of Run...; the task is freed and counts as run.
class HandPumpedQueue : public IGLMsgQueue {
public:
    // Whether the next task is refused. Asked under the queue's lock: it must not use the queue.
    using Predicate = std::function<bool()>;

    explicit HandPumpedQueue(Predicate refuses = {}) : mRefuses(std::move(refuses)) {}

    // A null task is accepted and forgotten.
    bool Post(ITask* task) override;

    // Runs everything on the calling thread, which stands for both sides. Called from inside a task, it is
    // the deadlock that a real queue would have: nothing runs, and it is not counted.
    void WaitForTasks() override;

    bool RunOne(); // false when nothing is stored
    int RunAll();  // also what the tasks post; returns how many

    int GetPendingCount() const { return GetPostedCount() - GetRunCount(); }
    int GetPostedCount() const { return Read(mPosted); } // accepted tasks
    int GetRunCount() const { return Read(mRun); }
    int GetWaitCount() const { return Read(mWaits); }

protected:
    // Around each task.
    virtual void BeforeRun() {}
    virtual void AfterRun() {}

private:
    int Read(int const& count) const {
        std::lock_guard<std::mutex> lock(mMutex);
        return count;
    }
    std::unique_ptr<ITask> TakeFirst();

    Predicate const mRefuses;
    std::mutex mutable mMutex;
    std::deque<std::unique_ptr<ITask>> mTasks;
    int mRun = 0;
    int mPosted = 0;
    int mWaits = 0;
};

} // namespace Moka::Testing
