/// MKGaussianBlurDrawable: a bitmap at the origin, in its own size, blurred in one direction and tinted if the
/// paint says so. A full blur is two draws, one in each direction.
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

    /// Takes a reference.
    void SetBitmap(IMKBitmap* bitmap) { Hold(mBitmap, bitmap); }

    /// Horizontal unless set otherwise.
    // Compat: misspelt-names
    void SetHorizotalDirection(bool horizontal) { mHorizontal = horizontal; }

    /// The distance of the nine samples from each other; 1 unless set.
    void SetBlurAmount(float amount) { mAmount = amount; }

    /// Shifts the content, not the rectangle it is drawn into. The paint's tile mode fills the edges.
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
