// MKCanvasRT: a canvas for code that already runs on the render thread: each request is drawn before the call
// returns. MKGraphicsFactory::CreateCanvas creates it. Its operations stand in MKCanvas.h.
// Owner:  as IMKCanvas.
// Thread: render thread only, its destruction included.
// Fails:  as MKCanvasImpl; exceptions of a shader's constructor reach the caller.
#pragma once

#include "moka/graphics/canvas/MKCanvas.h"

namespace Moka {

extern template class MOKA_API CanvasFrontEnd<IMKCanvas, MKCanvasImpl, false>;
extern template class MOKA_API DrawingCanvas<false>;

class MOKA_API MKCanvasRT final : public DrawingCanvas<false> {
public:
    // The bitmap is not null.
    MKCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKCanvasRT() override;
};

} // namespace Moka
