#include "moka/host/TaskQueue.h"

#include "moka/base/RunGuarded.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/task/ITask.h"
#include "moka/host/ShortLock.h"
#include "moka/host/TaskTrace.h"

#include <algorithm>
#include <memory>
#include <optional>
#include <utility>

namespace Moka {

TaskQueue::~TaskQueue() {
    {
        std::lock_guard<std::mutex> const lock(mIn.mutex);
        mIn.ended = true;
    }
    // What the tasks own may ask to wait when it dies, which nobody would end.
    mDone.consumer = std::this_thread::get_id();
    std::uint64_t done = mDone.count;
    for (ITask* task = TakeAll(); task; ++done) delete std::exchange(task, task->next);
    MarkDone(done);
    // A waiter that was just let go still uses the members.
    std::unique_lock<std::mutex> lock(mWaiters.mutex);
    mWaiters.changed.wait(lock, [this] { return mWaiters.count == 0; });
}

bool TaskQueue::Post(ITask* task) {
    if (!task) return false;
    task->next = nullptr;
    bool wake = false;
    {
        detail::ShortLock const lock(mIn.mutex);
        if (mIn.ended) return false;
        if (mIn.last) {
            mIn.last->next = task;
        } else {
            mIn.first.store(task, std::memory_order_relaxed);
        }
        mIn.last = task;
        ++mIn.posted;
        // Whoever comes next need not notify again.
        wake = std::exchange(mIn.sleeping, false);
    }
    if (wake) mIn.work.notify_one();
    return true;
}

void TaskQueue::WaitForTasks() {
    if (IsConsumerThread()) {
        __android_log_print(
            ANDROID_LOG_ERROR, "mok_log",
            "TaskQueue::WaitForTasks: called on the render thread, which cannot wait for itself");
        return;
    }
    std::uint64_t target = 0;
    {
        std::lock_guard<std::mutex> const lock(mIn.mutex);
        target = mIn.posted;
    }
    if (mDone.count >= target) return;

    TraceScope const trace("wait", "WaitForTasks");
    std::unique_lock<std::mutex> lock(mWaiters.mutex);
    ++mWaiters.count;
    for (;;) {
        mDone.target = std::min(mDone.target.load(), target);
        if (mDone.count >= target) break;
        mWaiters.changed.wait(lock);
    }
    if (--mWaiters.count == 0) mWaiters.changed.notify_all();
}

void TaskQueue::Run(std::function<void()> const& onIdle) {
    mDone.consumer = std::this_thread::get_id();
    while (ITask* const first = AwaitTasks()) {
        for (ITask* task = first; task; task = TakeSoon()) RunTasks(task);
        if (onIdle) RunGuarded("mok_log", "TaskQueue: the idle call", onIdle);
    }
    mDone.consumer = std::thread::id();
}

void TaskQueue::RequestStop() {
    bool wake = false;
    {
        std::lock_guard<std::mutex> const lock(mIn.mutex);
        mIn.stopping = true;
        wake = std::exchange(mIn.sleeping, false);
    }
    if (wake) mIn.work.notify_one();
}

bool TaskQueue::IsConsumerThread() const { return mDone.consumer == std::this_thread::get_id(); }

ITask* TaskQueue::TakeAll() {
    detail::ShortLock const lock(mIn.mutex);
    mIn.last = nullptr;
    return mIn.first.exchange(nullptr, std::memory_order_relaxed);
}

// Waits a little first. A consumer that is faster than the producers would sleep after every few tasks, and
// each time a producer would pay for waking it, which takes longer than many posts.
ITask* TaskQueue::TakeSoon() {
    for (int i = 0;; ++i) {
        if (mIn.first.load(std::memory_order_relaxed)) return TakeAll();
        if (i == kPatience || mIn.stopping.load(std::memory_order_relaxed)) return nullptr;
        std::this_thread::yield();
    }
}

// Null: stopped, drained, and refusing from now on.
ITask* TaskQueue::AwaitTasks() {
    std::optional<TraceScope> trace; // ends without the lock
    std::unique_lock<std::mutex> lock(mIn.mutex);
    while (!mIn.first && !mIn.stopping) {
        if (!trace) trace.emplace("wait", "no tasks");
        mIn.sleeping = true;
        mIn.work.wait(lock);
    }
    mIn.sleeping = false;
    mIn.ended = !mIn.first;
    mIn.last = nullptr;
    return mIn.first.exchange(nullptr, std::memory_order_relaxed);
}

void TaskQueue::RunTasks(ITask* first) {
    std::uint64_t done = mDone.count.load(std::memory_order_relaxed);
    std::optional<detail::TaskTrace> trace;
    if (Trace::IsOn()) trace.emplace();
    while (first) {
        if (trace) trace->Begin(*first);
        {
            std::unique_ptr<ITask> const task(std::exchange(first, first->next));
            RunGuarded("mok_log", "TaskQueue: a task", [&task] { task->run(); });
        }
        if (trace) trace->End();
        // Whoever waited may stop the trace, which is to have the tasks.
        if (trace && (!first || done + 1 >= mDone.target)) trace->AddPending();
        MarkDone(++done);
    }
}

void TaskQueue::MarkDone(std::uint64_t count) {
    mDone.count = count;
    if (count < mDone.target) return;
    std::lock_guard<std::mutex> const lock(mWaiters.mutex);
    mDone.target = kNoTarget; // those whose turn has not come ask again
    mWaiters.changed.notify_all();
}

} // namespace Moka
