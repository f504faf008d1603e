/// Thread: a named thread that runs one function.
/// Owner:  the creator. Destruction waits for a started thread, unless it happens on that very thread, which
///         is then detached; so a function may delete its own Thread.
/// Thread: Start, Join and destruction by one thread at a time.
/// Units:  priority is a nice value, -20 (most urgent) to 19; one the system refuses is ignored. A name is
///         UTF-8, copied, and cut to 15 bytes, the system's limit; null is no name.
/// Fails:  an exception that leaves the function ends the process.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <thread>

namespace Moka {

class MOKA_API Thread : NonAssignable {
public:
    /// Runs on the new thread.
    using Function = void (*)(void* argument);

    /// Does not start the thread.
    Thread(Function function, void* argument, char const* name, int priority = 0);
    ~Thread();

    /// False when it was started before or the system has no more threads; logs an error.
    bool Start();

    /// Waits for the function to return; at once when the thread was never started or has been joined. On the
    /// thread itself an error line and no wait.
    void Join();

private:
    static constexpr int kNameBytes = 15; // what the system takes, without the terminator

    Function mFunction;
    void* mArgument;
    char mName[kNameBytes + 1] = {};
    int mPriority;
    bool mStarted = false;
    std::thread mThread;
};

} // namespace Moka
