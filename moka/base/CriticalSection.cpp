#include "moka/base/CriticalSection.h"

namespace Moka {

CriticalSection::CriticalSection(bool recursive) {
    pthread_mutexattr_t attributes;
    pthread_mutexattr_init(&attributes);
    pthread_mutexattr_settype(&attributes, recursive ? PTHREAD_MUTEX_RECURSIVE : PTHREAD_MUTEX_NORMAL);
    pthread_mutex_init(&mMutex, &attributes);
    pthread_mutexattr_destroy(&attributes);
}

CriticalSection::~CriticalSection() { pthread_mutex_destroy(&mMutex); }

void CriticalSection::Enter() {
    pthread_mutex_lock(&mMutex);
    ++mDepth;
}

void CriticalSection::Leave() {
    --mDepth;
    pthread_mutex_unlock(&mMutex);
}

} // namespace Moka
