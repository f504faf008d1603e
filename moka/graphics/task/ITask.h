/// ITask: one piece of work for the render thread, carried there by an IGLMsgQueue.
/// Owner:   the poster until a queue accepts it; then the queue, which runs it once and frees it. A refused
///          task goes back to the poster, who frees it without running it.
/// Thread:  built on any thread, run on the queue's consumer, freed on either.
/// Cost:    allocated from a pool of fixed blocks (TaskMemory.h), linked through its own field: posting
///          allocates nothing else. Only the non-throwing form of new exists; null means that memory ran out.
#pragma once

#include "moka/base/Export.h"

#include <cstddef>
#include <new>

namespace Moka {

/// The link of an item in an intrusive queue. Only the queue reads or writes it while the item is queued.
template <class T>
class QueueItemBase {
public:
    /// The item behind this one.
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

    /// For the queue's use; this library never asks.
    virtual bool isGlobalLockAllowed() { return true; }

    /// Memory from the pool.
    static void* operator new(std::size_t size, std::nothrow_t const&) noexcept;
    static void operator delete(void* memory, std::size_t size) noexcept;
    /// Pairs with the non-throwing new when a constructor throws.
    static void operator delete(void* memory, std::nothrow_t const&) noexcept;
};

} // namespace Moka
