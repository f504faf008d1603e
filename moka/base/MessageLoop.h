/// MessageLoop: runs the messages of the Handlers that one thread made.
/// Owner:  the thread that constructs it; at most one a thread, found with GetCurrent().
/// Thread: Run, RunPending and destruction on the owning thread; Quit and the posting side of Handler from
///         any.
/// Fails:  an exception out of a message is one error line, and the loop goes on.
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

    /// Runs what is pending now, then returns the number of messages run. What they send stays for later.
    int RunPending();

    /// Makes Run return after the message it is running; the innermost one, if several are. When none is, the
    /// next one returns at once.
    void Quit();

private:
    friend class Handler;
    std::shared_ptr<detail::MessageQueue> mQueue;
};

} // namespace Moka
