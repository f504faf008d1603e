#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/jni/OnLoad.h"

namespace {

constexpr jint kJniVersion = JNI_VERSION_1_4;

} // namespace

jint JNI_OnLoad(JavaVM* vm, void*) {
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "Graphics JNI_OnLoad enter!!");
    void* env = nullptr;
    if (vm->GetEnv(&env, kJniVersion) != JNI_OK) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "JNI_VERSION is different");
        return 0;
    }
    // If one of them leaves an exception pending, Java throws it from System.loadLibrary.
    Display_OnLoad(vm);
    BitmapLoader_OnLoad(vm, static_cast<JNIEnv*>(env));
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "Graphics JNI_OnLoad Success");
    return kJniVersion;
}
