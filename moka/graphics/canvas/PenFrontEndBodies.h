// PenFrontEndBodies.h: the bodies of PenFrontEnd, for the sources that instantiate it.
#pragma once

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/CanvasFrontEndBodies.h"
#include "moka/graphics/canvas/MKPenCanvasImpl.h"
#include "moka/graphics/canvas/PenFrontEnd.h"

namespace Moka::detail {

// The bitmap, or null when a pen canvas cannot draw onto it.
inline IMKBitmap* PenTarget(IMKBitmap* bitmap, char const* className) {
    if (bitmap->GetTextureBitmap()) return bitmap;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "%s, PenCanvas can't set ScreenBitmap", className);
    return nullptr;
}

template <class Reach>
PenFrontEnd<Reach>::PenFrontEnd(IGLMsgQueue* queue, IMKBitmap* bitmap, char const* className)
    : CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, Reach>(queue, PenTarget(bitmap, className)) {}

template <class Reach>
Matrix4<float> PenFrontEnd<Reach>::GetCanvasMatrix() {
    Matrix4<float> const model = FromMatrix3(this->GetCurrentMatrix());
    return this->GetImpl() ? this->GetImpl()->GetCanvasMatrix() * model : model;
}

template <class Reach>
void PenFrontEnd<Reach>::EnableClipRT(int frameBuffer) {
    if (this->GetImpl()) this->GetImpl()->EnableClipRT(frameBuffer);
}

template <class Reach>
void PenFrontEnd<Reach>::DisableClipRT() {
    if (this->GetImpl()) this->GetImpl()->DisableClipRT();
}

} // namespace Moka::detail
