#include "moka/base/jni/JNIAutoThread.h"

#include "moka/base/log/AndroidLog.h"

#include <sys/prctl.h>

namespace Moka {
namespace {

constexpr jint kJniVersion = JNI_VERSION_1_6;

// The type of AttachCurrentThread's first parameter differs between Android's and the JDK's jni.h.
#ifdef __ANDROID__
using AttachedEnv = JNIEnv;
#else
using AttachedEnv = void;
#endif

// The system's name of this thread, so that debuggers show the same name for Java and native code.
struct ThreadName {
    char text[16] = {}; // the system's limit

    ThreadName() {
        prctl(PR_GET_NAME, text);
        // The name may not be valid modified UTF-8, which a VM may require.
        for (char& c : text) {
            if (static_cast<unsigned char>(c) >= 0x80) c = '?';
        }
    }
};

} // namespace

JNIAutoThread::JNIAutoThread(JavaVM* vm) : mVm(vm) {
    if (!vm) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "JNIAutoThread: there is no Java VM");
        return;
    }
    void* env = nullptr;
    jint status = vm->GetEnv(&env, kJniVersion);
    if (status == JNI_OK) {
        mEnv = static_cast<JNIEnv*>(env);
        return;
    }
    ThreadName name;
    if (status == JNI_EDETACHED) {
        JavaVMAttachArgs arguments = {};
        arguments.version = kJniVersion;
        arguments.name = name.text;
        status = vm->AttachCurrentThread(reinterpret_cast<AttachedEnv**>(&mEnv), &arguments);
        mHasAttached = status == JNI_OK;
    }
    if (!mHasAttached) {
        mEnv = nullptr;
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "JNIAutoThread: the Java VM refuses thread '%s' (status %d)", name.text,
                            static_cast<int>(status));
    }
}

JNIAutoThread::~JNIAutoThread() {
    if (mHasAttached) mVm->DetachCurrentThread();
}

} // namespace Moka
