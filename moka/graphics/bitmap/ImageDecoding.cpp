#include "moka/graphics/bitmap/ImageDecoding.h"

#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/base/log/AndroidLog.h"

#include <atomic>
#include <new>

namespace Moka {
namespace {

std::atomic<bool> useNativeDecoder{false};
std::atomic<detail::JavaDecoder> javaDecoder{nullptr};

// Calls function. Returns false if memory runs out.
template <class Function>
bool WithoutThrowing(Function const& function) {
    try {
        return function();
    } catch (std::bad_alloc const&) {
        return false;
    }
}

Bitmap* DecodeNatively(String const* path, int width, int height) {
    if (width != 0 && height != 0) return BitmapFactory::CreateBitmap(path, width, height);
    return BitmapFactory::CreateBitmapForGraphics(path);
}

} // namespace

bool GetExtensionByFile(String const* path, String* extension) {
    if (!path || !extension) return false;
    return WithoutThrowing([&] {
        String const source = *path; // extension may be path itself
        extension->Clear();
        return source.SubString(source.ReverseFind(".") + 1, extension);
    });
}

bool CompareExtensionByFile(String const* path, char const* extension) {
    String own;
    return extension && GetExtensionByFile(path, &own) &&
           WithoutThrowing([&] { return own.CompareTo(extension) == 0; });
}

void MKBitmapFactory_UseNativeDecoder() { useNativeDecoder = true; }

Bitmap* CreateBitmapJNI(String const* path, int width, int height) {
    if (useNativeDecoder) return DecodeNatively(path, width, height);
    if (detail::JavaDecoder const decode = javaDecoder) return decode(path, width, height);
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "MKBitmapFactory : gDecodeFile Not loaded");
    return nullptr;
}

void detail::SetJavaDecoder(JavaDecoder decoder) { javaDecoder = decoder; }

Bitmap* detail::DecodeFile(String const* path, int width, int height) {
    if (CompareExtensionByFile(path, "mki")) return DecodeNatively(path, width, height);
    return CreateBitmapJNI(path, width, height);
}

} // namespace Moka
