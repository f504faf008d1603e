#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"

#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/TexCoordVertex.h"

namespace Moka {

using namespace detail;

MKGaussianBlurDrawable::MKGaussianBlurDrawable(IGLMsgQueue* queue)
    : CustomDrawable(queue, PrimitiveType::TriangleStrip, FloatVertex({4})) {}

MKGaussianBlurDrawable::~MKGaussianBlurDrawable() = default;

void MKGaussianBlurDrawable::DrawRT(Matrix4<float> const& projection, MKPaint const& paint) {
    IMKBitmapReadable* const bitmap = GetReadable(mBitmap);
    if (!bitmap || !IsConstructed()) return;
    float const du = mOffset.x / static_cast<float>(mBitmap->GetWidth());
    float const dv = mOffset.y / static_cast<float>(mBitmap->GetHeight());
    Corners<TexCoordVertex> const strip = TexCoordCorners(*mBitmap, 0, 0, {-du, -dv, 1 - du, 1 - dv});

    MKGaussianBlurShader& shader = Begin(&strip, kStripVertices, bitmap, paint);
    shader.projectionMatrix = projection;
    bitmap->ActivateTextureRT(0, false);
    shader.srcTexture = 0;
    shader.uTintColor = paint.GetTintColor();
    shader.uHasTintColor = paint.HasTintColor() ? 1 : 0;
    shader.isHorizontal = mHorizontal;
    shader.blurAmount = mAmount;
    DrawVertices();
}

} // namespace Moka
