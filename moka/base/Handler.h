/// Handler: delivers messages to a function on the thread that created it, through that thread's MessageLoop.
/// If it is created on a thread without a loop, it logs an error and refuses every message.
/// Thread: SendMessage and HasMessage on any thread. The destructor removes pending messages. It also waits
///         for a running message, except on the loop's thread, where the running message is the one that
///         destroys the handler.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <memory>

namespace Moka {

namespace detail {
struct HandlerState;
}

class MOKA_API Handler : NonAssignable {
public:
    /// Runs on the thread that created the handler. what is the number of the message.
    using Function = void (*)(Handler* handler, void* argument, int what);

    /// Creates a handler that calls function with argument, on the current thread.
    Handler(Function function, void* argument);
    ~Handler();

    /// True if a message of this number is queued. A running message does not count.
    bool HasMessage(int what = 0) const;

    /// Queues a message. Returns false if the loop was destroyed, the handler is being destroyed, or memory
    /// runs out.
    bool SendMessage(int what = 0);

private:
    std::shared_ptr<detail::HandlerState> mState;
};

} // namespace Moka
