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
    /// The band number: differs from the position in the list only for bitmaps of a region.
    virtual int GetBitmapIndex() = 0;
    virtual int GetX() = 0;
    virtual int GetY() = 0;
    virtual int GetWidth() = 0;
    virtual int GetHeight() = 0;
    virtual Rect GetBitmapRect() = 0;

    /// Null until the render thread has created it, or if it could not.
    virtual ITextureObject* GetTexture() = 0;

    /// One reference on the frame buffer for each attached canvas.
    virtual void CreateFrameBuffer() = 0;
    virtual void ReleaseFrameBuffer() = 0;
    virtual void CreateFrameBufferRT(bool release) = 0;
    virtual void ReleaseFrameBufferRT(bool release) = 0;

    /// As IMKBitmap.
    virtual void SetTag(char const* tag) = 0;
    virtual IGLMsgQueue* GetMsgQueue() = 0;
    virtual int Ref() = 0;
    virtual int Unref() = 0;

    /// A strip with its own copy of the image, holding one reference; null when memory runs out.
    virtual IMKSubBitmap* Clone() = 0;
};

} // namespace Moka
