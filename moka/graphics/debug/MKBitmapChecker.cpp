#include "moka/graphics/debug/MKBitmapChecker.h"

namespace Moka {

MKBitmapChecker::MKBitmapChecker(IMKBitmap* bitmap) : Checker(bitmap) {}

MKBitmapChecker::~MKBitmapChecker() = default;

} // namespace Moka
