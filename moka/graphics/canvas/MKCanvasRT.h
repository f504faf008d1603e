// MKCanvasRT: a canvas for code that runs on the render thread: each request is executed before the call
// returns. MKGraphicsFactory::CreateCanvas creates it. MKCanvas.h declares its operations.
// Owner:  as IMKCanvas.
// Thread: render thread only, including destruction.
// Fails:  as MKCanvasImpl; exceptions of a shader's constructor reach the caller.
#pragma once

#include "moka/graphics/canvas/MKCanvas.h"

namespace Moka {

extern template class MOKA_API CanvasFrontEnd<IMKCanvas, MKCanvasImpl, false>;
extern template class MOKA_API DrawingCanvas<false>;

class MOKA_API MKCanvasRT final : public DrawingCanvas<false> {
public:
    // The bitmap must not be null.
    MKCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap);
    ~MKCanvasRT() override;
};

} // namespace Moka
