#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"

#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/TexCoordVertex.h"

namespace Moka {

using namespace detail;

MKNonPremultipliedColorDrawable::MKNonPremultipliedColorDrawable(IGLMsgQueue* queue)
    : CustomDrawable(queue, PrimitiveType::TriangleStrip, FloatVertex({4})) {}

MKNonPremultipliedColorDrawable::~MKNonPremultipliedColorDrawable() = default;

void MKNonPremultipliedColorDrawable::SetBitmap(IMKBitmap* src, IMKBitmap* dst) {
    Hold(mBitmap, src);
    Hold(mSecondBitmap, dst);
}

void MKNonPremultipliedColorDrawable::DrawRT(Matrix4<float> const& projection, MKPaint const& paint) {
    IMKBitmapReadable* const src = GetReadable(mBitmap);
    IMKBitmapReadable* const dst = GetReadable(mSecondBitmap);
    if (!src || !dst || !IsConstructed()) return;
    Corners<TexCoordVertex> const strip = TexCoordCorners(*mBitmap, 0, 0, {0, 0, 1, 1});

    MKNonPremultipliedColorShader& shader = Begin(&strip, kStripVertices, src, paint);
    shader.projectionMatrix = projection;
    src->ActivateTextureRT(0, false);
    shader.srcTexture = 0;
    dst->ActivateTextureRT(1, false);
    shader.dstTexture = 1;
    DrawVertices();
}

} // namespace Moka
