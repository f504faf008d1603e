/// ITask: a task for the render thread, posted to an IGLMsgQueue.
/// Owner:   the poster until a queue accepts it; then the queue, which runs and deletes it. If the queue
///          refuses, the poster deletes the task without running it.
/// Thread:  created on any thread, run on the render thread, deleted on either.
/// Cost:    allocated from a pool of fixed blocks (TaskMemory.h). Posting allocates nothing else, because
///          queues link tasks by `next`. Only the non-throwing new exists; it returns null if memory runs
///          out.
#pragma once

#include "moka/base/Export.h"

#include <cstddef>
#include <new>

namespace Moka {

/// The link of an item in an intrusive queue. Only the queue reads or writes it while the item is queued.
template <class T>
class QueueItemBase {
public:
    /// The item after this one.
    T* next = nullptr;
};

class MOKA_API ITask : public QueueItemBase<ITask> {
public:
    ITask() = default;
    ITask(ITask const&) = delete;
    ITask& operator=(ITask const&) = delete;
    virtual ~ITask() = default;

    /// Does the work.
    virtual void run() = 0;

    /// A hint for the queue. The library never calls it.
    virtual bool isGlobalLockAllowed() { return true; }

    /// Memory from the pool.
    static void* operator new(std::size_t size, std::nothrow_t const&) noexcept;
    static void operator delete(void* memory, std::size_t size) noexcept;
    /// Pairs with the non-throwing new when a constructor throws.
    static void operator delete(void* memory, std::nothrow_t const&) noexcept;
};

} // namespace Moka
