#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"

#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/FringeGeometry.h"

namespace Moka {

using namespace detail;

MKBlendedBitmapDrawable::MKBlendedBitmapDrawable(IGLMsgQueue* queue, IMKBitmap* first, IMKBitmap* second,
                                                 RectF const& src, RectF const& dst, float width,
                                                 float height)
    : CustomDrawable(queue, PrimitiveType::TriangleList, FloatVertex({3, 2})),
      mSrc(src),
      mDst(dst),
      mWidth(width),
      mHeight(height) {
    mBitmap = RefPtr<IMKBitmap>::Adopt(first);
    mSecondBitmap = RefPtr<IMKBitmap>::Adopt(second);
}

MKBlendedBitmapDrawable::~MKBlendedBitmapDrawable() = default;

void MKBlendedBitmapDrawable::SetRects(RectF const& src, RectF const& dst) {
    mSrc = src;
    mDst = dst;
}

void MKBlendedBitmapDrawable::SetSize(float width, float height) {
    mWidth = width;
    mHeight = height;
}

void MKBlendedBitmapDrawable::DrawRT(Matrix4<float> const& projection, MKPaint const& paint) {
    IMKBitmapReadable* const first = GetReadable(mBitmap);
    IMKBitmapReadable* const second = GetReadable(mSecondBitmap);
    if (!first || !second || mSrc.IsEmpty() || mDst.IsEmpty() || !IsConstructed()) return;
    if (mWidth == 0.0f && mHeight == 0.0f)
        SetSize(static_cast<float>(mBitmap->GetWidth()), static_cast<float>(mBitmap->GetHeight()));
    RectF const uv(mSrc.left / mWidth, mSrc.top / mHeight, mSrc.right / mWidth, mSrc.bottom / mHeight);
    TexturedVertex vertices[kQuadVertices];
    WriteQuad(vertices, TexturedCorners({mDst, 1}, uv));

    MKBlenderBitmapsShader& shader = Begin(vertices, kQuadVertices, first, paint);
    shader.uProjectionMatrix = projection;
    SetColors(shader, paint);
    first->ActivateTextureRT(0, false);
    shader.uSrcTexture1 = 0;
    second->ActivateTextureRT(1, false);
    shader.uSrcTexture2 = 1;
    shader.uFactor = paint.GetAlpha();
    DrawVertices();
}

} // namespace Moka
