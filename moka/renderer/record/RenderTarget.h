// RenderTarget: a render target over a texture or over a frame buffer of the host's.
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

    // As commands name it, with the depth-stencil buffer attached now.
    TargetRef const& GetRef() const { return mRef; }
    std::shared_ptr<FrameBuffer> const& GetFrameBuffer() const { return mFrameBuffer; }
    // The buffer that is attached, or null.
    DepthStencilBuffer const* GetDepthStencil() const { return mDepthStencil; }
    // No depth-stencil buffer afterwards. Commands in the list name the one they were made with.
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
