// Decodes images by calling com.velmora.android.sdk.pen.graphics.MokaBitmapFactory.
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/Log.h"
#include "moka/base/String.h"
#include "moka/base/System.h"
#include "moka/base/jni/JNIAutoThread.h"
#include "moka/base/jni/JniBitmap.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/jni/OnLoad.h"

namespace Moka {
namespace {

// MKBitmapFactory_OnLoad writes these before it calls SetJavaDecoder. Afterwards they are only read. The
// global references are never released.
JavaVM* gJavaVM = nullptr;
jclass gBitmapFactoryClass = nullptr;
jmethodID gDecodeFile = nullptr;
jmethodID gRecycle = nullptr;

void LogError(char const* text) { __android_log_print(ANDROID_LOG_ERROR, "mok_log", "%s", text); }

// A pending exception would make every later JNI call on this thread fail, in particular on the loader's
// thread.
bool ClearException(JNIEnv* env) {
    if (!env->ExceptionCheck()) return false;
    // The stack trace may contain the path of the file, so it is printed in engineering builds only.
    if (System::IsBuildTypeEngMode()) env->ExceptionDescribe();
    env->ExceptionClear();
    return true;
}

jobject CallDecodeFile(JNIEnv* env, String const& path, int width, int height) {
    jstring const javaPath =
        env->NewString(reinterpret_cast<jchar const*>(path.GetPointer()), path.GetLength());
    jobject bitmap = nullptr;
    if (javaPath)
        bitmap = env->CallStaticObjectMethod(gBitmapFactoryClass, gDecodeFile, javaPath, width, height);
    if (ClearException(env)) {
        LogError("MKBitmapFactory : decodeFile threw an exception");
        bitmap = nullptr;
    }
    if (javaPath) env->DeleteLocalRef(javaPath);
    return bitmap;
}

void Recycle(JNIEnv* env, jobject javaBitmap) {
    if (!gRecycle) return;
    env->CallVoidMethod(javaBitmap, gRecycle);
    if (ClearException(env)) LogError("MKBitmapFactory : recycle threw an exception");
}

// Moves the pixels into a bitmap that the base library creates.
Bitmap* TakePixels(Bitmap* converted) {
    Bitmap* const bitmap = BitmapFactory::CreateBitmapFromBuffer(
        converted->GetBuffer(), converted->GetWidth(), converted->GetHeight(), converted->GetWidth() * 4,
        Bitmap::kFormatRgba8888, true);
    if (bitmap) converted->SetDeleteBuffer(false);
    return bitmap;
}

// Deletes the local reference, because on a Java thread it would live until the native method returns.
Bitmap* Convert(JNIEnv* env, jobject javaBitmap) {
    Bitmap converted;
    bool const isConverted = JNI_ConvertJavaToBitmap(env, javaBitmap, &converted, false);
    if (isConverted) {
        Recycle(env, javaBitmap);
    } else {
        LogError("MKBitmapFactory : getMKBitmap false");
    }
    env->DeleteLocalRef(javaBitmap);
    return isConverted ? TakePixels(&converted) : nullptr;
}

Bitmap* DecodeThroughJava(String const* path, int width, int height) {
    if (!path) {
        LogError("MKBitmapFactory : filename NULL");
        return nullptr;
    }
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "MKBitmapFactory::CreateBitmapJNI - filename[%s]",
                        Log::ConvertSecureLog(*path).c_str());
    if (path->GetLength() <= 0) {
        LogError("MKBitmapFactory : filename 0");
        return nullptr;
    }
    JNIAutoThread const thread(gJavaVM);
    JNIEnv* const env = thread.GetEnv();
    jobject const javaBitmap = env ? CallDecodeFile(env, *path, width, height) : nullptr;
    // The base library may know a format that Java does not know. It decodes in the file's own size.
    if (!javaBitmap) return BitmapFactory::CreateBitmapForGraphics(path);
    return Convert(env, javaBitmap);
}

bool FindBitmapFactory(JNIEnv* env) {
    jclass const type = env->FindClass("com/velmora/android/sdk/pen/graphics/MokaBitmapFactory");
    if (!type) {
        LogError("MKBitmapFactory Cannot find MokaBitmapFactory Class");
        env->ExceptionClear();
        return false;
    }
    gBitmapFactoryClass = static_cast<jclass>(env->NewGlobalRef(type));
    gDecodeFile =
        env->GetStaticMethodID(type, "decodeFile", "(Ljava/lang/String;II)Landroid/graphics/Bitmap;");
    if (!gDecodeFile) {
        LogError("MKBitmapFactory Cannot find 'gDecodeFile' method id");
        env->ExceptionClear();
    }
    env->DeleteLocalRef(type);
    return true;
}

bool FindBitmap(JNIEnv* env) {
    jclass const type = env->FindClass("android/graphics/Bitmap");
    if (!type) {
        LogError("MKBitmapFactory Cannot find Bitmap Class");
        env->ExceptionClear();
        return false;
    }
    gRecycle = env->GetMethodID(type, "recycle", "()V");
    if (!gRecycle) {
        LogError("MKBitmapFactory Cannot find 'gRecycle' method id");
        env->ExceptionClear();
    }
    env->DeleteLocalRef(type);
    return true;
}

} // namespace
} // namespace Moka

int MKBitmapFactory_OnLoad(JavaVM* vm, JNIEnv* env) {
    using namespace Moka;
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "MKBitmapFactory JNI_OnLoad enter!!");
    gJavaVM = vm;
    bool const isComplete = FindBitmapFactory(env) && FindBitmap(env);
    // Decoding needs the VM and the method only, even if another look-up failed.
    detail::SetJavaDecoder(gJavaVM && gDecodeFile ? &DecodeThroughJava : nullptr);
    if (!isComplete) return 0;
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "MKBitmapFactory JNI_OnLoad Success");
    return 1;
}
