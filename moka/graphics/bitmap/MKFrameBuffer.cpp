#include "moka/graphics/bitmap/MKFrameBuffer.h"

#include "moka/graphics/bitmap/MKDepthStencilBuffer.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/RendererFactory.h"

namespace Moka {

MKFrameBuffer::MKFrameBuffer(int, int, ITextureObject* texture)
    : mRenderTarget(RendererFactory::CreateOffscreenRenderTarget(texture)) {}

MKFrameBuffer::~MKFrameBuffer() {
    if (mRenderTarget) mRenderTarget->Release();
}

void MKFrameBuffer::AttachDepthStencilBufferRT(MKDepthStencilBuffer* buffer) {
    if (mRenderTarget) mRenderTarget->AttachDepthStencil(buffer->GetDepthStencilBuffer());
}

void MKFrameBuffer::DetachDepthStencilBufferRT() {
    if (mRenderTarget) mRenderTarget->DetachDepthStencil();
}

void MKFrameBuffer::ClearColorRT(float r, float g, float b, float a) {
    if (mRenderTarget) mRenderTarget->ClearColor(r, g, b, a);
}

void MKFrameBuffer::ClearDepthStencilRT(bool clearDepth, float depth, bool clearStencil, int stencil) {
    if (mRenderTarget) mRenderTarget->ClearDepthStencil(clearDepth, depth, clearStencil, stencil);
}

} // namespace Moka
