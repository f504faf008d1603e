// The natives of the test programs' class moka.Host: what an application's own library does with ours.
#include "moka/base/log/LogSink.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/graphics/jni/OnLoad.h"

#include <cstring>
#include <jni.h>
#include <memory>
#include <mutex>
#include <utility>
#include <vector>

namespace {

using namespace Moka;

JavaVM* javaVm = nullptr;

std::mutex logMutex;
std::vector<std::string> logTexts;

String ToString(JNIEnv* env, jstring text) {
    std::u16string units(static_cast<std::size_t>(env->GetStringLength(text)), u'\0');
    env->GetStringRegion(text, 0, env->GetStringLength(text), reinterpret_cast<jchar*>(units.data()));
    return String(units.data(), static_cast<int>(units.size()));
}

// Width and height in the machine's order, then the pixels.
jbyteArray ToArray(JNIEnv* env, std::unique_ptr<Bitmap> const& bitmap) {
    if (!bitmap) return nullptr;
    jint const size[] = {bitmap->GetWidth(), bitmap->GetHeight()};
    jsize const bytes = size[0] * size[1] * 4;
    jbyteArray const array = env->NewByteArray(bytes + jsize{sizeof size});
    env->SetByteArrayRegion(array, 0, sizeof size, reinterpret_cast<jbyte const*>(size));
    env->SetByteArrayRegion(array, sizeof size, bytes, reinterpret_cast<jbyte const*>(bitmap->GetBuffer()));
    return array;
}

} // namespace

extern "C" {

// Java would find the graphics library's through this library's dependencies, were it not here.
JNIEXPORT jint JNICALL JNI_OnLoad(JavaVM* vm, void*) {
    javaVm = vm;
    SetLogSink([](LogLine const& line) {
        std::lock_guard<std::mutex> lock(logMutex);
        logTexts.push_back(line.text);
    });
    return JNI_VERSION_1_6;
}

JNIEXPORT jobjectArray JNICALL Java_moka_Host_takeLog(JNIEnv* env, jclass) {
    std::vector<std::string> texts;
    {
        std::lock_guard<std::mutex> lock(logMutex);
        texts = std::exchange(logTexts, {});
    }
    jobjectArray const array =
        env->NewObjectArray(static_cast<jsize>(texts.size()), env->FindClass("java/lang/String"), nullptr);
    for (std::size_t i = 0; i < texts.size(); ++i) {
        jstring const text = env->NewStringUTF(texts[i].c_str());
        env->SetObjectArrayElement(array, static_cast<jsize>(i), text);
        env->DeleteLocalRef(text);
    }
    return array;
}

JNIEXPORT jint JNICALL Java_moka_Host_loadBridge(JNIEnv* env, jclass) {
    return MKBitmapFactory_OnLoad(javaVm, env);
}

JNIEXPORT jbyteArray JNICALL Java_moka_Host_decodeThroughJava(JNIEnv* env, jclass, jstring path, jint width,
                                                              jint height) {
    String const file = ToString(env, path);
    return ToArray(env, std::unique_ptr<Bitmap>(CreateBitmapJNI(&file, width, height)));
}

JNIEXPORT jbyteArray JNICALL Java_moka_Host_decodeNatively(JNIEnv* env, jclass, jstring path) {
    String const file = ToString(env, path);
    return ToArray(env, std::unique_ptr<Bitmap>(BitmapFactory::CreateBitmapForGraphics(&file)));
}

JNIEXPORT jboolean JNICALL Java_moka_Host_save(JNIEnv* env, jclass, jstring path, jint width, jint height,
                                               jbyteArray pixels) {
    String const file = ToString(env, path);
    std::vector<unsigned char> copy(static_cast<std::size_t>(env->GetArrayLength(pixels)));
    env->GetByteArrayRegion(pixels, 0, static_cast<jsize>(copy.size()),
                            reinterpret_cast<jbyte*>(copy.data()));
    Bitmap bitmap;
    return bitmap.Construct(copy.data(), width, height, width * 4, Bitmap::kFormatRgba8888, false, false) &&
           BitmapFactory::SaveBitmap(&bitmap, &file, 100);
}

JNIEXPORT jdoubleArray JNICALL Java_moka_Host_readDisplay(JNIEnv* env, jclass, jlong handle) {
    IDisplay const& display = *reinterpret_cast<Display const*>(static_cast<std::intptr_t>(handle));
    jdouble const values[] = {
        jdouble(display.GetWidthPixels()),
        jdouble(display.GetHeightPixels()),
        jdouble(display.GetSystemDensity()),
        jdouble(display.GetLocalWidthPixels()),
        jdouble(display.GetLocalHeightPixels()),
        jdouble(display.GetDensity()),
        jdouble(display.GetScaledDensity()),
        jdouble(display.GetDensityDpi()),
        jdouble(display.GetXdpi()),
        jdouble(display.GetYdpi()),
        jdouble(display.GetLayoutDirection()),
        jdouble(display.GetOrientation()),
        jdouble(display.GetScreenOrientation()),
        jdouble(display.IsTablet()),
        jdouble(display.IsUWP()),
        jdouble(display.GetAppVsyncOffsetNanos()),
        jdouble(display.IsTabletUX()),
        jdouble(display.GetDebugLevel()),
    };
    jsize const count = static_cast<jsize>(std::size(values));
    jdoubleArray const array = env->NewDoubleArray(count);
    env->SetDoubleArrayRegion(array, 0, count, values);
    return array;
}
}
