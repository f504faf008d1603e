// MKCanvasRT: a canvas for code that already runs on the render thread: each request is drawn before the call
// returns. MKGraphicsFactory::CreateCanvas makes it.
// Owner:  as IMKCanvas.
// Thread: render thread only, its destruction included.
// Fails:  as MKCanvasImpl; what a shader's constructor throws reaches the caller.
#pragma once

#include "moka/graphics/canvas/DrawingFrontEnd.h"

namespace Moka {

extern template class MOKA_API detail::CanvasFrontEnd<IMKCanvas, MKCanvasImpl, detail::AtOnce>;
extern template class MOKA_API detail::DrawingFrontEnd<detail::AtOnce>;

class MOKA_API MKCanvasRT final : public detail::DrawingFrontEnd<detail::AtOnce> {
public:
    // The bitmap is not null.
    MKCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKCanvasRT() override;
};

} // namespace Moka
