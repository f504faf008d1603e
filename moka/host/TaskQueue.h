/// TaskQueue: the queue half of a render thread: any thread posts, one thread runs. An intrusive list under
/// one short lock, taken over whole by the consumer and notified only when it sleeps; posting allocates
/// nothing.
/// Owner:   the creator; it must outlive every post. Tasks that were never run are freed with it, and
///          threads that still wait for them return.
/// Thread:  Post and WaitForTasks from any; Run once, on the one consumer thread. No lock is held while a
///          task runs or is freed.
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

    /// Accepted until Run() has returned; also from inside a running task. Null is ignored: false.
    bool Post(ITask* task) override;

    /// Returns when everything posted before the call has been run and freed; at once when nothing is left to
    /// run. On the consumer thread itself it logs an error and returns at once.
    void WaitForTasks() override;

protected:
    /// Runs tasks until RequestStop(), then the accepted tasks and those that they post, then refuses and
    /// returns. onIdle is called each time the queue has run empty, before sleeping or returning; it may
    /// post. An exception of a task is logged; the task is freed and the loop continues.
    void Run(std::function<void()> const& onIdle);
    /// From any thread, also before Run() or from inside a task. Run() returns at the first moment when
    /// nothing is queued, so whoever posts without a pause keeps it from returning.
    void RequestStop();

    /// Whether this thread runs the tasks.
    bool IsConsumerThread() const;

private:
    static constexpr int kPatience = 8; // looks before sleeping, a yield apart: some microseconds
    static constexpr std::uint64_t kNoTarget = UINT64_MAX;

    ITask* TakeAll();
    ITask* TakeSoon();
    ITask* AwaitTasks();
    void RunTasks(ITask* first);
    void MarkDone(std::uint64_t count);

    // The producers' part. The consumer comes here once for each list it takes.
    struct alignas(64) {
        std::mutex mutex;
        std::condition_variable work;
        // These two are written under the lock and peeked at without.
        std::atomic<ITask*> first{nullptr};
        std::atomic<bool> stopping{false};
        ITask* last = nullptr;
        std::uint64_t posted = 0;
        bool sleeping = false; // and not yet notified
        bool ended = false;
    } mIn;

    // The consumer's part, on a cache line that no producer touches: how many tasks are done, and at what
    // count somebody wants to be told. Each is written before the other is read, sequentially consistent, so
    // that of a consumer and a waiter that meet at least one sees the other.
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
