// ForeignInk: GL code that shares nothing with the renderer and cleans up nothing behind itself.
// Thread: render thread.
#pragma once

#include "apps/moka/GlInk.h"
#include "moka/base/Rect.h"
#include "moka/graphics/math/Matrix4.h"

#include <memory>

namespace Moka::Testing {

class ForeignInk {
public:
    ForeignInk();
    ~ForeignInk(); // deletes its names, whatever is bound
    ForeignInk(ForeignInk const&) = delete;
    ForeignInk& operator=(ForeignInk const&) = delete;

    // Fills the rectangle with opaque green, into what is bound, within the clip, viewport and masks in force.
    void Fill(RectF const& rect, Matrix4<float> const& matrix) const;

    // Leaves everything that a draw depends on so that nothing could be drawn with it, or the wrong thing.
    void LeaveAMess() const;

private:
    std::unique_ptr<Tool::GlInk> mInk;
    unsigned mTexture = 0;
    unsigned mSampler = 0;
};

} // namespace Moka::Testing
