/// MKTextMaskBitmapDrawable: draws the paint's colour with the alpha of a bitmap. In every transfer mode,
/// pixels with alpha 0 stay unchanged. The colour's own alpha has no effect.
/// Units: the canvas's pixels.
/// See CustomDrawable.h for ownership, threads and failures.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/Point.h"
#include "moka/graphics/drawable/CustomDrawable.h"

namespace Moka {

class MKTextMaskBitmapShader;

class MOKA_API MKTextMaskBitmapDrawable final : public detail::CustomDrawable<MKTextMaskBitmapShader> {
public:
    /// Draws nothing until it has a bitmap.
    explicit MKTextMaskBitmapDrawable(IGLMsgQueue* queue);
    ~MKTextMaskBitmapDrawable() override;

    /// Sets the mask and takes a reference on it.
    void SetBitmap(IMKBitmap* mask) { Hold(mBitmap, mask); }

    /// Sets the position of the mask's upper left corner. The default is the origin.
    void SetDstPosition(float x, float y) { mPosition = {x, y}; }

    /// The values set; no new reference.
    IMKBitmap* GetBitmap() const { return mBitmap.Get(); }
    PointF const& GetDstPosition() const { return mPosition; }

    void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) override;

private:
    PointF mPosition;
};

} // namespace Moka
