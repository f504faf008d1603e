// DrawableState: the blend and the depth-stencil state that a drawable draws with, both its own.
// Thread: render thread, except PostRelease.
// Fails:  a state that the renderer refused makes it false; whoever draws asks first.
#pragma once

#include "moka/graphics/canvas/MKPaint.h"
#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"

#include <optional>

namespace Moka::detail {

class DrawableState {
public:
    // Blending, and neither a depth nor a stencil test.
    DrawableState();

    explicit operator bool() const { return mBlend && mDepthStencil; }

    // Both ask for a state that is true.
    void ApplyBlend(MKPaint::XFermode mode);
    void ApplyDepthStencil() { mDepthStencil->Apply(); }

    // The blend state first. Afterwards it is false.
    void Release();
    // The same from any thread.
    void PostRelease(IGLMsgQueue* queue);

private:
    RendererPtr<IBlendStateObject> mBlend;
    RendererPtr<IDepthStencilState> mDepthStencil;
    std::optional<MKPaint::XFermode> mMode; // that the blend state has
};

} // namespace Moka::detail
