/// MKGaussianBlurDrawable: draws a bitmap at the origin, in its own size, blurred in one direction, with the
/// paint's tint. For a full blur draw twice, once in each direction.
/// Units: the bitmap's texels.
/// See CustomDrawable.h for ownership, threads and failures.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/Point.h"
#include "moka/graphics/drawable/CustomDrawable.h"

namespace Moka {

class MKGaussianBlurShader;

class MOKA_API MKGaussianBlurDrawable final : public detail::CustomDrawable<MKGaussianBlurShader> {
public:
    /// Draws nothing until it has a bitmap.
    explicit MKGaussianBlurDrawable(IGLMsgQueue* queue);
    ~MKGaussianBlurDrawable() override;

    /// Sets the bitmap and takes a reference on it.
    void SetBitmap(IMKBitmap* bitmap) { Hold(mBitmap, bitmap); }

    /// Sets the direction of the blur. The default is horizontal.
    // Compat: misspelt-names
    void SetHorizotalDirection(bool horizontal) { mHorizontal = horizontal; }

    /// Sets the distance between the nine samples, in texels. The default is 1.
    void SetBlurAmount(float amount) { mAmount = amount; }

    /// Shifts the content inside the drawn rectangle. The paint's tile mode fills the edges.
    void SetOffset(float x, float y) { mOffset = {x, y}; }

    /// The values set; no new reference.
    IMKBitmap* GetBitmap() const { return mBitmap.Get(); }
    bool IsHorizontal() const { return mHorizontal; }
    float GetBlurAmount() const { return mAmount; }
    PointF const& GetOffset() const { return mOffset; }

    void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) override;

private:
    bool mHorizontal = true;
    float mAmount = 1;
    PointF mOffset;
};

} // namespace Moka
