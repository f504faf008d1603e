#include "moka/graphics/canvas/CanvasFrontEnd.h"

#include "moka/graphics/canvas/CanvasRequest.h"
#include "moka/graphics/canvas/ClipInfo.h"
#include "moka/graphics/canvas/MKCanvas.h"
#include "moka/graphics/canvas/MKCanvasImpl.h"
#include "moka/graphics/canvas/MKCanvasRT.h"
#include "moka/graphics/canvas/MKPenCanvas.h"
#include "moka/graphics/canvas/MKPenCanvasImpl.h"
#include "moka/graphics/canvas/MKPenCanvasRT.h"
#include "moka/graphics/math/Vector.h"
#include "moka/graphics/paint/UnpackColor.h"

#include <new>

namespace Moka {

int CanvasState::Save(IMKCanvasBase::SaveFlag flag) {
    bool const all = flag == IMKCanvasBase::SaveAll;
    Level level = mLevels.empty() ? Level() : mLevels.back();
    if (all || flag == IMKCanvasBase::SaveMatrix) level.matrix = matrix;
    if (all || flag == IMKCanvasBase::SaveClip) level.clipCount = clipCount;
    int const index = static_cast<int>(mLevels.size());
    try {
        mLevels.push_back(level);
    } catch (std::bad_alloc const&) {
        // If memory runs out, there is no new level.
    }
    return index;
}

bool CanvasState::Restore(int level) {
    std::size_t const index = level < 0 ? mLevels.size() - 1 : static_cast<std::size_t>(level);
    if (index >= mLevels.size()) return false; // also for a negative level without levels
    matrix = mLevels[index].matrix;
    clipCount = mLevels[index].clipCount;
    mLevels.resize(index);
    return true;
}

template <class Interface, class Impl, bool kPosts>
CanvasFrontEnd<Interface, Impl, kPosts>::CanvasFrontEnd(IGLMsgQueue* queue, IMKBitmap* bitmap)
    : mMsgQueue(queue), mImpl(bitmap ? new (std::nothrow) Impl(queue, bitmap, !kPosts) : nullptr) {}

template <class Interface, class Impl, bool kPosts>
CanvasFrontEnd<Interface, Impl, kPosts>::~CanvasFrontEnd() {
    if constexpr (kPosts) {
        if (mImpl) WorkerTask::PostDelete(mMsgQueue, mImpl);
    } else {
        delete mImpl;
    }
}

template <class Interface, class Impl, bool kPosts>
IMKBitmap* CanvasFrontEnd<Interface, Impl, kPosts>::GetBitmap() {
    return mImpl ? mImpl->GetBitmap() : nullptr;
}

template <class Interface, class Impl, bool kPosts>
void CanvasFrontEnd<Interface, Impl, kPosts>::Clear(int argb) {
    Vector4<float> const c = detail::UnpackColor(argb);
    Clear(c.x, c.y, c.z, c.w);
}

template <class Interface, class Impl, bool kPosts>
void CanvasFrontEnd<Interface, Impl, kPosts>::Clear(float r, float g, float b, float a) {
    detail::Request<kPosts>(mMsgQueue, mImpl, &Impl::ClearRT, Vector4<float>(r, g, b, a));
}

template <class Interface, class Impl, bool kPosts>
void CanvasFrontEnd<Interface, Impl, kPosts>::ClearAll(int argb) {
    Vector4<float> const c = detail::UnpackColor(argb);
    ClearAll(c.x, c.y, c.z, c.w);
}

template <class Interface, class Impl, bool kPosts>
void CanvasFrontEnd<Interface, Impl, kPosts>::ClearAll(float r, float g, float b, float a) {
    detail::Request<kPosts>(mMsgQueue, mImpl, &Impl::ClearAllRT, Vector4<float>(r, g, b, a));
}

template <class Interface, class Impl, bool kPosts>
void CanvasFrontEnd<Interface, Impl, kPosts>::Restore(int level) {
    if (!mState.Restore(level)) return;
    detail::Request<kPosts>(mMsgQueue, mImpl, &Impl::RemoveClipRectRT, mState.clipCount);
}

template <class Interface, class Impl, bool kPosts>
void CanvasFrontEnd<Interface, Impl, kPosts>::SetClipRect(int x, int y, int width, int height, ClipOp op) {
    detail::Request<kPosts>(mMsgQueue, mImpl, &Impl::AddClipRectRT,
                            ClipInfo{x, y, width, height, op, mState.matrix});
    ++mState.clipCount; // even if the queue refused
}

template class CanvasFrontEnd<IMKCanvas, MKCanvasImpl, true>;
template class CanvasFrontEnd<IMKCanvas, MKCanvasImpl, false>;
template class CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, true>;
template class CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, false>;

} // namespace Moka
