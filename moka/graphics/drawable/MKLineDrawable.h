// MKLineDrawable: draws lines. A full line is one quad; its program computes caps and dashes. Simple lines
// have neither, but any number of them is one draw.
// Thread: render thread.
// Units:  those before the projection.
// Fails:  if a GPU object could not be created, draw calls do nothing. Exceptions of the shaders'
//         constructors pass through.
// A line narrower than 1 draws nothing. A line of length 0 has no direction and shows nothing.
#pragma once

#include "moka/base/NonAssignable.h"
#include "moka/base/Point.h"
#include "moka/graphics/drawable/DrawState.h"
#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/graphics/drawable/ShaderPtr.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/IGraphicsObject.h"

#include <vector>

namespace Moka {

class MKLineShader;
class MKRectShader;

class MKLineDrawable : NonAssignable {
public:
    MKLineDrawable();
    virtual ~MKLineDrawable();

    // Draws a full line, always anti-aliased.
    void DrawLineRT(PointF const& start, PointF const& end, Matrix4<float> const& projection,
                    MKPaint const& paint);

    // Draws a simple line with square ends at the points. Its sides are anti-aliased if the paint enables it.
    void DrawSimpleLineRT(PointF const& start, PointF const& end, Matrix4<float> const& projection,
                          MKPaint const& paint);

    // Draws a simple line for each pair of points; an odd last point is ignored. Deletes the vector. But if
    // the line is narrower than 1, the caller keeps the vector. // Compat: points-ownership
    void DrawSimpleLinesRT(std::vector<PointF>* points, Matrix4<float> const& projection,
                           MKPaint const& paint);

private:
    // points must enclose the ends of all lines.
    void DrawSimpleVertices(void const* vertices, int count, RectF const& points,
                            Matrix4<float> const& projection, MKPaint const& paint);

    detail::RendererPtr<IGraphicsObject> mLineGraphics;
    detail::RendererPtr<IGraphicsObject> mSimpleGraphics;
    detail::DrawState mState;
    detail::ShaderPtr<MKLineShader> mLineShader;
    detail::ShaderPtr<MKRectShader> mRectShader;
};

} // namespace Moka
