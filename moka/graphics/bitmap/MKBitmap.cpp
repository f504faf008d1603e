#include "moka/graphics/bitmap/MKBitmap.h"

#include <algorithm>
#include <cstdint>
#include <limits>

namespace Moka {
namespace {

// A screen bitmap's numbers are nowhere checked.
int Saturate(std::int64_t value) {
    return static_cast<int>(
        std::clamp<std::int64_t>(value, std::numeric_limits<int>::min(), std::numeric_limits<int>::max()));
}

} // namespace

MKBitmap::MKBitmap(IGLMsgQueue* queue, int x, int y, int width, int height)
    : mMsgQueue(queue),
      mBitmapRect(x, y, Saturate(std::int64_t{x} + width), Saturate(std::int64_t{y} + height)) {}

} // namespace Moka
