// MKCircleDrawable: draws circles, always anti-aliased: one quad, whose program measures the distance to the
// centre, drawn once for the fill and once for the stroke.
// Thread: render thread.
// Units:  those of the projection's source.
// Fails:  if a GPU object could not be created, draw calls do nothing. The constructor passes exceptions of
//         its shader on.
#pragma once

#include "moka/base/NonAssignable.h"
#include "moka/base/Point.h"
#include "moka/graphics/drawable/DrawState.h"
#include "moka/graphics/drawable/RendererPtr.h"
#include "moka/graphics/drawable/ShaderPtr.h"
#include "moka/graphics/math/Matrix4.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/IGraphicsObject.h"

namespace Moka {

class MKCircleShader;

class MKCircleDrawable : NonAssignable {
public:
    MKCircleDrawable();
    virtual ~MKCircleDrawable();

    // Draws strokes of any positive width; other shapes need 1. // Compat: thin-strokes
    void DrawCircleRT(PointF const& center, float radius, Matrix4<float> const& projection,
                      MKPaint const& paint);

private:
    detail::RendererPtr<IGraphicsObject> mGraphics;
    detail::DrawState mState;
    detail::ShaderPtr<MKCircleShader> mShader;
};

} // namespace Moka
