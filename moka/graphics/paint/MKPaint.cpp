#include "moka/graphics/paint/MKPaint.h"

#include "moka/graphics/paint/UnpackColor.h"

namespace Moka {

MKPaint::~MKPaint() = default;

void MKPaint::SetColor(int argb) { mColor = detail::UnpackColor(argb); }

void MKPaint::SetTintColor(int argb) {
    mTintColor = detail::UnpackColor(argb);
    mHasTintColor = true;
}

void MKPaint::SetTintColor(float r, float g, float b, float a) {
    mTintColor = {r, g, b, a};
    mHasTintColor = true;
}

void MKPaint::ClearTintColor() {
    mTintColor = {};
    mHasTintColor = false;
}

void MKPaint::SetTileMode(TileMode x, TileMode y) {
    mTileModeX = x;
    mTileModeY = y;
}

} // namespace Moka
