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

// External GL may have left them off, and a commit keeps states that nobody has set.
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
        // The clip of a stencil would be drawn into somebody else's.
        __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                            "MKPenCanvasImpl::EnableClipRT: the bitmap (\"%s\") has no frame buffer; what is "
                            "drawn now goes to the one that the host has bound, so draw nothing",
                            GetBitmap()->GetTag());
    } else if (MKCanvasClipping* const clipping = GetClipping()) {
        clipping->EnableClipRT(-1);
    }
    SwitchColorWritesOn();
    RendererFactory::Commit(); // what is drawn next is not drawn through the renderer
}

void MKPenCanvasImpl::DisableClipRT() {
    Trace::NameTask("DisableClipRT");
    if (MKCanvasClipping* const clipping = GetClipping()) clipping->DisableClipRT();
    RendererFactory::InvalidateState();
}

} // namespace Moka
