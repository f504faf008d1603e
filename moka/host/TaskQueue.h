/// TaskQueue: a queue that any thread posts to and one thread, the consumer, runs. It is an intrusive list
/// under a short lock. The consumer takes the whole list at once, and is notified only if it sleeps. Posting
/// allocates nothing.
/// Owner:   the creator. The queue must outlive all posts. Its destructor deletes tasks that were never run,
///          and threads that wait for them return.
/// Thread:  Post and WaitForTasks on any thread; Run once, on the consumer thread. No lock is held while a
///          task runs or is deleted.
/// Order:   posting order.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/task/IGLMsgQueue.h"

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <thread>

namespace Moka {

class MOKA_API TaskQueue : public IGLMsgQueue {
public:
    TaskQueue() = default;
    ~TaskQueue() override;
    TaskQueue(TaskQueue const&) = delete;
    TaskQueue& operator=(TaskQueue const&) = delete;

    /// Accepts tasks until Run() has returned, also from running tasks. A null task returns false.
    bool Post(ITask* task) override;

    /// Waits until everything posted before the call has been run and deleted. On the consumer thread it logs
    /// an error and returns at once.
    void WaitForTasks() override;

protected:
    /// Runs tasks until RequestStop(). Then it runs the remaining tasks and those that they post, refuses
    /// further posts and returns. It calls onIdle each time the queue becomes empty, before it sleeps or
    /// returns; onIdle may post. An exception of a task is logged; the task is deleted and the loop
    /// continues.
    void Run(std::function<void()> const& onIdle);
    /// Makes Run() return when the queue is empty. Any thread, also before Run() or in a task. A thread that
    /// posts without a pause keeps Run() from returning.
    void RequestStop();

    /// True on the thread that runs the tasks.
    bool IsConsumerThread() const;

private:
    static constexpr int kPatience = 8; // tries before sleeping, with a yield between them: some microseconds
    static constexpr std::uint64_t kNoTarget = UINT64_MAX;

    ITask* TakeAll();
    ITask* TakeSoon();
    ITask* AwaitTasks();
    void RunTasks(ITask* first);
    void MarkDone(std::uint64_t count);

    // The producers' part. The consumer uses it once for each list that it takes.
    struct alignas(64) {
        std::mutex mutex;
        std::condition_variable work;
        // These two are written under the lock and also read without it.
        std::atomic<ITask*> first{nullptr};
        std::atomic<bool> stopping{false};
        ITask* last = nullptr;
        std::uint64_t posted = 0;
        bool sleeping = false; // and not yet notified
        bool ended = false;
    } mIn;

    // The consumer's part, on a cache line that producers do not use: the number of finished tasks, and the
    // number at which a waiter wants to be notified. Consumer and waiter each write one of them before they
    // read the other, with sequential consistency, so at least one of them sees the other's value.
    struct alignas(64) {
        std::atomic<std::uint64_t> count{0};
        std::atomic<std::uint64_t> target{kNoTarget};
        std::atomic<std::thread::id> consumer{};
    } mDone;

    struct alignas(64) {
        std::mutex mutex;
        std::condition_variable changed;
        int count = 0;
    } mWaiters;
};

} // namespace Moka
