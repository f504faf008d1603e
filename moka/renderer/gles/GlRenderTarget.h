// GlRenderTarget: a render target over a texture or over a frame buffer of the host's.
#pragma once

#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/gles/GlDrawState.h"

#include <memory>

namespace Moka::detail {

class GlContext;
class GlDepthStencil;

class GlRenderTarget final : public IRenderTarget {
public:
    GlRenderTarget(std::shared_ptr<GlContext> context, std::shared_ptr<GlFrameBuffer> frameBuffer, int width,
                   int height);
    GlRenderTarget(GlRenderTarget const&) = delete;
    ~GlRenderTarget();
    GlRenderTarget& operator=(GlRenderTarget const&) = delete;

    void Activate() override;
    void Deactivate(bool discardColor, bool discardDepthStencil) override;
    void ReadPixels(int x, int y, int width, int height, PixelDestination const& destination) override;
    void Release() override;
    void ClearColor(float r, float g, float b, float a) override;
    void AttachDepthStencil(IDepthStencilBuffer* buffer) override;
    void DetachDepthStencil() override;
    void ClearDepthStencil(bool clearDepth, float depth, bool clearStencil, int stencil) override;

    GLuint GetName() const;
    int GetWidth() const { return mUse.width; }
    int GetHeight() const { return mUse.height; }
    // Null for a host's frame buffer.
    GlTextureStorage* GetStorage() const;
    // As a command in the draw list names it.
    GlTargetUse const& GetUse() const { return mUse; }
    std::shared_ptr<GlFrameBuffer> const& GetFrameBuffer() const { return mUse.frameBuffer; }

    // No depth-stencil buffer afterwards. Commands in the draw list name the one they were made with.
    void Detach();

private:
    bool MayAttach(GlDepthStencil const& buffer) const;
    bool HasStencil() const;

    std::shared_ptr<GlContext> const mContext;
    GlTargetUse mUse;
    GlDepthStencil* mDepthStencil = nullptr; // attached, not owned
};

} // namespace Moka::detail
