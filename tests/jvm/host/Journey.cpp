#include "tests/jvm/host/Journey.h"

#include "moka/base/RefPtr.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/host/RenderThread.h"

#include <chrono>
#include <future>

namespace Moka::Testing {
namespace {

constexpr std::chrono::seconds kPatience{30};

bool Await(std::future<bool> result) {
    return result.wait_for(kPatience) == std::future_status::ready && result.get();
}

// The loader's thread is Java's own, and attached all along.
std::string GetJavaThreadName(JavaVM* vm) {
    void* found = nullptr;
    if (vm->GetEnv(&found, JNI_VERSION_1_6) != JNI_OK) return "!not a thread of Java's";
    auto* const env = static_cast<JNIEnv*>(found);
    env->PushLocalFrame(8);
    jclass const type = env->FindClass("java/lang/Thread");
    jmethodID const current = env->GetStaticMethodID(type, "currentThread", "()Ljava/lang/Thread;");
    jmethodID const getName = env->GetMethodID(type, "getName", "()Ljava/lang/String;");
    jobject const thread = env->CallStaticObjectMethod(type, current);
    if (env->ExceptionCheck()) return "!no current thread";
    auto const name = static_cast<jstring>(env->CallObjectMethod(thread, getName));
    if (env->ExceptionCheck()) return "!no name";
    char text[64] = {};
    env->GetStringUTFRegion(name, 0, env->GetStringLength(name), text);
    env->PopLocalFrame(nullptr);
    return text;
}

} // namespace

std::string LoadDrawSave(JavaVM* vm, String const& from, String const& to) {
    std::string result;
    std::unique_ptr<RenderThread> const queue = RenderThread::Start({}, &result);
    if (!queue) return "!" + result;
    RefPtr<IMKBitmap> loadedBitmap;
    std::promise<bool> loaded, saved;
    MKBitmapLoader::Callback callback;
    callback.onLoad = [&](int, String const&, IMKBitmap& bitmap) {
        loadedBitmap = RefPtr<IMKBitmap>::Share(&bitmap);
        result = GetJavaThreadName(vm);
        loaded.set_value(true);
    };
    callback.onLoadError = [&](int, String const&) { loaded.set_value(false); };
    callback.onSave = [&](int, String const&, void*) { saved.set_value(true); };
    callback.onSaveError = [&](int, String const&, void*) { saved.set_value(false); };
    MKBitmapLoader loader("journey", &callback);
    if (!loader.RequestLoad(1, from, queue.get()) || !Await(loaded.get_future())) return "!not loaded";
    IMKCanvas* const canvas = MKGraphicsFactory::CreateCanvas(queue.get(), loadedBitmap.Get(), 1);
    if (!canvas) return "!no canvas";
    MKPaint paint;
    paint.SetColor(static_cast<int>(0xff2040c0));
    paint.SetAntiAliasing(false);
    canvas->DrawRect(20, 10, 60, 50, &paint);
    MKGraphicsFactory::ReleaseCanvas(canvas);
    if (!loader.RequestSave(2, to, *loadedBitmap, nullptr, 100) || !Await(saved.get_future())) {
        return "!not saved";
    }
    return result;
}

} // namespace Moka::Testing
