// MKPenCanvas: a pen canvas for any thread, except its two clip operations, which belong on the render
// thread. MKGraphicsFactory::CreatePenCanvas makes it.
// Owner:  as IMKPenCanvas.
// Fails:  on a bitmap that is no texture bitmap with an error line; then matrices, levels and the tag work,
//         nothing is posted, the bitmap is null, and the canvas matrix is the model matrix alone. What the
//         queue refuses is dropped.
#pragma once

#include "moka/graphics/canvas/PenFrontEnd.h"

namespace Moka {

extern template class MOKA_API detail::CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, detail::ByTask>;
extern template class MOKA_API detail::PenFrontEnd<detail::ByTask>;

class MOKA_API MKPenCanvas final : public detail::PenFrontEnd<detail::ByTask> {
public:
    // Neither is null.
    MKPenCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKPenCanvas() override;
};

} // namespace Moka
