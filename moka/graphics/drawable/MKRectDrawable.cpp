#include "moka/graphics/drawable/MKRectDrawable.h"

#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/FringeGeometry.h"

namespace Moka {

using namespace detail;

MKRectDrawable::MKRectDrawable()
    : mGraphics(CreateGraphics(PrimitiveType::TriangleList, FloatVertex({3}))),
      mShader(GetShader<MKRectShader>()) {}

MKRectDrawable::~MKRectDrawable() {
    mGraphics.reset();
    mState.Release();
    mShader.reset();
}

bool MKRectDrawable::DrawRectRT(RectF const& rect, Matrix4<float> const& projection, MKPaint const& paint) {
    if (!mGraphics || !mState || !mShader) return false;
    CoverageVertex vertices[kMostFillVertices + kMostStrokeVertices];
    CoverageVertex* end = vertices;
    bool const antiAliased = paint.IsAntiAliasing();
    if (IsFilled(paint)) end = WriteFill(end, rect, antiAliased, CoverageCorners);
    if (IsStroked(paint) && paint.GetLineWidth() >= 1.0f)
        end = WriteStroke(end, rect, paint.GetLineWidth() * 0.5f, antiAliased);

    mGraphics->SetVertices(0, vertices, static_cast<int>(end - vertices));
    mState.ApplyBlend(paint.GetXFermode());
    mState.ApplyDepthStencil();
    UseShader(*mShader, projection, paint);
    return DrawAll(*mGraphics);
}

} // namespace Moka
