// MKPenCanvasRT: a pen canvas for code that already runs on the render thread; nothing is posted.
// MKGraphicsFactory::CreatePenCanvas creates it. Its operations stand in MKPenCanvas.h.
// Owner:  as IMKPenCanvas.
// Thread: render thread only, its destruction included.
// Fails:  as MKPenCanvas.
#pragma once

#include "moka/graphics/canvas/MKPenCanvas.h"

namespace Moka {

extern template class MOKA_API CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, false>;
extern template class MOKA_API PenCanvas<false>;

class MOKA_API MKPenCanvasRT final : public PenCanvas<false> {
public:
    // The bitmap is not null.
    MKPenCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKPenCanvasRT() override;
};

} // namespace Moka
