// BitmapCreation.h: creates bitmaps after checking the request, for the factory and for those below it: clones
// and the copy of a destination.
// Owner:  as MKGraphicsFactory: each result carries one reference for the caller.
// Fails:  null. An invalid size, queue or parent logs an error.
#pragma once

namespace Moka {

class IGLMsgQueue;
class IMKBitmap;

namespace detail {

// Logs an error unless there is a queue and both sides are positive.
bool IsValidBitmap(IGLMsgQueue* queue, int width, int height);

// As the factory's functions of the same arguments.
IMKBitmap* CreateTextureBitmap(IGLMsgQueue* queue, int width, int height, void const* pixels,
                               bool deleteBuffer, int useQueue, bool textureFlag);
IMKBitmap* CreateSharedBitmap(IGLMsgQueue* queue, IMKBitmap* parent, int useQueue);
IMKBitmap* CreateScreenBitmap(IGLMsgQueue* queue, int x, int y, int width, int height,
                              int useDefaultFramebuffer, int useQueue);

} // namespace detail
} // namespace Moka
