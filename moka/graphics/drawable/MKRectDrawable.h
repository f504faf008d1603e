// MKRectDrawable: draws rectangles in one colour, filled, stroked or both, with one draw for each rectangle.
// Anti-aliased edges have a fringe of triangles one unit wide, half of it inside, over which the coverage
// falls.
// Thread: render thread.
// Units:  those before the projection, which scales the fringe and the stroke too.
// Fails:  if a GPU object could not be created, draw calls do nothing and return false. Exceptions of the
//         shader's constructor pass through.
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

class MKRectShader;

class MKRectDrawable : NonAssignable {
public:
    MKRectDrawable();
    virtual ~MKRectDrawable();

    // A stroke narrower than 1 draws nothing. An inverted rectangle, or a stroke wider than the rectangle,
    // gives inverted triangles; nothing is clamped.
    bool DrawRectRT(RectF const& rect, Matrix4<float> const& projection, MKPaint const& paint);

private:
    detail::RendererPtr<IGraphicsObject> mGraphics;
    detail::DrawState mState;
    detail::ShaderPtr<MKRectShader> mShader;
};

} // namespace Moka
