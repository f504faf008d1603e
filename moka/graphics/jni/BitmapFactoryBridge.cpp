// Decoding through com.velmora.android.sdk.pen.graphics.MokaBitmapFactory.
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

// Written while loading, only read afterwards, and by nobody before SetJavaDecoder. Never given back.
JavaVM* gJavaVM = nullptr;
jclass gBitmapFactoryClass = nullptr;
jmethodID gDecodeFile = nullptr;
jmethodID gRecycle = nullptr;

void LogError(char const* text) { __android_log_print(ANDROID_LOG_ERROR, "mok_log", "%s", text); }

// Left pending, an exception would spoil every later call on a thread that goes on, the loader's above all.
bool ClearException(JNIEnv* env) {
    if (!env->ExceptionCheck()) return false;
    // What Java prints may name the file.
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

// The pixels go on as they are, into a bitmap of the base library's making.
Bitmap* TakePixels(Bitmap* converted) {
    Bitmap* const bitmap = BitmapFactory::CreateBitmapFromBuffer(
        converted->GetBuffer(), converted->GetWidth(), converted->GetHeight(), converted->GetWidth() * 4,
        Bitmap::kFormatRgba8888, true);
    if (bitmap) converted->SetDeleteBuffer(false);
    return bitmap;
}

// Ends the local reference, which on a thread of Java's own nobody else would.
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
    // Java may know fewer formats than the base library, which decodes at the file's own size.
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
    // Half a success decodes as well.
    detail::SetJavaDecoder(gJavaVM && gDecodeFile ? &DecodeThroughJava : nullptr);
    if (!isComplete) return 0;
    __android_log_print(ANDROID_LOG_INFO, "mok_log", "MKBitmapFactory JNI_OnLoad Success");
    return 1;
}
