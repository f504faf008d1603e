/// MessageLoop: runs the messages of the Handlers that one thread created.
/// Owner:  the thread that constructs it; at most one a thread, found with GetCurrent().
/// Thread: Run, RunPending and destruction on the owning thread; Quit and the posting side of Handler from
///         any.
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
    /// Messages that have not run are dropped.
    ~MessageLoop();

    /// The calling thread's loop; null when it has none.
    static MessageLoop* GetCurrent();

    /// Runs messages in the order they were sent until Quit. A message may call it, or RunPending, again.
    void Run();

    /// Runs the messages that are pending now and returns their number. Messages that they send run later.
    int RunPending();

    /// Makes Run return after the message it is running; the innermost one, if several are. When none is, the
    /// next one returns at once.
    void Quit();

private:
    friend class Handler;
    std::shared_ptr<detail::MessageQueue> mQueue;
};

} // namespace Moka
