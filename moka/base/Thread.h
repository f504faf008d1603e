/// Thread: a named thread that runs one function.
/// Owner:  the creator. The destructor waits for the thread to end. If it runs on that thread itself, it
///         detaches it instead, so a function may delete its own Thread.
/// Thread: Start, Join and destruction on one thread at a time.
/// Units:  priority is a nice value, -20 (most urgent) to 19. If the system refuses it, it is ignored. name
///         is UTF-8. It is copied and cut to 15 bytes, the system's limit. Null means no name.
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

    /// Starts the thread. Logs an error and returns false if it was started before or the system cannot
    /// create a thread.
    bool Start();

    /// Waits for the function to return. Returns at once if the thread was never started or was joined. On
    /// the thread itself it logs an error and returns at once.
    void Join();

private:
    static constexpr int kNameBytes = 15; // the system's limit, without the terminating zero

    Function mFunction;
    void* mArgument;
    char mName[kNameBytes + 1] = {};
    int mPriority;
    bool mStarted = false;
    std::thread mThread;
};

} // namespace Moka
