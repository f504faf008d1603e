/// ConditionalVariable: lets threads sleep until something they watch, guarded by a CriticalSection, changes.
/// Signal wakes every waiter, since several threads wait for different things on one condition. Wake-ups can
/// be spurious: test in a loop.
#pragma once

#include "moka/base/CriticalSection.h"
#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <pthread.h>

namespace Moka {

class MOKA_API ConditionalVariable : NonAssignable {
public:
    ConditionalVariable();
    ~ConditionalVariable(); ///< nobody waits

    /// The caller is inside lock exactly once (also when it is recursive); it is left while sleeping and
    /// entered again before the return. milliseconds -1 waits without limit. False when the time ran out.
    bool Wait(CriticalSection& lock, int milliseconds = -1);

    /// Wakes all waiting threads.
    void Signal();

private:
    pthread_cond_t mCondition;
};

} // namespace Moka
