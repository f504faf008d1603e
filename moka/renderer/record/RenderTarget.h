// RenderTarget: a render target that draws into a texture or into a frame buffer of the host.
#pragma once

#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/device/RunState.h"

#include <memory>

namespace Moka::detail {

class DepthStencilBuffer;
class FrameBuffer;
class Recorder;
class TextureStorage;

class RenderTarget final : public IRenderTarget {
public:
    RenderTarget(std::shared_ptr<Recorder> recorder, std::shared_ptr<FrameBuffer> frameBuffer, int width,
                 int height);
    RenderTarget(RenderTarget const&) = delete;
    ~RenderTarget();
    RenderTarget& operator=(RenderTarget const&) = delete;

    void Activate() override;
    void Deactivate(bool discardColor, bool discardDepthStencil) override;
    void ReadPixels(int x, int y, int width, int height, PixelDestination const& destination) override;
    void Release() override;
    void ClearColor(float r, float g, float b, float a) override;
    void AttachDepthStencil(IDepthStencilBuffer* buffer) override;
    void DetachDepthStencil() override;
    void ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) override;

    // The reference for commands. It names the depth-stencil buffer that is attached now.
    TargetRef const& GetRef() const { return mRef; }
    std::shared_ptr<FrameBuffer> const& GetFrameBuffer() const { return mFrameBuffer; }
    // The attached buffer, or null.
    DepthStencilBuffer const* GetDepthStencil() const { return mDepthStencil; }
    // Detaches the buffer for later commands. Recorded commands still use it.
    void ForgetDepthStencil();

private:
    bool IsHosts() const { return mRef.texture == 0; }
    bool MayAttach(DepthStencilBuffer const& buffer) const;
    bool HasStencil() const;

    std::shared_ptr<Recorder> const mRecorder;
    std::shared_ptr<FrameBuffer> const mFrameBuffer;
    TargetRef mRef;
    DepthStencilBuffer* mDepthStencil = nullptr; // attached, not owned
};

} // namespace Moka::detail
