#include "moka/graphics/bitmap/MKDepthStencilBuffer.h"

#include "moka/renderer/IDepthStencilBuffer.h"
#include "moka/renderer/RendererFactory.h"

namespace Moka {

MKDepthStencilBuffer::MKDepthStencilBuffer(int width, int height)
    : mDepthStencilBuffer(RendererFactory::CreateDepthStencilBuffer(width, height)) {}

MKDepthStencilBuffer::~MKDepthStencilBuffer() {
    if (mDepthStencilBuffer) mDepthStencilBuffer->Release();
}

} // namespace Moka
