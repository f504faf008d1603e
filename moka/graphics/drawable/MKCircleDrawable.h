// MKCircleDrawable: draws circles, always anti-aliased. It draws one quad for the fill and one for the
// stroke; the program computes the distance to the centre.
// Thread: render thread.
// Units:  those before the projection.
// Fails:  if a GPU object could not be created, draw calls do nothing. Exceptions of the shader's constructor
//         pass through.
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

    // Draws strokes of any positive width; other shapes require 1. // Compat: thin-strokes
    void DrawCircleRT(PointF const& center, float radius, Matrix4<float> const& projection,
                      MKPaint const& paint);

private:
    detail::RendererPtr<IGraphicsObject> mGraphics;
    detail::DrawState mState;
    detail::ShaderPtr<MKCircleShader> mShader;
};

} // namespace Moka
