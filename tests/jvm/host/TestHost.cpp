// The natives of the test programs' class moka.Host: what an application's own library does with ours.
#include "moka/base/log/LogSink.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/graphics/jni/OnLoad.h"

#include <cstring>
#include <jni.h>
#include <memory>
#include <mutex>
#include <string>
#include <utility>

namespace {

using namespace Moka;

JavaVM* javaVm = nullptr;

std::mutex logMutex;
std::string logText;

String ToString(JNIEnv* env, jstring text) {
    std::u16string units(static_cast<std::size_t>(env->GetStringLength(text)), u'\0');
    env->GetStringRegion(text, 0, env->GetStringLength(text), reinterpret_cast<jchar*>(units.data()));
    return String(units.data(), static_cast<int>(units.size()));
}

} // namespace

extern "C" {

// Java would find the graphics library's through this library's dependencies, were it not here.
JNIEXPORT jint JNICALL JNI_OnLoad(JavaVM* vm, void*) {
    javaVm = vm;
    SetLogSink([](LogLine const& line) {
        std::lock_guard<std::mutex> lock(logMutex);
        logText += line.text + '\n';
    });
    return JNI_VERSION_1_6;
}

JNIEXPORT jstring JNICALL Java_moka_Host_takeLog(JNIEnv* env, jclass) {
    std::lock_guard<std::mutex> lock(logMutex);
    return env->NewStringUTF(std::exchange(logText, {}).c_str());
}

JNIEXPORT jint JNICALL Java_moka_Host_loadBridge(JNIEnv* env, jclass) {
    return MKBitmapFactory_OnLoad(javaVm, env);
}

JNIEXPORT jlong JNICALL Java_moka_Host_decodeThroughJava(JNIEnv* env, jclass, jstring path, jint width,
                                                         jint height) {
    String const file = ToString(env, path);
    std::unique_ptr<Bitmap> const bitmap(CreateBitmapJNI(&file, width, height));
    return bitmap ? jlong{bitmap->GetWidth()} << 32 | bitmap->GetHeight() : 0;
}

JNIEXPORT jboolean JNICALL Java_moka_Host_isDecodedAlike(JNIEnv* env, jclass, jstring path) {
    String const file = ToString(env, path);
    std::unique_ptr<Bitmap> const a(CreateBitmapJNI(&file, 0, 0));
    std::unique_ptr<Bitmap> const b(BitmapFactory::CreateBitmapForGraphics(&file));
    if (!a || !b || a->GetWidth() != b->GetWidth() || a->GetHeight() != b->GetHeight()) return false;
    auto const bytes = static_cast<std::size_t>(a->GetWidth()) * static_cast<std::size_t>(a->GetHeight()) * 4;
    return std::memcmp(a->GetBuffer(), b->GetBuffer(), bytes) == 0;
}
}
