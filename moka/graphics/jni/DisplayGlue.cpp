// The native methods of com.velmora.android.sdk.pen.view.MokaDisplay.
#include "moka/base/log/InfoLog.h"
#include "moka/graphics/jni/Display.h"
#include "moka/graphics/jni/OnLoad.h"

#include <cstdint>
#include <iterator>
#include <new>

namespace Moka {
namespace {

constexpr InfoLog LogInfo{"DisplayGlue"};

// A handle is the object's address. Java passes 0 to Native_finalize only.
struct DisplayGlue {
    static Display* FromHandle(jlong handle) {
        return reinterpret_cast<Display*>(static_cast<std::intptr_t>(handle));
    }

    static jlong Native_init(JNIEnv*, jclass, jint widthPixels, jint heightPixels, jfloat systemDensity,
                             jint localWidthPixels, jint localHeightPixels, jfloat density,
                             jfloat scaledDensity, jint densityDpi, jfloat xdpi, jfloat ydpi,
                             jint layoutDirection, jint orientation, jint screenOrientation,
                             jboolean isTablet, jlong appVsyncOffsetNanos) {
        Display const* const display = new (std::nothrow)
            Display(widthPixels, heightPixels, systemDensity, localWidthPixels, localHeightPixels, density,
                    scaledDensity, densityDpi, xdpi, ydpi, IDisplay::LayoutDirection{layoutDirection},
                    IDisplay::Orientation{orientation}, IDisplay::ScreenOrientation{screenOrientation},
                    isTablet != 0, false, appVsyncOffsetNanos);
        return static_cast<jlong>(reinterpret_cast<std::intptr_t>(display));
    }
    static void Native_finalize(JNIEnv*, jclass, jlong handle) { delete FromHandle(handle); }
    static void Native_copy(JNIEnv*, jclass, jlong destination, jlong source) {
        FromHandle(destination)->Copy(FromHandle(source));
    }
    static void Native_setDebugLevel(JNIEnv*, jclass, jlong handle, jint level) {
        FromHandle(handle)->SetDebugLevel(level);
    }
    static void Native_updateScreenOrientation(JNIEnv*, jclass, jlong handle, jint orientation) {
        FromHandle(handle)->UpdateScreenOrientation(IDisplay::ScreenOrientation{orientation});
    }
};

template <class Function>
JNINativeMethod MakeMethod(char const* name, char const* signature, Function* function) {
    return {const_cast<char*>(name), const_cast<char*>(signature), reinterpret_cast<void*>(function)};
}

jint RegisterNatives(JNIEnv* env, jclass type) {
    JNINativeMethod const methods[] = {
        MakeMethod("Native_init", "(IIFIIFFIFFIIIZJ)J", &DisplayGlue::Native_init),
        MakeMethod("Native_finalize", "(J)V", &DisplayGlue::Native_finalize),
        MakeMethod("Native_copy", "(JJ)V", &DisplayGlue::Native_copy),
        MakeMethod("Native_setDebugLevel", "(JI)V", &DisplayGlue::Native_setDebugLevel),
        MakeMethod("Native_updateScreenOrientation", "(JI)V", &DisplayGlue::Native_updateScreenOrientation),
    };
    return env->RegisterNatives(type, methods, static_cast<jint>(std::size(methods)));
}

} // namespace
} // namespace Moka

void Display_OnLoad(JavaVM* vm) {
    using Moka::LogInfo;
    LogInfo("Display JNI_OnLoad enter!!");
    void* found = nullptr;
    // These methods need only version 1.2, which is older than the one that JNI_OnLoad requests.
    if (vm->GetEnv(&found, JNI_VERSION_1_2) != JNI_OK) return LogInfo("Display : Cannot find env");
    auto* const env = static_cast<JNIEnv*>(found);
    jclass const type = env->FindClass("com/velmora/android/sdk/pen/view/MokaDisplay");
    if (!type) return LogInfo("Cannot find Display Class");
    if (Moka::RegisterNatives(env, type) < 0) return LogInfo("RegisterNatives is failed");
    env->DeleteLocalRef(type);
    LogInfo("Display JNI_OnLoad Success");
}
