// MKDepthStencilBuffer: owns one combined depth and stencil buffer of the renderer.
// Thread: render thread only. Other threads post its deletion.
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

    // Null if the renderer could not create it.
    IDepthStencilBuffer* GetDepthStencilBuffer() const { return mDepthStencilBuffer; }

private:
    IDepthStencilBuffer* mDepthStencilBuffer;
};

} // namespace Moka
