// MKCanvas: a canvas for any thread: each request is posted to the render thread with copies of everything it
// needs. MKGraphicsFactory::CreateCanvas makes it.
// Owner:  as IMKCanvas. What was posted is drawn, also when the canvas is gone.
// Thread: any, one at a time.
// Cost:   one task a request; nothing else is allocated but the copies of vectors.
// Fails:  what the queue refuses is dropped. References that the request took on a bitmap or a drawable are
//         then not given back, by design.
#pragma once

#include "moka/graphics/canvas/DrawingFrontEnd.h"

namespace Moka {

extern template class MOKA_API detail::CanvasFrontEnd<IMKCanvas, MKCanvasImpl, detail::ByTask>;
extern template class MOKA_API detail::DrawingFrontEnd<detail::ByTask>;

class MOKA_API MKCanvas final : public detail::DrawingFrontEnd<detail::ByTask> {
public:
    // Neither is null.
    MKCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKCanvas() override;
};

} // namespace Moka
