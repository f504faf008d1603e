/// MessageLoop: runs the messages of all Handlers that were created on its thread.
/// Owner:  the thread that creates it. A thread has at most one; GetCurrent() returns it.
/// Thread: Run, RunPending and destruction on the owning thread; Quit on any thread.
/// Fails:  an exception of a message is logged as an error, and the loop continues.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <memory>

namespace Moka {

namespace detail {
struct MessageQueue;
}

class MOKA_API MessageLoop : NonAssignable {
public:
    MessageLoop();
    /// Drops messages that have not run.
    ~MessageLoop();

    /// The calling thread's loop, or null.
    static MessageLoop* GetCurrent();

    /// Runs messages in the order in which they were sent, until Quit. A message may call Run or RunPending
    /// again.
    void Run();

    /// Runs the messages that are pending now and returns their number. Messages that they send run later.
    int RunPending();

    /// Makes Run return after the current message. If several calls of Run are nested, the innermost one
    /// returns. If none is running, the next call returns at once.
    void Quit();

private:
    friend class Handler;
    std::shared_ptr<detail::MessageQueue> mQueue;
};

} // namespace Moka
