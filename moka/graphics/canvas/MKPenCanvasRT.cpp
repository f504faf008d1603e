#include "moka/graphics/canvas/MKPenCanvasRT.h"

#include "moka/graphics/canvas/PenFrontEndBodies.h"

namespace Moka {

MKPenCanvasRT::MKPenCanvasRT(IGLMsgQueue* queue, IMKBitmap* bitmap)
    : PenFrontEnd(queue, bitmap, "MKPenCanvasRT") {}

MKPenCanvasRT::~MKPenCanvasRT() = default;

template class detail::CanvasFrontEnd<IMKPenCanvas, MKPenCanvasImpl, detail::AtOnce>;
template class detail::PenFrontEnd<detail::AtOnce>;

} // namespace Moka
