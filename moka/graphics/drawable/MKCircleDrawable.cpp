#include "moka/graphics/drawable/MKCircleDrawable.h"

#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/FringeGeometry.h"
#include "moka/graphics/drawable/ProjectedBounds.h"

namespace Moka {

using namespace detail;

MKCircleDrawable::MKCircleDrawable()
    : mGraphics(CreateGraphics(PrimitiveType::TriangleList, FloatVertex({2}))),
      mShader(GetShader<MKCircleShader>()) {}

MKCircleDrawable::~MKCircleDrawable() {
    mGraphics.reset();
    mState.Release();
    mShader.reset();
}

void MKCircleDrawable::DrawCircleRT(PointF const& center, float radius, Matrix4<float> const& projection,
                                    MKPaint const& paint) {
    if (!mGraphics || !mState || !mShader) return;
    float const width = paint.GetLineWidth();
    bool const isStroked = IsStroked(paint.GetStyle());
    float reach = radius + 0.5f;
    if (isStroked) reach += width * 0.5f + 1.0f;
    RectF const box = Grown({center.x, center.y, center.x, center.y}, reach);
    PointF vertices[kQuadVertices];
    WriteQuad(vertices, {box.left, box.top}, {box.left, box.bottom}, {box.right, box.top},
              {box.right, box.bottom});

    mGraphics->SetVertices(0, vertices, kQuadVertices);
    mGraphics->SetBounds(Project(box, projection));
    mState.Apply(paint.GetXFermode());
    UseShader(*mShader, projection, paint);
    mShader->uCenter = Vector2<float>(center.x, center.y);
    mShader->uRadius = radius;
    if (IsFilled(paint.GetStyle())) {
        mShader->uIsFill = 1;
        DrawAll(*mGraphics);
    }
    if (isStroked && width > 0.0f) {
        mShader->uIsFill = 0;
        mShader->uStrokeWidth = width;
        DrawAll(*mGraphics);
    }
}

} // namespace Moka
