#include "moka/graphics/debug/MKPenCanvasChecker.h"

namespace Moka {

MKPenCanvasChecker::MKPenCanvasChecker(IMKPenCanvas* canvas) : CanvasChecker(canvas) {}

MKPenCanvasChecker::~MKPenCanvasChecker() = default;

} // namespace Moka
