/// MKNonPremultipliedColorDrawable: draws one bitmap over another, at the origin and in the size of the upper
/// one, and writes colours with straight alpha (not premultiplied). It draws nothing until both bitmaps are
/// set. See CustomDrawable.h for ownership, threads and failures.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/drawable/CustomDrawable.h"

namespace Moka {

class MKNonPremultipliedColorShader;

class MOKA_API MKNonPremultipliedColorDrawable final
    : public detail::CustomDrawable<MKNonPremultipliedColorShader> {
public:
    /// Draws nothing until it has its bitmaps.
    explicit MKNonPremultipliedColorDrawable(IGLMsgQueue* queue);
    ~MKNonPremultipliedColorDrawable() override;

    /// Sets the bitmaps: src is drawn over dst. Takes a reference on each.
    void SetBitmap(IMKBitmap* src, IMKBitmap* dst);

    /// The bitmaps set; no new reference.
    IMKBitmap* GetSrc() const { return mBitmap.Get(); }
    IMKBitmap* GetDst() const { return mSecondBitmap.Get(); }

    void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) override;
};

} // namespace Moka
