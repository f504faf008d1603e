// GlDepthStencil: a depth-stencil buffer as it is handed out; its render buffer comes from the pool and goes
// back there.
#pragma once

#include "moka/renderer/IDepthStencilBuffer.h"

#include <GLES3/gl3.h>

#include <memory>

namespace Moka::detail {

class GlContext;
class GlRenderTarget;

class GlDepthStencil final : public IDepthStencilBuffer {
public:
    // Null, with one error line, when the driver has no memory.
    static GlDepthStencil* Create(std::shared_ptr<GlContext> context, int width, int height);
    GlDepthStencil(GlDepthStencil const&) = delete;
    ~GlDepthStencil();
    GlDepthStencil& operator=(GlDepthStencil const&) = delete;

    void Release() override;

    std::shared_ptr<GlContext> const& GetContext() const { return mContext; }
    GLuint GetName() const { return mName; }
    int GetWidth() const { return mWidth; }
    int GetHeight() const { return mHeight; }

    // The one it is attached to, or null; the target keeps it.
    GlRenderTarget* GetTarget() const { return mTarget; }
    void SetTarget(GlRenderTarget* target) { mTarget = target; }

private:
    GlDepthStencil(std::shared_ptr<GlContext> context, GLuint name, int width, int height);

    std::shared_ptr<GlContext> const mContext;
    GLuint const mName;
    int const mWidth;
    int const mHeight;
    GlRenderTarget* mTarget = nullptr;
};

} // namespace Moka::detail
