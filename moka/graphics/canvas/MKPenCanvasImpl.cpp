#include "moka/graphics/canvas/MKPenCanvasImpl.h"

#include "moka/base/Trace.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/RendererFactory.h"

namespace Moka {

MKPenCanvasImpl::MKPenCanvasImpl(IGLMsgQueue* queue, IMKBitmap* bitmap, bool onRenderThread)
    : MKCanvasImplBase(queue, bitmap, onRenderThread) {}

MKPenCanvasImpl::~MKPenCanvasImpl() = default;

Matrix4<float> MKPenCanvasImpl::GetCanvasMatrix() const {
    IMKBitmapWritable* const writable = GetBitmap()->GetBitmapWritable();
    return writable ? writable->GetProjectionMatrix() : Matrix4<float>();
}

// External GL may have switched colour writes off, and a commit does not set unknown states.
void MKPenCanvasImpl::SwitchColorWritesOn() {
    if (!mColorWrites) {
        BlendStateDescriptor descriptor(false);
        descriptor.SetEnabled(false, true);
        mColorWrites.reset(RendererFactory::CreateBlendStateObject(descriptor));
    }
    if (mColorWrites) mColorWrites->Apply();
}

void MKPenCanvasImpl::EnableClipRT(int) {
    Trace::NameTask("EnableClipRT");
    if (!HasFrameBuffer(-1)) {
        // Without a frame buffer a stencil clip would be drawn into that of the host.
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "MKPenCanvasImpl::EnableClipRT: the bitmap (\"%s\") has no frame buffer; what is "
                            "drawn now goes to the one that the host has bound, so draw nothing",
                            GetBitmap()->GetTag());
    } else if (MKCanvasClipping* const clipping = GetClipping()) {
        clipping->EnableClipRT(-1);
    }
    SwitchColorWritesOn();
    RendererFactory::Commit(); // external GL draws next
}

void MKPenCanvasImpl::DisableClipRT() {
    Trace::NameTask("DisableClipRT");
    if (MKCanvasClipping* const clipping = GetClipping()) clipping->DisableClipRT();
    RendererFactory::InvalidateState();
}

} // namespace Moka
