// MKPenCanvasRT: a pen canvas for code that already runs on the render thread; nothing is posted.
// MKGraphicsFactory::CreatePenCanvas makes it.
// Owner:  as IMKPenCanvas.
// Thread: render thread only, its destruction included.
// Fails:  as MKPenCanvas.
#pragma once

#include "moka/graphics/canvas/PenFrontEnd.h"

namespace Moka {

extern template class MOKA_API detail::CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, detail::AtOnce>;
extern template class MOKA_API detail::PenFrontEnd<detail::AtOnce>;

class MOKA_API MKPenCanvasRT final : public detail::PenFrontEnd<detail::AtOnce> {
public:
    // The bitmap is not null.
    MKPenCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKPenCanvasRT() override;
};

} // namespace Moka
