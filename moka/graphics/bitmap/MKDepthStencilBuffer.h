// MKDepthStencilBuffer: owns one combined depth and stencil buffer of the renderer.
// Thread: render thread only; callers elsewhere route its deletion there.
#pragma once

#include "moka/base/Export.h"

namespace Moka {

class IDepthStencilBuffer;

class MOKA_API MKDepthStencilBuffer {
public:
    MKDepthStencilBuffer(int width, int height); // pixels
    MKDepthStencilBuffer(MKDepthStencilBuffer const&) = delete;
    MKDepthStencilBuffer& operator=(MKDepthStencilBuffer const&) = delete;
    virtual ~MKDepthStencilBuffer();

    // Null when the renderer could not make it.
    IDepthStencilBuffer* GetDepthStencilBuffer() const { return mDepthStencilBuffer; }

private:
    IDepthStencilBuffer* mDepthStencilBuffer;
};

} // namespace Moka
