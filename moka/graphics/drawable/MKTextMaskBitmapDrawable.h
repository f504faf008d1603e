/// MKTextMaskBitmapDrawable: the alpha of a bitmap, painted in the paint's colour; where the alpha is 0
/// nothing is drawn, in every transfer mode. The colour's own alpha has no effect.
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

    /// Takes a reference.
    void SetBitmap(IMKBitmap* mask) { Hold(mBitmap, mask); }

    /// Of the mask's upper left corner; the origin unless set.
    void SetDstPosition(float x, float y) { mPosition = {x, y}; }

    /// The values set; no new reference.
    IMKBitmap* GetBitmap() const { return mBitmap.Get(); }
    PointF const& GetDstPosition() const { return mPosition; }

    void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) override;

private:
    PointF mPosition;
};

} // namespace Moka
