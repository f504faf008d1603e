// DrawState: the blend and the depth-stencil state that a drawable draws with, both its own.
// Thread: render thread, except PostRelease.
// Fails:  false if the renderer refused a state; drawables check it before they draw.
#pragma once

#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"

namespace Moka::detail {

class DrawState {
public:
    // Blending, and neither a depth nor a stencil test.
    DrawState();

    explicit operator bool() const { return mBlend && mDepthStencil; }

    // These need a state that is true. A mode is set at each draw; the renderer skips unchanged states.
    void Apply(MKPaint::XFermode mode);
    // The two halves of it, for those who set more in between.
    void ApplyBlend(MKPaint::XFermode mode);
    void ApplyDepthStencil() { mDepthStencil->Apply(); }

    // The blend state first. Afterwards it is false.
    void Release();
    // The same from any thread.
    void PostRelease(IGLMsgQueue* queue);

private:
    RendererPtr<IBlendStateObject> mBlend;
    RendererPtr<IDepthStencilState> mDepthStencil;
};

} // namespace Moka::detail
