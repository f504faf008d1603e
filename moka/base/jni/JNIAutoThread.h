// JNIAutoThread: makes the calling thread usable for JNI for the length of a scope.
// Owner:   the stack frame that makes it. Detaches only what it attached itself: in a thread of Java's, in
//          one that somebody else attached, and inside another JNIAutoThread it changes nothing.
// Thread:  made, used and destroyed on one thread; any number of threads at a time.
// Fails:   GetEnv gives null, after one error line, when there is no VM or it refuses the thread.
// Cost:    attaching makes a Java thread object. Around many short calls, hold one outside.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <jni.h>

namespace Moka {

class MOKA_API JNIAutoThread : NonAssignable {
public:
    explicit JNIAutoThread(JavaVM* vm);
    // Local references made on a thread that this attached end here.
    ~JNIAutoThread();

    // Valid on this thread until destruction; null when the thread could not be attached.
    JNIEnv* GetEnv() const { return mEnv; }

private:
    JavaVM* const mVm;
    JNIEnv* mEnv = nullptr;
    bool mHasAttached = false;
};

} // namespace Moka
