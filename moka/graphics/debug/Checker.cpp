#include "moka/graphics/debug/Checker.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/debug/MKBitmapChecker.h"
#include "moka/graphics/debug/MKCanvasChecker.h"
#include "moka/graphics/debug/MKPenCanvasChecker.h"

#include <cxxabi.h>

#include <stdexcept>

namespace Moka::detail {
namespace {

constexpr char const* kLogTag = "mok_log";
constexpr char const* kFunction = "checkRefCount";

} // namespace

void FailReleased(IMKBitmap const* bitmap, char const* tag, int refCount) {
    __android_log_print(ANDROID_LOG_ERROR, kLogTag, "%s, Bitmap address : %p, tag : %s ref count : %d",
                        kFunction, static_cast<void const*>(bitmap), tag, refCount);
    throw std::logic_error("Bitmap was already released!!");
}

void FailReleased(IMKCanvasBase const* canvas, char const* tag, int refCount) {
    __android_log_print(ANDROID_LOG_ERROR, kLogTag, "%s, Canvas address : %p, tag : %s ref count : %d",
                        kFunction, static_cast<void const*>(canvas), tag, refCount);
    throw std::logic_error("Canvas was already released!!");
}

void EndAsPureVirtual() { abi::__cxa_pure_virtual(); }

} // namespace Moka::detail

namespace Moka {

MKBitmapChecker::MKBitmapChecker(IMKBitmap* bitmap) : Checker(bitmap) {}

MKBitmapChecker::~MKBitmapChecker() = default;

MKCanvasChecker::MKCanvasChecker(IMKCanvas* canvas) : CanvasChecker(canvas) {}

MKCanvasChecker::~MKCanvasChecker() = default;

MKPenCanvasChecker::MKPenCanvasChecker(IMKPenCanvas* canvas) : CanvasChecker(canvas) {}

MKPenCanvasChecker::~MKPenCanvasChecker() = default;

} // namespace Moka
