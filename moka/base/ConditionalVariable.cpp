#include "moka/base/ConditionalVariable.h"

#include "moka/base/Check.h"

#include <ctime>

namespace Moka {
namespace {

timespec DeadlineIn(int milliseconds) {
    constexpr long kNanosecondsPerSecond = 1'000'000'000;
    timespec deadline{};
    clock_gettime(CLOCK_MONOTONIC, &deadline);
    deadline.tv_sec += milliseconds / 1000;
    deadline.tv_nsec += (milliseconds % 1000) * 1'000'000L;
    if (deadline.tv_nsec >= kNanosecondsPerSecond) {
        deadline.tv_nsec -= kNanosecondsPerSecond;
        ++deadline.tv_sec;
    }
    return deadline;
}

} // namespace

ConditionalVariable::ConditionalVariable() {
    pthread_condattr_t attributes;
    pthread_condattr_init(&attributes);
    // The monotonic clock, so that changing the wall clock does not change the duration of a wait.
    pthread_condattr_setclock(&attributes, CLOCK_MONOTONIC);
    pthread_cond_init(&mCondition, &attributes);
    pthread_condattr_destroy(&attributes);
}

ConditionalVariable::~ConditionalVariable() { pthread_cond_destroy(&mCondition); }

bool ConditionalVariable::Wait(CriticalSection& lock, int milliseconds) {
    MOKA_CHECK(lock.mDepth == 1, "Wait needs a lock that is entered exactly once: one entered deeper stays "
                                 "locked, and nobody could signal");
    lock.mDepth = 0;
    int result = 0;
    if (milliseconds < 0) {
        result = pthread_cond_wait(&mCondition, &lock.mMutex);
    } else {
        timespec const deadline = DeadlineIn(milliseconds);
        result = pthread_cond_timedwait(&mCondition, &lock.mMutex, &deadline);
    }
    lock.mDepth = 1;
    return result == 0;
}

void ConditionalVariable::Signal() { pthread_cond_broadcast(&mCondition); }

} // namespace Moka
