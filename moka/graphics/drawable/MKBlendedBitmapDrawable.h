/// MKBlendedBitmapDrawable: draws a mix of two bitmaps. The paint's alpha is the share of the second bitmap
/// (0: only the first one), not an opacity. The paint's colour and tint have no effect.
/// Units:  destination in the canvas's pixels; source in pixels of a bitmap of the given size, from its
///         origin.
/// See CustomDrawable.h for ownership, threads and failures.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/Rect.h"
#include "moka/graphics/drawable/CustomDrawable.h"

namespace Moka {

class MKBlenderBitmapsShader;

class MOKA_API MKBlendedBitmapDrawable final : public detail::CustomDrawable<MKBlenderBitmapsShader> {
public:
    /// Takes ownership of the caller's references on the bitmaps, unlike the setters. A size of 0 x 0 becomes
    /// that of the first bitmap at the next draw, and stays so.
    // Compat: blend-size
    MKBlendedBitmapDrawable(IGLMsgQueue* queue, IMKBitmap* first, IMKBitmap* second, RectF const& src,
                            RectF const& dst, float width, float height);
    ~MKBlendedBitmapDrawable() override;

    /// Set a bitmap and take a reference on it.
    void SetBitmapFirst(IMKBitmap* bitmap) { Hold(mBitmap, bitmap); }
    void SetBitmapSecond(IMKBitmap* bitmap) { Hold(mSecondBitmap, bitmap); }

    /// Sets the part of the bitmaps to draw, and the rectangle to draw it into. Empty rectangles draw
    /// nothing.
    void SetRects(RectF const& src, RectF const& dst);
    /// Sets the size that src refers to, in pixels.
    void SetSize(float width, float height);

    /// The values set; no new reference.
    IMKBitmap* GetBitmapFirst() const { return mBitmap.Get(); }
    IMKBitmap* GetBitmapSecond() const { return mSecondBitmap.Get(); }
    RectF const& GetSrc() const { return mSrc; }
    RectF const& GetDst() const { return mDst; }
    float GetWidth() const { return mWidth; }
    float GetHeight() const { return mHeight; }

    void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) override;

private:
    RectF mSrc;
    RectF mDst;
    float mWidth;
    float mHeight;
};

} // namespace Moka
