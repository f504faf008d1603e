// MKPenCanvasRT: a pen canvas for code that runs on the render thread; nothing is posted.
// MKGraphicsFactory::CreatePenCanvas creates it. MKPenCanvas.h declares its operations.
// Owner:  as IMKPenCanvas.
// Thread: render thread only, including destruction.
// Fails:  as MKPenCanvas.
#pragma once

#include "moka/graphics/canvas/MKPenCanvas.h"

namespace Moka {

extern template class MOKA_API CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, false>;
extern template class MOKA_API PenCanvas<false>;

class MOKA_API MKPenCanvasRT final : public PenCanvas<false> {
public:
    // The bitmap must not be null.
    MKPenCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKPenCanvasRT() override;
};

} // namespace Moka
