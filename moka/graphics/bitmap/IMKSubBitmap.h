/// IMKSubBitmap: one strip of a texture bitmap: a band of rows no taller than the device's largest texture.
/// Owner:  reference counted; the texture bitmap holds the first reference, each posted operation one more.
/// Units:  rectangles and points are those of the whole bitmap.
#pragma once

#include "moka/graphics/bitmap/IMKBitmapBufferUpdatable.h"
#include "moka/graphics/bitmap/IMKBitmapDataGettable.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"

namespace Moka {

class IGLMsgQueue;
class ITextureObject;

class IMKSubBitmap : public IMKBitmapWritable,
                     public IMKBitmapReadable,
                     public IMKBitmapBufferUpdatable,
                     public IMKBitmapDataGettable {
public:
    /// The index of the strip in the whole image. It differs from the position in the list only for bitmaps
    /// that hold a region of an image.
    virtual int GetBitmapIndex() = 0;
    virtual int GetX() = 0;
    virtual int GetY() = 0;
    virtual int GetWidth() = 0;
    virtual int GetHeight() = 0;
    virtual Rect GetBitmapRect() = 0;

    /// The strip's texture. Null until the render thread has created it, or if that failed.
    virtual ITextureObject* GetTexture() = 0;

    /// Take or drop a reference on the strip's frame buffer. The first one creates it, the last one deletes
    /// it. Each attached canvas holds one.
    virtual void CreateFrameBuffer() = 0;
    virtual void ReleaseFrameBuffer() = 0;
    virtual void CreateFrameBufferRT(bool release) = 0;
    virtual void ReleaseFrameBufferRT(bool release) = 0;

    /// As in IMKBitmap.
    virtual void SetTag(char const* tag) = 0;
    virtual IGLMsgQueue* GetMsgQueue() = 0;
    virtual int Ref() = 0;
    virtual int Unref() = 0;

    /// Returns a new strip with its own copy of the image and one reference. Null if memory runs out.
    virtual IMKSubBitmap* Clone() = 0;
};

} // namespace Moka
