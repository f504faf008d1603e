/// IGLMsgQueue: the way onto the render thread. The host implements it and hands it to every creating call.
/// Thread: both operations from any thread, at once.
/// The vtable order is ABI.
// Compat: vtable-order
#pragma once

namespace Moka {

class ITask;

class IGLMsgQueue {
public:
    virtual ~IGLMsgQueue() = default;

    /// True: accepted. The queue owns the task, runs it exactly once on the render thread, in posting order,
    /// and frees it. False: refused, and the task still belongs to the caller. Null is tolerated and ignored.
    virtual bool Post(ITask* task) = 0;

    /// Blocks until every task posted before the call has run. Never on the render thread itself.
    virtual void WaitForTasks() = 0;
};

} // namespace Moka
