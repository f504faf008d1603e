#include "moka/graphics/canvas/MKPenCanvas.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/MKPenCanvasImpl.h"
#include "moka/graphics/canvas/MKPenCanvasRT.h"

namespace Moka {
namespace {

// Returns the bitmap if it is a texture bitmap. Otherwise logs an error and returns null.
IMKBitmap* PenTarget(IMKBitmap* bitmap, char const* className) {
    if (bitmap->GetTextureBitmap()) return bitmap;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "%s, PenCanvas can't set ScreenBitmap", className);
    return nullptr;
}

} // namespace

template <bool kPosts>
PenCanvas<kPosts>::PenCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap, char const* className)
    : CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, kPosts>(queue, PenTarget(bitmap, className)) {}

template <bool kPosts>
Matrix4<float> PenCanvas<kPosts>::GetCanvasMatrix() {
    Matrix4<float> const model = FromMatrix3(this->mState.matrix);
    return this->mImpl ? this->mImpl->GetCanvasMatrix() * model : model;
}

template <bool kPosts>
void PenCanvas<kPosts>::EnableClipRT(int frameBuffer) {
    if (this->mImpl) this->mImpl->EnableClipRT(frameBuffer);
}

template <bool kPosts>
void PenCanvas<kPosts>::DisableClipRT() {
    if (this->mImpl) this->mImpl->DisableClipRT();
}

template class PenCanvas<true>;
template class PenCanvas<false>;

MKPenCanvas::MKPenCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap) : PenCanvas(queue, bitmap, "MKPenCanvas") {}

MKPenCanvas::~MKPenCanvas() = default;

MKPenCanvasRT::MKPenCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap)
    : PenCanvas(queue, bitmap, "MKPenCanvasRT") {}

MKPenCanvasRT::~MKPenCanvasRT() = default;

} // namespace Moka
