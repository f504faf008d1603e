// StencilClip: draws clip rectangles into the stencil buffer of a frame buffer, so that allowed pixels hold
// 1.
// Thread: render thread.
// Fails:  if a GPU object could not be created, clears the stencil and draws no clip. Exceptions of the
//         shader's constructor pass through.
#pragma once

#include "moka/graphics/canvas/ScissorClip.h"
#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/graphics/drawable/ShaderPtr.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"
#include "moka/renderer/IGraphicsObject.h"

namespace Moka {

class IMKBitmapWritable;
class MKRectShader;

namespace detail {

class StencilClip {
public:
    StencilClip();
    ~StencilClip();
    // Releases the GPU objects; nothing can be drawn afterwards.
    void Release();
    StencilClip(StencilClip const&) = delete;
    StencilClip& operator=(StencilClip const&) = delete;

    // The frame buffer must be active, with the scissor test off. Afterwards the stencil test passes the
    // allowed pixels, draws do not write the stencil, and they write colour.
    void Draw(ClipList const& clips, IMKBitmapWritable& frameBuffer);

private:
    // The area to draw: the clip rectangle under its matrix, or everything.
    struct Area {
        IGraphicsObject* graphics;
        Matrix4<float> matrix;
    };

    bool IsReady() const;
    void DrawClips(ClipList const& clips, IMKBitmapWritable& frameBuffer);
    void DrawClip(ClipInfo const& clip, IMKBitmapWritable& frameBuffer);
    void FillClipGeometry(ClipInfo const& clip);
    // Draws the area into the stencil only, with this stencil function and operation.
    void Pass(Area const& area, StencilComparison comparison, int reference, StencilOperation operation);
    void AllowWhereOne();

    ShaderPtr<MKRectShader> mShader;
    RendererPtr<IGraphicsObject> mClipGeometry;
    RendererPtr<IGraphicsObject> mScreenGeometry;
    RendererPtr<IDepthStencilState> mDepthStencil;
    RendererPtr<IBlendStateObject> mBlend;
};

} // namespace detail
} // namespace Moka
