// MKBitmapDrawable: draws a rectangle of a bitmap, once or into many places at once, with the paint's
// blending, alpha, tint and tiling. Darken and lighten are composed by a program, over a copy of the
// destination that is kept for the next draw onto a target of the same size.
// Thread: render thread.
// Units:  those of the projection's source; a bitmap's rectangles in its own pixels.
// Fails:  without a bitmap, without memory for the copy of the destination, or if a GPU object could not be
//         created, draw calls do nothing and return false. The constructor passes exceptions of its shaders on.
#pragma once

#include "moka/base/NonAssignable.h"
#include "moka/base/Rect.h"
#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/drawable/DrawState.h"
#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/graphics/drawable/ShaderPtr.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/IGraphicsObject.h"

#include <vector>

namespace Moka {

class MKBitmapAdvancedBlendingShader;
class MKBitmapShader;
class MKBitmapShaderColorClamp;

class MKBitmapDrawable : NonAssignable {
public:
    // The queue makes the copy of the destination; it is not posted to.
    explicit MKBitmapDrawable(IGLMsgQueue* queue);
    virtual ~MKBitmapDrawable();

    // src, a part of bitmapBounds, fills dst. Of targetBounds only the size is used. With anti-aliasing the
    // edges of dst get a fringe over which the coverage falls; the texture is not stretched into it.
    bool DrawBitmapRT(IMKBitmapReadable* bitmap, RectF const& bitmapBounds, RectF const& targetBounds,
                      RectF const& src, RectF const& dst, Matrix4<float> const& projection,
                      MKPaint const& paint);

    // The same into each of dsts, in their order, in one draw. The vector stays the caller's.
    bool DrawBitmapsRT(IMKBitmapReadable* bitmap, RectF const& bitmapBounds, RectF const& targetBounds,
                       RectF const& src, std::vector<RectF> const* dsts, Matrix4<float> const& projection,
                       MKPaint const& paint);

private:
    bool IsReady() const;
    bool DrawVertices(IMKBitmapReadable* bitmap, RectF const& targetBounds, char const* copyTag,
                      Matrix4<float> const& projection, MKPaint const& paint);
    bool DarkenOrLighten(IMKBitmapReadable* bitmap, RectF const& targetBounds, char const* copyTag,
                         Matrix4<float> const& projection, MKPaint const& paint);
    bool CopyDestination(RectF const& targetBounds, char const* tag);

    IGLMsgQueue* mQueue;
    detail::RendererPtr<IGraphicsObject> mGraphics;
    detail::DrawState mState;
    detail::ShaderPtr<MKBitmapShader> mPlainShader;           // or
    detail::ShaderPtr<MKBitmapShaderColorClamp> mClampShader; // on the one GPU that needs it
    detail::ShaderPtr<MKBitmapAdvancedBlendingShader> mAdvancedShader;
    RefPtr<IMKBitmap> mDestination; // null until the first draw that darkens or lightens
};

} // namespace Moka
