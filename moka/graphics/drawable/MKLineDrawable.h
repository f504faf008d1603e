// MKLineDrawable: draws lines. A full line is one quad, whatever its caps and dashes, which its program
// makes; simple lines have neither, but any number of them is one call of the renderer.
// Thread: render thread.
// Units:  those of the projection's source.
// Fails:  if a GPU object could not be created, draw calls do nothing. The constructor passes exceptions of
//         its shaders on.
// A line narrower than 1 draws nothing, and one without length nothing that can be seen: it has no direction.
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

    // Always anti-aliased.
    void DrawLineRT(PointF const& start, PointF const& end, Matrix4<float> const& projection,
                    MKPaint const& paint);

    // Anti-aliased along its sides if the paint says so; the ends are cut square at the points.
    void DrawSimpleLineRT(PointF const& start, PointF const& end, Matrix4<float> const& projection,
                          MKPaint const& paint);

    // Points in pairs; an odd last one is ignored. Deletes the vector. If the line is narrower than 1, the
    // caller keeps the vector. // Compat: points-ownership
    void DrawSimpleLinesRT(std::vector<PointF>* points, Matrix4<float> const& projection,
                           MKPaint const& paint);

private:
    // points encloses the lines' ends.
    void DrawSimpleVertices(void const* vertices, int count, RectF const& points,
                            Matrix4<float> const& projection, MKPaint const& paint);

    detail::RendererPtr<IGraphicsObject> mLineGraphics;
    detail::RendererPtr<IGraphicsObject> mSimpleGraphics;
    detail::DrawState mState;
    detail::ShaderPtr<MKLineShader> mLineShader;
    detail::ShaderPtr<MKRectShader> mRectShader;
};

} // namespace Moka
