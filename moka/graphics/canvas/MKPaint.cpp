#include "moka/graphics/canvas/MKPaint.h"

namespace Moka {
namespace {

Vector4<float> Unpack(int argb) {
    auto const component = [argb](int shift) {
        return static_cast<float>((static_cast<unsigned>(argb) >> shift) & 0xFFu) / 255.0f;
    };
    return {component(16), component(8), component(0), component(24)};
}

} // namespace

MKPaint::~MKPaint() = default;

void MKPaint::SetColor(int argb) { mColor = Unpack(argb); }

void MKPaint::SetTintColor(int argb) {
    mTintColor = Unpack(argb);
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
