#include "moka/graphics/debug/MKCanvasChecker.h"

namespace Moka {

MKCanvasChecker::MKCanvasChecker(IMKCanvas* canvas) : CanvasChecker(canvas) {}

MKCanvasChecker::~MKCanvasChecker() = default;

} // namespace Moka
