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
    // Makes this thread the consumer, so that WaitForTasks returns at once if the destructor of a task calls
    // it.
    mDone.consumer = std::this_thread::get_id();
    std::uint64_t done = mDone.count;
    for (ITask* task = TakeAll(); task; ++done) delete std::exchange(task, task->next);
    MarkDone(done);
    // Threads that have just been woken still use the members, so wait until they are gone.
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
        // Later posts need not notify again.
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

// Spins for a while before returning. A consumer that is faster than the producers would otherwise sleep
// after every few tasks, and waking it costs a producer more than many posts.
ITask* TaskQueue::TakeSoon() {
    for (int i = 0;; ++i) {
        if (mIn.first.load(std::memory_order_relaxed)) return TakeAll();
        if (i == kPatience || mIn.stopping.load(std::memory_order_relaxed)) return nullptr;
        std::this_thread::yield();
    }
}

// Waits for tasks. Returns null if the queue was stopped and is empty; it then refuses all posts.
ITask* TaskQueue::AwaitTasks() {
    std::optional<TraceScope> trace; // declared first, so that it ends after the lock is released
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
        // A waiting thread may stop the trace as soon as it is woken, so add the tasks before.
        if (trace && (!first || done + 1 >= mDone.target)) trace->AddPending();
        MarkDone(++done);
    }
}

void TaskQueue::MarkDone(std::uint64_t count) {
    mDone.count = count;
    if (count < mDone.target) return;
    std::lock_guard<std::mutex> const lock(mWaiters.mutex);
    mDone.target = kNoTarget; // waiters whose tasks are not done set it again
    mWaiters.changed.notify_all();
}

} // namespace Moka
