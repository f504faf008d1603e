// MKRoundRectDrawable: draws rectangles with elliptic corners, always anti-aliased: the straight parts as
// fringed triangles, each corner as a quad whose program tests the ellipse.
// Thread: render thread.
// Units:  those of the projection's source.
// Fails:  if a GPU object could not be created, draw calls do nothing and return false. The constructor passes
//         exceptions of its shaders on.
#pragma once

#include "moka/base/NonAssignable.h"
#include "moka/base/Rect.h"
#include "moka/graphics/drawable/DrawState.h"
#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/graphics/drawable/ShaderPtr.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/IGraphicsObject.h"

namespace Moka {

class MKRoundRectRoundShader;
class MKRoundRectShader;

class MKRoundRectDrawable : NonAssignable {
public:
    MKRoundRectDrawable();
    virtual ~MKRoundRectDrawable();

    // The radii are at most half of the sides; negative ones are taken as they are. A stroke narrower than 1
    // draws nothing. Returns what the last draw did.
    bool DrawRoundRectRT(RectF const& rect, float rx, float ry, Matrix4<float> const& projection,
                         MKPaint const& paint);

private:
    struct Shape;

    bool DrawFill(Shape const& shape, Matrix4<float> const& projection, MKPaint const& paint);
    bool DrawStroke(Shape const& shape, Matrix4<float> const& projection, MKPaint const& paint);
    void DrawBody(void const* vertices, int count, RectF const& hull, Matrix4<float> const& projection,
                  MKPaint const& paint);
    bool DrawCorners(Shape const& shape, float reach, bool fill, Matrix4<float> const& projection,
                     MKPaint const& paint);

    detail::RendererPtr<IGraphicsObject> mBodyGraphics;
    detail::RendererPtr<IGraphicsObject> mCornerGraphics;
    detail::DrawState mState;
    detail::ShaderPtr<MKRoundRectShader> mBodyShader;
    detail::ShaderPtr<MKRoundRectRoundShader> mCornerShader;
};

} // namespace Moka
