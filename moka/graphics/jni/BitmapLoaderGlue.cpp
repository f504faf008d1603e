// The native methods of com.velmora.android.sdk.pen.graphics.MokaBitmapLoader.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/jni/OnLoad.h"
#include "moka/graphics/loader/MKBitmapLoader.h"

namespace Moka {
namespace {

constexpr char const* kOnLoadName = "void BitmapLoader_OnLoad(JavaVM *, JNIEnv *)";

// A fixed text, not __PRETTY_FUNCTION__, because log filters search for it.
constexpr char const* kStartEventLoopName =
    "static void Moka::BitmapLoaderGlue::Native_startEventLoop(JNIEnv *, jclass)";

struct BitmapLoaderGlue {
    // The calling Java thread becomes the loader's thread and never returns.
    static void Native_startEventLoop(JNIEnv*, jclass) {
        __android_log_print(ANDROID_LOG_INFO, "mok_log", "BitmapLoader %s", kStartEventLoopName);
        MKBitmapLoader::startEventLoop();
    }
};

jint RegisterNatives(JNIEnv* env, jclass type) {
    JNINativeMethod const methods[] = {
        {const_cast<char*>("Native_startEventLoop"), const_cast<char*>("()V"),
         reinterpret_cast<void*>(&BitmapLoaderGlue::Native_startEventLoop)},
    };
    return env->RegisterNatives(type, methods, 1);
}

} // namespace
} // namespace Moka

void BitmapLoader_OnLoad(JavaVM*, JNIEnv* env) {
    using Moka::kOnLoadName;
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "BitmapLoader %s JNI_OnLoad enter!", kOnLoadName);
    jclass const type = env->FindClass("com/velmora/android/sdk/pen/graphics/MokaBitmapLoader");
    // No blank follows the name in these two: log filters search for these texts.
    if (!type) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "BitmapLoader %sCannot find BitmapLoader Class",
                            kOnLoadName);
        return;
    }
    if (Moka::RegisterNatives(env, type) < 0) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "BitmapLoader %sRegisterNatives is failed",
                            kOnLoadName);
        return;
    }
    // The constructor starts the loader's thread. The object itself is not needed.
    if (jmethodID const init = env->GetMethodID(type, "<init>", "()V")) env->NewObject(type, init);
    env->DeleteLocalRef(type);
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "BitmapLoader %s JNI_OnLoad Success!", kOnLoadName);
}
