/// Handler: delivers messages to a function on the thread that created it, through that thread's MessageLoop.
/// A handler created on a thread without a loop logs an error and refuses every message.
/// Thread: SendMessage and HasMessage from any. Destruction withdraws pending messages and waits for a
///         running one, unless it happens on the loop's own thread, where the message can only be one that is
///         destroying it.
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

    /// Delivers to function on this thread, with argument.
    Handler(Function function, void* argument);
    ~Handler();

    /// Whether a message of this number waits to be run; one that is running does not.
    bool HasMessage(int what = 0) const;

    /// Queues a message; false when the loop is gone, the handler is being destroyed or memory is out.
    bool SendMessage(int what = 0);

private:
    std::shared_ptr<detail::HandlerState> mState;
};

} // namespace Moka
