#include "moka/graphics/canvas/MKCanvasRT.h"

#include "moka/graphics/canvas/DrawingFrontEndBodies.h"

namespace Moka {

MKCanvasRT::MKCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap) : DrawingFrontEnd(queue, bitmap) {}

MKCanvasRT::~MKCanvasRT() = default;

template class detail::CanvasFrontEnd<IMKCanvas, MKCanvasImpl, detail::AtOnce>;
template class detail::DrawingFrontEnd<detail::AtOnce>;

} // namespace Moka
