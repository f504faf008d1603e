// CanvasFrontEndBodies.h: the bodies of CanvasFrontEnd, for the sources that instantiate it.
#pragma once

#include "moka/graphics/canvas/CanvasFrontEnd.h"
#include "moka/graphics/canvas/CanvasReach.h"
#include "moka/graphics/canvas/ClipInfo.h"
#include "moka/graphics/canvas/MKPaint.h"
#include "moka/graphics/math/Vector.h"

#include <new>
#include <utility>

namespace Moka::detail {

// 0xAARRGGBB as a paint unpacks it.
inline Vector4<float> Unpack(int argb) {
    MKPaint paint;
    paint.SetColor(argb);
    return paint.GetColor();
}

template <class Interface, class Impl, class Reach>
CanvasFrontEnd<Interface, Impl, Reach>::CanvasFrontEnd(IGLMsgQueue* queue, IMKBitmap* bitmap)
    : mMsgQueue(queue),
      mImpl(bitmap ? new (std::nothrow) Impl(queue, bitmap, Reach::kOnRenderThread) : nullptr) {}

template <class Interface, class Impl, class Reach>
CanvasFrontEnd<Interface, Impl, Reach>::~CanvasFrontEnd() {
    if (mImpl) Reach::Delete(mMsgQueue, mImpl);
}

template <class Interface, class Impl, class Reach>
template <class Function, class... Values>
bool CanvasFrontEnd<Interface, Impl, Reach>::Request(Function function, Values&&... values) {
    return mImpl && Reach::Call(mMsgQueue, mImpl, function, std::forward<Values>(values)...);
}

template <class Interface, class Impl, class Reach>
IMKBitmap* CanvasFrontEnd<Interface, Impl, Reach>::GetBitmap() {
    return mImpl ? mImpl->GetBitmap() : nullptr;
}

template <class Interface, class Impl, class Reach>
void CanvasFrontEnd<Interface, Impl, Reach>::Clear(int argb) {
    Vector4<float> const c = Unpack(argb);
    Clear(c.x, c.y, c.z, c.w);
}

template <class Interface, class Impl, class Reach>
void CanvasFrontEnd<Interface, Impl, Reach>::Clear(float r, float g, float b, float a) {
    Request(&Impl::ClearRT, Vector4<float>(r, g, b, a));
}

template <class Interface, class Impl, class Reach>
void CanvasFrontEnd<Interface, Impl, Reach>::ClearAll(int argb) {
    Vector4<float> const c = Unpack(argb);
    ClearAll(c.x, c.y, c.z, c.w);
}

template <class Interface, class Impl, class Reach>
void CanvasFrontEnd<Interface, Impl, Reach>::ClearAll(float r, float g, float b, float a) {
    Request(&Impl::ClearAllRT, Vector4<float>(r, g, b, a));
}

template <class Interface, class Impl, class Reach>
void CanvasFrontEnd<Interface, Impl, Reach>::Restore(int level) {
    if (mState.Restore(level)) Request(&Impl::RemoveClipRectRT, mState.clipCount);
}

template <class Interface, class Impl, class Reach>
void CanvasFrontEnd<Interface, Impl, Reach>::SetClipRect(int x, int y, int width, int height, ClipOp op) {
    Request(&Impl::AddClipRectRT, ClipInfo{x, y, width, height, op, mState.matrix});
    ++mState.clipCount; // also when the queue refused
}

} // namespace Moka::detail
