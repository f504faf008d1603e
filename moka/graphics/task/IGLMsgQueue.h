/// IGLMsgQueue: the task queue of the render thread. The host implements it and passes it to the factory.
/// Thread: any number of threads may call both functions at the same time.
/// The vtable order is ABI.
// Compat: vtable-order
#pragma once

namespace Moka {

class ITask;

class IGLMsgQueue {
public:
    virtual ~IGLMsgQueue() = default;

    /// Returns true if the queue accepts the task. The queue then owns it, runs it exactly once on the render
    /// thread, in posting order, and deletes it. Returns false if the queue refuses; the caller then still
    /// owns the task. A null task must be ignored.
    virtual bool Post(ITask* task) = 0;

    /// Waits until every task posted before the call has run. Must not be called on the render thread.
    virtual void WaitForTasks() = 0;
};

} // namespace Moka
