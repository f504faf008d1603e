// MKBitmapDrawable: draws a rectangle of a bitmap once, or many times in one draw, with the paint's blending,
// alpha, tint and tiling. A program computes the modes Darken and Lighten from a copy of the destination. The
// copy is kept for the next draw into a target of the same size.
// Thread: render thread.
// Units:  those before the projection; rectangles of a bitmap in its own pixels.
// Fails:  without a bitmap, without memory for the copy of the destination, or if a GPU object could not be
//         created, draw calls do nothing and return false. Exceptions of the shaders' constructors pass
//         through.
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
    // The queue is needed to create the copy of the destination. Nothing is posted to it.
    explicit MKBitmapDrawable(IGLMsgQueue* queue);
    virtual ~MKBitmapDrawable();

    // Draws src, a part of bitmapBounds, scaled to dst. Only the size of targetBounds is used. With
    // anti-aliasing the edges of dst get a fringe; the texture is not stretched into it.
    bool DrawBitmapRT(IMKBitmapReadable* bitmap, RectF const& bitmapBounds, RectF const& targetBounds,
                      RectF const& src, RectF const& dst, Matrix4<float> const& projection,
                      MKPaint const& paint);

    // Draws src scaled to each of dsts, in order, in one draw. The caller keeps the vector.
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
    detail::ShaderPtr<MKBitmapShader> mPlainShader;           // null on the GPU of kClampGpu
    detail::ShaderPtr<MKBitmapShaderColorClamp> mClampShader; // null on all other GPUs
    detail::ShaderPtr<MKBitmapAdvancedBlendingShader> mAdvancedShader;
    RefPtr<IMKBitmap> mDestination; // null until the first draw with Darken or Lighten
};

} // namespace Moka
