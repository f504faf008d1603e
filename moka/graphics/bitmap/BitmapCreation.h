// BitmapCreation.h: validates the arguments and creates bitmaps. The factory, clones and the copy of a
// destination use it.
// Owner:  each function returns one reference, as those of MKGraphicsFactory do.
// Fails:  returns null. An invalid size, queue or parent logs an error.
#pragma once

namespace Moka {

class IGLMsgQueue;
class IMKBitmap;

namespace detail {

// Returns true if there is a queue and both sides are positive. Otherwise logs an error.
bool IsValidBitmap(IGLMsgQueue* queue, int width, int height);

// See the functions of MKGraphicsFactory with the same arguments.
IMKBitmap* CreateTextureBitmap(IGLMsgQueue* queue, int width, int height, void const* pixels,
                               bool deleteBuffer, int useQueue, bool textureFlag);
IMKBitmap* CreateSharedBitmap(IGLMsgQueue* queue, IMKBitmap* parent, int useQueue);
IMKBitmap* CreateScreenBitmap(IGLMsgQueue* queue, int x, int y, int width, int height,
                              int useDefaultFramebuffer, int useQueue);

} // namespace detail
} // namespace Moka
