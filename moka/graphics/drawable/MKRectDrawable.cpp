#include "moka/graphics/drawable/MKRectDrawable.h"

#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/FringeGeometry.h"
#include "moka/graphics/drawable/ProjectedBounds.h"

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
    MKPaint::Style const style = paint.GetStyle();
    if (IsFilled(style)) end = WriteFill(end, rect, antiAliased, CoverageCorners);
    if (IsStroked(style) && paint.GetLineWidth() >= 1.0f)
        end = WriteStroke(end, rect, paint.GetLineWidth() * 0.5f, antiAliased);

    mGraphics->SetVertices(0, vertices, static_cast<int>(end - vertices));
    float const reach = IsStroked(style) ? paint.GetLineWidth() * 0.5f + 0.5f : 0.5f;
    mGraphics->SetBounds(Project(Hull(rect, reach), projection));
    mState.Apply(paint.GetXFermode());
    UseShader(*mShader, projection, paint);
    return DrawAll(*mGraphics);
}

} // namespace Moka
