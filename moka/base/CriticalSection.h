/// CriticalSection: a mutex, recursive if requested. AutoCriticalSection holds it for a scope. If a thread
/// enters a non-recursive one twice, it waits for ever.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <pthread.h>

namespace Moka {

/// It uses POSIX mutexes, whose kind is chosen at run time, and a condition variable works with both kinds.
class MOKA_API CriticalSection : NonAssignable {
public:
    /// A recursive lock may be entered again by the thread that holds it.
    explicit CriticalSection(bool recursive);
    ~CriticalSection(); ///< no thread may hold the lock

    /// Waits until no other thread holds the lock, and takes it.
    void Enter();
    void Leave(); ///< releases the lock; called by the thread that entered

private:
    friend class ConditionalVariable;
    pthread_mutex_t mMutex;
    int mDepth = 0; // how often the holding thread has entered; guarded by the mutex
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
