#include "moka/renderer/record/GraphicsObject.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/record/Observer.h"
#include "moka/renderer/record/Recorder.h"

#include <algorithm>
#include <new>
#include <utility>

namespace Moka::detail {

GraphicsObject::GraphicsObject(std::shared_ptr<Recorder> recorder, PrimitiveType primitive,
                               VertexDescriptor const& descriptor)
    : mRecorder(std::move(recorder)),
      mPrimitive(primitive),
      mFormat(mRecorder->GetDevice().AddVertexFormat(descriptor)),
      mFloatsPerVertex(descriptor.GetFloatCount()) {
    ++mRecorder->counters.graphicsObjects;
}

GraphicsObject::~GraphicsObject() {
    mRecorder->RemoveHolder(*this);
    --mRecorder->counters.graphicsObjects;
}

void GraphicsObject::SetVertices(int stream, void const* data, int count) {
    if (theObserver) theObserver->OnVertices(this, stream, data, count);
    mCount = 0;
    mBounds = {};
    if (MOKA_UNLIKELY(stream != 0 || count < 0 || (count > 0 && !data))) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "vertices are refused: stream %d (there is only 0), %d of them%s", stream, count,
                            data ? "" : ", no data");
        return;
    }
    if (MOKA_UNLIKELY(count == 0 || !mRecorder->Begin())) return;
    try {
        HandOver(static_cast<float const*>(data), count);
    } catch (std::bad_alloc const&) {
        // The object then has no vertices, and draws do nothing.
    }
}

inline void GraphicsObject::HandOver(float const* data, int count) {
    DrawListBuilder& list = mRecorder->list;
    // Without this, vertices that no draw uses could grow the list without limit.
    if (list.IsFull()) mRecorder->Flush();
    list.AddVertices(data, count, mFloatsPerVertex, mPlace);
    if (MOKA_UNLIKELY(mHeldList != mPlace.list)) mRecorder->AddHolder(*this);
    mHeldList = mPlace.list;
    mCount = count;
}

bool GraphicsObject::Draw(int first, int count, int instances) {
    if (theObserver) Observe(ObjectKind::kGraphicsObject, this, "Draw", first, count, instances);
    RequestScope const scope(*mRecorder);
    if (!scope) return false;
    if (MOKA_UNLIKELY(instances != 1)) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "a draw of %d instances is refused; pass 1",
                            instances);
        return false;
    }
    int const start = std::clamp(first, 0, mCount);
    int const left = mCount - start;
    int const drawn = count < 0 ? left : std::min(count, left);
    if (theObserver) ObserveDraw(start, drawn);
    try {
        return mRecorder->Draw(*this, mFormat, mPrimitive, start, drawn);
    } catch (std::bad_alloc const&) {
        // Flushing the draws recorded so far needs no more memory.
        mRecorder->Flush();
        return false;
    }
}

void GraphicsObject::ObserveDraw(int first, int count) const {
    if (!mRecorder->requested->GetProgram()) return;
    float const* const vertices = GetVertices();
    theObserver->OnDraw({*mRecorder->requested, this, mPrimitive,
                         vertices ? vertices + std::ptrdiff_t{first} * mFloatsPerVertex : nullptr,
                         mFloatsPerVertex, first, count});
}

void GraphicsObject::SetBounds(DrawBounds bounds) { mBounds = bounds; }

void GraphicsObject::Release() {
    Observe(ObjectKind::kGraphicsObject, this, "Release");
    delete this;
}

float const* GraphicsObject::GetVertices() const {
    if (mCount == 0) return nullptr;
    return mRecorder->list.Has(mPlace) ? mRecorder->list.GetVertices(mPlace) : mKept.data();
}

ListVertices const& GraphicsObject::PlaceVertices() {
    if (MOKA_UNLIKELY(!mRecorder->list.Has(mPlace))) {
        mRecorder->list.AddVertices(mKept.data(), mCount, mFloatsPerVertex, mPlace);
    }
    return mPlace;
}

void GraphicsObject::TakeBackVertices() noexcept {
    if (!mRecorder->list.Has(mPlace)) return;
    KeepVertices();
    mRecorder->list.DropVertices(mPlace);
    mPlace = {};
}

void GraphicsObject::KeepVertices() noexcept {
    if (mCount == 0 || !mRecorder->list.Has(mPlace)) return;
    try {
        float const* const vertices = mRecorder->list.GetVertices(mPlace);
        mKept.assign(vertices, vertices + mPlace.size);
    } catch (std::bad_alloc const&) {
        mCount = 0;
    }
}

} // namespace Moka::detail
