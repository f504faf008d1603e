#include "moka/graphics/canvas/MKPenCanvas.h"

#include "moka/graphics/canvas/PenFrontEndBodies.h"

namespace Moka {

MKPenCanvas::MKPenCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap) : PenFrontEnd(queue, bitmap, "MKPenCanvas") {}

MKPenCanvas::~MKPenCanvas() = default;

template class detail::CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, detail::ByTask>;
template class detail::PenFrontEnd<detail::ByTask>;

} // namespace Moka
