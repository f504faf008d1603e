/// CriticalSection: a mutual-exclusion lock, recursive on request. AutoCriticalSection holds it for a scope.
/// A non-recursive one that is entered twice by one thread never returns.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <pthread.h>

namespace Moka {

/// Over POSIX: there the kind of mutex is chosen when it is made, and one condition works with either kind.
class MOKA_API CriticalSection : NonAssignable {
public:
    /// A recursive lock may be entered again by the thread that holds it.
    explicit CriticalSection(bool recursive);
    ~CriticalSection(); ///< nobody is inside

    /// Waits until no other thread is inside.
    void Enter();
    void Leave(); ///< by the thread that entered

private:
    friend class ConditionalVariable;
    pthread_mutex_t mMutex;
    int mDepth = 0; // how often the thread inside has entered; guarded by the mutex itself
};

/// Holds a CriticalSection from construction to destruction.
class AutoCriticalSection : NonAssignable {
public:
    /// Enters lock.
    explicit AutoCriticalSection(CriticalSection& lock) : mLock(lock) { mLock.Enter(); }
    ~AutoCriticalSection() { mLock.Leave(); }

private:
    CriticalSection& mLock;
};

} // namespace Moka
