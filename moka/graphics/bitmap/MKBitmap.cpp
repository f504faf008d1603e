#include "moka/graphics/bitmap/MKBitmap.h"

namespace Moka {

MKBitmap::MKBitmap(IGLMsgQueue* queue, int x, int y, int width, int height)
    : mMsgQueue(queue), mBitmapRect(x, y, x + width, y + height) {}

} // namespace Moka
