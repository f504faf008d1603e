#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"

#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/TexCoordVertex.h"

namespace Moka {

using namespace detail;

MKTextMaskBitmapDrawable::MKTextMaskBitmapDrawable(IGLMsgQueue* queue)
    : CustomDrawable(queue, PrimitiveType::TriangleList, FloatVertex({4})) {}

MKTextMaskBitmapDrawable::~MKTextMaskBitmapDrawable() = default;

void MKTextMaskBitmapDrawable::DrawRT(Matrix4<float> const& projection, MKPaint const& paint) {
    IMKBitmapReadable* const mask = GetReadable(mBitmap);
    if (!mask || !IsConstructed()) return;
    TexCoordVertex vertices[kQuadVertices];
    WriteQuad(vertices, TexCoordCorners(*mBitmap, mPosition.x, mPosition.y, {0, 0, 1, 1}));

    MKTextMaskBitmapShader& shader = Begin(vertices, kQuadVertices, mask, paint);
    shader.uProjectionMatrix = projection;
    shader.uMaskColor = paint.GetColor();
    mask->ActivateTextureRT(0, false);
    shader.uSrcTexture = 0;
    DrawVertices();
}

} // namespace Moka
