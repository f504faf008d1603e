/// ConditionalVariable: a condition variable for a CriticalSection. Signal wakes all waiting threads, because
/// they may wait for different conditions. Wake-ups can be spurious: test the condition in a loop.
#pragma once

#include "moka/base/CriticalSection.h"
#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <pthread.h>

namespace Moka {

class MOKA_API ConditionalVariable : NonAssignable {
public:
    ConditionalVariable();
    ~ConditionalVariable(); ///< no thread may wait

    /// Releases the lock, waits for a signal, and enters the lock again. The caller must have entered it
    /// exactly once, even if it is recursive. With milliseconds -1 it waits without limit. Returns false
    /// after the time-out.
    bool Wait(CriticalSection& lock, int milliseconds = -1);

    /// Wakes all waiting threads.
    void Signal();

private:
    pthread_cond_t mCondition;
};

} // namespace Moka
