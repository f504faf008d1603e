#include "moka/graphics/bitmap/MKBitmap.h"

#include "moka/base/Saturate.h"

#include <cstdint>

namespace Moka {
// Saturates, because nothing validates the numbers of a screen bitmap.
MKBitmap::MKBitmap(IGLMsgQueue* queue, int x, int y, int width, int height)
    : mMsgQueue(queue),
      mBitmapRect(x, y, Saturate(std::int64_t{x} + width), Saturate(std::int64_t{y} + height)) {}

} // namespace Moka
