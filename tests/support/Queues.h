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
    HandPumpedQueue() = default;
    ~HandPumpedQueue() override;
    HandPumpedQueue(HandPumpedQueue const&) = delete;
    HandPumpedQueue& operator=(HandPumpedQueue const&) = delete;

    // Always true. A null task is counted and forgotten.
    bool Post(ITask* task) override;

    // Runs everything on the calling thread, which stands for both sides. Called from inside a task, it is
    // the deadlock that a real queue would have: nothing runs, and it is not counted.
    void WaitForTasks() override;

    // Calls around each run, so that a test can declare its thread the render thread meanwhile.
    void SetAroundRun(std::function<void()> before, std::function<void()> after);

    bool RunOne(); // false when nothing is stored
    int RunAll();  // also what the tasks post; returns how many

    int GetPendingCount() const {
        return Read([this] { return static_cast<int>(mTasks.size()); });
    }
    int GetPostedCount() const {
        return Read([this] { return mOffered - mRefused; });
    } // accepted tasks
    int GetNullCount() const {
        return Read([this] { return mNull; });
    }
    int GetRunCount() const {
        return Read([this] { return mRun; });
    }
    int GetRefusedCount() const {
        return Read([this] { return mRefused; });
    } // by a derived queue
    int GetWaitCount() const {
        return Read([this] { return mWaits; });
    }

protected:
    // Whether a task is accepted; ordinal counts the tasks offered, from 1. Called under the lock.
    virtual bool Accepts(int ordinal, ITask* task);

private:
    template <class Value>
    int Read(Value const& value) const {
        std::lock_guard<std::mutex> lock(mMutex);
        return value();
    }
    std::unique_ptr<ITask> TakeFirst();

    std::mutex mutable mMutex;
    std::deque<std::unique_ptr<ITask>> mTasks;
    int mOffered = 0;
    int mNull = 0;
    int mRun = 0;
    int mRefused = 0;
    int mWaits = 0;
    std::function<void()> mBeforeRun;
    std::function<void()> mAfterRun;
};

// RefusingQueue: refuses every task, or those that a test chooses; the others it stores like its base.
class RefusingQueue final : public HandPumpedQueue {
public:
    using Predicate = std::function<bool(int ordinal, ITask* task)>;

    // Refuses where the predicate says so. It is called under the queue's lock and must not use the queue.
    explicit RefusingQueue(Predicate refuses = [](int, ITask*) { return true; })
        : mRefuses(std::move(refuses)) {}

protected:
    bool Accepts(int ordinal, ITask* task) override { return !mRefuses(ordinal, task); }

private:
    Predicate mRefuses;
};

} // namespace Moka::Testing
