#include "moka/renderer/record/RenderTarget.h"

#include "moka/base/Trace.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/record/DepthStencilBuffer.h"
#include "moka/renderer/record/FrameBuffer.h"
#include "moka/renderer/record/Observer.h"
#include "moka/renderer/record/Recorder.h"
#include "moka/renderer/record/TextureStorage.h"

#include <utility>

namespace Moka::detail {
namespace {

constexpr ObjectKind kTargetKind = ObjectKind::kRenderTarget;

} // namespace

RenderTarget::RenderTarget(std::shared_ptr<Recorder> recorder, std::shared_ptr<FrameBuffer> frameBuffer,
                           int width, int height)
    : mRecorder(std::move(recorder)), mFrameBuffer(std::move(frameBuffer)) {
    TextureStorage const* const storage = mFrameBuffer->GetStorage();
    mRef = {mFrameBuffer->GetName(), storage ? storage->GetName() : 0, width, height, 0};
    ++mRecorder->counters.renderTargets;
}

RenderTarget::~RenderTarget() { --mRecorder->counters.renderTargets; }

void RenderTarget::Activate() {
    if (theObserver) Observe(kTargetKind, this, "Activate");
    if (mRecorder->Begin()) mRecorder->Activate(*this);
}

void RenderTarget::Deactivate(bool discardColor, bool discardDepthStencil) {
    if (theObserver) Observe(kTargetKind, this, "Deactivate", discardColor, discardDepthStencil);
    if (MOKA_UNLIKELY(!mRecorder->Begin() || mRecorder->GetActive() != this)) return;
    if (MOKA_UNLIKELY(discardColor || discardDepthStencil)) {
        if (discardDepthStencil) mRecorder->ForgetStencil(mRef.depthStencil);
        mRecorder->list.Add(Discard{mRef, discardColor, discardDepthStencil});
    }
    mRecorder->Deactivate(*this);
}

void RenderTarget::ReadPixels(int x, int y, int width, int height, PixelDestination const& destination) {
    Observe(kTargetKind, this, "ReadPixels", x, y, width, height, destination.rowLength, destination.skipRows,
            destination.skipPixels);
    RequestScope const scope(*mRecorder);
    if (!scope || !destination.pixels) return;
    int const rowLength = destination.rowLength > 0 ? destination.rowLength : width;
    if (rowLength < width || destination.skipRows < 0 || destination.skipPixels < 0) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "reading %d pixels a row into rows of %d, %d rows down and %d pixels in, is "
                            "refused; rows must not overlap and skips must not be negative",
                            width, rowLength, destination.skipRows, destination.skipPixels);
        return;
    }
    PixelBlock block = PixelBlock::Clip(x, y, width, height, mRef.width, mRef.height);
    if (block.IsEmpty()) return;
    block.skippedRows += destination.skipRows;
    block.skippedPixels += destination.skipPixels;
    TraceScope const trace("renderer", "ReadPixels", "bytes", block.GetBytes());
    mRecorder->Flush();
    mRecorder->GetDevice().ReadPixels(mRef, block, destination.pixels, rowLength);
    mRecorder->counters.bytesReadBack += block.GetBytes();
}

void RenderTarget::Release() {
    Observe(kTargetKind, this, "Release");
    // Keeps the recorder alive after `delete this`.
    std::shared_ptr<Recorder> const recorder = mRecorder;
    RequestScope const scope(*recorder);
    ForgetDepthStencil();
    if (scope) recorder->Deactivate(*this);
    delete this;
}

void RenderTarget::ClearColor(float r, float g, float b, float a) {
    Observe(kTargetKind, this, "ClearColor", r, g, b, a);
    RequestScope const scope(*mRecorder);
    if (!scope) return;
    mRecorder->mipmaps.Forget(mRef.texture);
    std::array<float, 4> const color{r, g, b, a};
    RequestedState& requested = *mRecorder->requested;
    if (theObserver) theObserver->OnClear({requested, this, true, color, false, 0, false, 0});
    if (requested.GetDepthStencil().IsStencil() && HasStencil()) {
        mRecorder->fill.Add(*mRecorder, mRef, color);
        mRecorder->AfterDraw();
    } else {
        mRecorder->Add(ColorClear{mRef, requested.GetScissor(), color});
    }
}

// A frame buffer of the host may have a stencil buffer or not. Fill draws correctly in both cases.
bool RenderTarget::HasStencil() const { return mDepthStencil || IsHosts(); }

void RenderTarget::AttachDepthStencil(IDepthStencilBuffer* buffer) {
    Observe(kTargetKind, this, "AttachDepthStencil", static_cast<void const*>(buffer));
    RequestScope const scope(*mRecorder);
    if (!scope) return;
    auto* const wanted = static_cast<DepthStencilBuffer*>(buffer);
    if (wanted == mDepthStencil || (wanted && !MayAttach(*wanted))) return;
    ForgetDepthStencil();
    if (!wanted) return;
    if (RenderTarget* const other = wanted->GetTarget()) other->ForgetDepthStencil();
    mDepthStencil = wanted;
    mRef.depthStencil = wanted->GetName();
    wanted->SetTarget(this);
}

bool RenderTarget::MayAttach(DepthStencilBuffer const& buffer) const {
    bool const fits = buffer.GetWidth() == mRef.width && buffer.GetHeight() == mRef.height;
    bool const sameContext = buffer.GetRecorder() == mRecorder;
    if (!IsHosts() && fits && sameContext) return true;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "a depth-stencil buffer of %d x %d cannot be attached to a %s of %d x %d%s",
                        buffer.GetWidth(), buffer.GetHeight(),
                        IsHosts() ? "frame buffer of the host" : "render target", mRef.width, mRef.height,
                        sameContext ? "" : " of another context");
    return false;
}

void RenderTarget::DetachDepthStencil() {
    Observe(kTargetKind, this, "DetachDepthStencil", static_cast<void const*>(mDepthStencil));
    RequestScope const scope(*mRecorder);
    if (scope) ForgetDepthStencil();
}

void RenderTarget::ForgetDepthStencil() {
    if (!mDepthStencil) return;
    mDepthStencil->SetTarget(nullptr);
    mDepthStencil = nullptr;
    mRef.depthStencil = 0;
}

void RenderTarget::ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) {
    Observe(kTargetKind, this, "ClearDepthStencil", clearDepth, depth, clearStencil, stencil);
    RequestScope const scope(*mRecorder);
    if (!scope) return;
    RequestedState& requested = *mRecorder->requested;
    if (theObserver) {
        theObserver->OnClear({requested, this, false, {}, clearDepth, depth, clearStencil, stencil});
    }
    if (!mDepthStencil || (!clearDepth && !clearStencil)) return;
    mRecorder->AddStencilClear({mRef, requested.GetScissor(), clearDepth, clearStencil, depth, stencil});
}

} // namespace Moka::detail
