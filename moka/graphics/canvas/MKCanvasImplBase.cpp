#include "moka/graphics/canvas/MKCanvasImplBase.h"

#include "moka/base/Trace.h"
#include "moka/graphics/bitmap/IMKBitmapCanvasAttachable.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/renderer/RendererFactory.h"

#include <new>

namespace Moka {

namespace {

IMKBitmap* AddReference(IMKBitmap* bitmap) {
    bitmap->Ref();
    return bitmap;
}

} // namespace

MKCanvasImplBase::Target::Target(IMKBitmap* target, bool onRenderThread)
    : bitmap(AddReference(target)),
      strips(target->GetTextureBitmap()),
      attachable(target->GetBitmapCanvasAttachable()) {
    if (attachable && onRenderThread)
        attachable->AttachToCanvasRT(false);
    else if (attachable)
        attachable->AttachToCanvas();
}

MKCanvasImplBase::Target::~Target() {
    if (attachable) attachable->DetachFromCanvasRT(false);
    bitmap->Unref();
}

MKCanvasImplBase::FrameBuffer MKCanvasImplBase::GetStrip(int index) const {
    IMKSubBitmap* const strip = mTarget.strips->GetSubBitmap(index);
    if (!strip || !HasFrameBuffer(index)) return {};
    return {strip, RectF(strip->GetBitmapRect()), index};
}

MKCanvasImplBase::FrameBuffer MKCanvasImplBase::GetWhole() const {
    IMKBitmapWritable* const writable = mTarget.bitmap->GetBitmapWritable();
    if (!writable || !HasFrameBuffer(-1)) return {};
    return {writable, RectF(mTarget.bitmap->GetBitmapRect()), -1};
}

MKCanvasImplBase::Drawing::Drawing(MKCanvasClipping* clipping, IMKBitmapWritable* writable, int index)
    : mClipping(clipping), mWritable(writable) {
    if (mClipping) mClipping->EnableClipRT(index);
    mWritable->ActivateFrameBufferRT(false);
}

MKCanvasImplBase::Drawing::~Drawing() {
    if (mClipping) mClipping->DisableClipRT();
    mWritable->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
}

MKCanvasImplBase::MKCanvasImplBase(IGLMsgQueue* queue, IMKBitmap* bitmap, bool onRenderThread)
    : mTarget(bitmap, onRenderThread) {
    if (onRenderThread)
        createClippingRT();
    else
        WorkerTask::PostMember(queue, this, &MKCanvasImplBase::createClippingRT);
}

MKCanvasImplBase::~MKCanvasImplBase() = default;

void MKCanvasImplBase::createClippingRT() {
    Trace::NameTask("createClippingRT");
    try {
        mClipping.reset(new (std::nothrow) MKCanvasClipping(GetBitmap()));
    } catch (std::bad_alloc const&) {
        // Memory ran out inside the constructor. The canvas has no clipping, as if allocating the object had
        // failed.
    }
}

bool MKCanvasImplBase::HasFrameBuffer(int index) const {
    return !mTarget.attachable || mTarget.attachable->HasFrameBufferRT(index);
}

void MKCanvasImplBase::ClearRT(Vector4<float> const& rgba) {
    Trace::NameTask("ClearRT");
    bool const clipped = mClipping && mClipping->HasClips();
    ForEachFrameBuffer([&](FrameBuffer const& frame) {
        if (mClipping) mClipping->EnableClipRT(frame.index);
        frame.writable->ClearColorRT(rgba.x, rgba.y, rgba.z, rgba.w);
        if (mClipping) mClipping->DisableClipRT();
        // Clearing does not activate the frame buffer, but the clip did.
        if (clipped) frame.writable->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
    });
}

void MKCanvasImplBase::ClearAllRT(Vector4<float> const& rgba) {
    Trace::NameTask("ClearAllRT");
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    bool const scissored = rasterizer->IsScissorEnabled();
    ScissorRect const saved = scissored ? rasterizer->GetScissorRect() : ScissorRect{};
    rasterizer->SetScissorEnabled(false);
    ForEachFrameBuffer(
        [&](FrameBuffer const& frame) { frame.writable->ClearColorRT(rgba.x, rgba.y, rgba.z, rgba.w); });
    if (!scissored) return;
    // Restores the rectangle; the test stays off.
    rasterizer->SetScissorEnabled(false);
    rasterizer->SetScissorRect(saved);
}

void MKCanvasImplBase::AddClipRectRT(ClipInfo const& info) {
    Trace::NameTask("AddClipRectRT");
    if (mClipping) mClipping->AddClipRectRT(info);
}

void MKCanvasImplBase::RemoveClipRectRT(int count) {
    Trace::NameTask("RemoveClipRectRT");
    if (mClipping) mClipping->RemoveClipRectRT(count);
}

} // namespace Moka
