/// IMKBitmap: a GPU image that canvases draw into and drawables sample from.
/// Owner:   reference counted; a creating function returns one reference.
/// Thread:  caller-side bitmaps from any thread, render-thread bitmaps on the render thread only. The tag is
///          not synchronised.
/// The four capability getters return the interfaces that a bitmap supports, and null for the others. Do not
/// cast.
#pragma once

#include "moka/graphics/bitmap/IMKBitmapDataGettable.h"

namespace Moka {

class IGLMsgQueue;
class IMKBitmapCanvasAttachable;
class IMKBitmapReadable;
class IMKBitmapWritable;
class IMKTextureBitmap;

class IMKBitmap : public IMKBitmapDataGettable {
public:
    /// The bitmap's rectangle, in pixels. Only a screen bitmap may lie off the origin.
    virtual int GetX() const = 0;
    virtual int GetY() const = 0;
    virtual int GetWidth() const = 0;
    virtual int GetHeight() const = 0;
    virtual Rect GetBitmapRect() = 0;

    /// A label for logs and GL debuggers. The first 126 bytes are kept; null is ignored.
    virtual void SetTag(char const* tag) = 0;
    virtual char const* GetTag() = 0;

    /// Returns a new caller-side bitmap that shares this image, with one reference. The clone of a screen
    /// bitmap draws into the other frame buffer of the host: the current one instead of the default one, or
    /// the reverse. Returns null without a queue, or if memory runs out.
    virtual IMKBitmap* Clone() = 0;

    /// The queue that it was created with; may be null.
    virtual IGLMsgQueue* GetMsgQueue() = 0;

    /// Take or drop a reference, and return the count afterwards. The last Unref deletes the bitmap.
    virtual int Ref() = 0;
    virtual int Unref() = 0;

    /// The capabilities: sampling, drawing into it, canvases, strips. Null if the bitmap lacks one. The
    /// caller gets no reference.
    virtual IMKBitmapReadable* GetBitmapReadable() = 0;
    virtual IMKBitmapWritable* GetBitmapWritable() = 0;
    virtual IMKBitmapCanvasAttachable* GetBitmapCanvasAttachable() = 0;
    virtual IMKTextureBitmap* GetTextureBitmap() = 0;
};

} // namespace Moka
