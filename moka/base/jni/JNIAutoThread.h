// JNIAutoThread: attaches the calling thread to the Java VM for a scope.
// Owner:   a local variable. It detaches the thread only if it attached it. On Java threads, on threads that
//          other code has attached, and inside another JNIAutoThread it changes nothing.
// Thread:  created, used and destroyed on one thread; any number of threads at a time.
// Fails:   if there is no VM or the VM refuses the thread, logs an error, and GetEnv returns null.
// Cost:    attaching creates a Java thread object. Around many short calls, create one outside.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

#include <jni.h>

namespace Moka {

class MOKA_API JNIAutoThread : NonAssignable {
public:
    explicit JNIAutoThread(JavaVM* vm);
    // Detaches the thread if the constructor attached it. This ends its local references.
    ~JNIAutoThread();

    // The environment, valid on this thread until destruction. Null if the thread could not be attached.
    JNIEnv* GetEnv() const { return mEnv; }

private:
    JavaVM* const mVm;
    JNIEnv* mEnv = nullptr;
    bool mHasAttached = false;
};

} // namespace Moka
