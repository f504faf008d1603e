// DrawState: the blend state and the depth-stencil state of a drawable.
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
    // Creates a state with blending, without depth and stencil tests.
    DrawState();

    explicit operator bool() const { return mBlend && mDepthStencil; }

    // Sets both states. Requires that the object converts to true. The renderer skips unchanged states.
    void Apply(MKPaint::XFermode mode);
    // Set one of the two states each, for drawables that set other state in between.
    void ApplyBlend(MKPaint::XFermode mode);
    void ApplyDepthStencil() { mDepthStencil->Apply(); }

    // Releases the blend state, then the depth-stencil state. Afterwards the object converts to false.
    void Release();
    // Posts the release. Callable on any thread.
    void PostRelease(IGLMsgQueue* queue);

private:
    RendererPtr<IBlendStateObject> mBlend;
    RendererPtr<IDepthStencilState> mDepthStencil;
};

} // namespace Moka::detail
