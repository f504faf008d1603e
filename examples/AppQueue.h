// AppQueue: the queue of an application that owns the GL context itself. Any thread may post. The thread of
// the context calls Run() while the context is current.
// On the thread of the context, WaitForTasks() runs the queued tasks.
#pragma once

#include "moka/graphics/task/IGLMsgQueue.h"
#include "moka/graphics/task/ITask.h"

#include <condition_variable>
#include <memory>
#include <mutex>
#include <thread>

namespace Examples {

class AppQueue final : public Moka::IGLMsgQueue {
public:
    bool Post(Moka::ITask* task) override {
        if (!task) return false;
        std::lock_guard<std::mutex> const lock(mMutex);
        task->next = nullptr;
        (mLast ? mLast->next : mFirst) = task;
        mLast = task;
        ++mPosted;
        return true;
    }

    void WaitForTasks() override {
        if (std::this_thread::get_id() == mOwner) return Run();
        std::unique_lock<std::mutex> lock(mMutex);
        mChanged.wait(lock, [this, target = mPosted] { return mDone >= target; });
    }

    // Runs all tasks in posting order, including those that tasks post. Call it on the thread that created
    // the queue, with the context current. The lock is not held while a task runs.
    void Run() {
        while (std::unique_ptr<Moka::ITask> task{Take()}) {
            task->run();
            task.reset();
            std::lock_guard<std::mutex> const lock(mMutex);
            ++mDone;
            mChanged.notify_all();
        }
    }

private:
    Moka::ITask* Take() {
        std::lock_guard<std::mutex> const lock(mMutex);
        Moka::ITask* const task = mFirst;
        if (task) mFirst = task->next;
        if (!mFirst) mLast = nullptr;
        return task;
    }

    std::thread::id const mOwner = std::this_thread::get_id();
    std::mutex mMutex;
    std::condition_variable mChanged;
    Moka::ITask* mFirst = nullptr;
    Moka::ITask* mLast = nullptr;
    unsigned long long mPosted = 0;
    unsigned long long mDone = 0;
};

} // namespace Examples
