// MKRoundRectDrawable: draws rectangles with elliptic corners, always anti-aliased. The straight parts are
// triangles with a fringe. Each corner is a quad whose program computes the ellipse.
// Thread: render thread.
// Units:  those before the projection.
// Fails:  if a GPU object could not be created, draw calls do nothing and return false. Exceptions of the
//         shaders' constructors pass through.
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

    // Limits the radii to half of the sides; negative radii are used unchanged. A stroke narrower than 1
    // draws nothing. Returns the result of the last draw.
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
