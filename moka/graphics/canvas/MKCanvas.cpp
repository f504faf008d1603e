#include "moka/graphics/canvas/MKCanvas.h"

#include "moka/graphics/canvas/DrawingFrontEndBodies.h"

namespace Moka {

MKCanvas::MKCanvas(IGLMsgQueue* queue, IMKBitmap* bitmap) : DrawingFrontEnd(queue, bitmap) {}

MKCanvas::~MKCanvas() = default;

template class detail::CanvasFrontEnd<IMKCanvas, MKCanvasImpl, detail::ByTask>;
template class detail::DrawingFrontEnd<detail::ByTask>;

} // namespace Moka
