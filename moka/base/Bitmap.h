/// Bitmap: an image in CPU memory, in one pixel buffer.
/// Units:  pixels, top row first; format 1 is RGBA8, premultiplied, four bytes a pixel. Stride is in bytes.
/// Owner:  the buffer comes from `new unsigned char[]`. If the delete-buffer switch is on, the destructor
///         deletes it. Otherwise the code that switched it off owns the buffer.
/// Thread: not synchronised.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/NonAssignable.h"

namespace Moka {

class MOKA_API Bitmap : NonAssignable {
public:
    /// The only format: RGBA8, premultiplied.
    static constexpr int kFormatRgba8888 = 1;

    Bitmap() = default;
    virtual ~Bitmap();

    /// Uses the buffer, and takes ownership of it if deleteBuffer is true. With copyPixels it copies the
    /// pixels instead, with stride width * 4: the bitmap then owns the copy, and the caller keeps the buffer.
    /// Returns false and changes nothing if the bitmap already has pixels, the buffer is null, a side is
    /// below 1, the stride is below width * 4, the format is not 1, or the copy cannot be allocated.
    bool Construct(unsigned char* buffer, int width, int height, int stride, int format, bool copyPixels,
                   bool deleteBuffer);

    /// Sizes in pixels, the stride in bytes; all 0 before Construct.
    int GetWidth() const { return mWidth; }
    int GetHeight() const { return mHeight; }
    int GetStride() const { return mStride; }
    /// kFormatRgba8888, or 0 before Construct.
    int GetFormat() const { return mFormat; }
    /// The pixels, top row first; null before Construct.
    unsigned char* GetBuffer() const { return mBuffer; }

    /// The delete-buffer switch: if it is on, the destructor deletes the buffer.
    void SetDeleteBuffer(bool on) { mDeleteBuffer = on; }
    bool GetDeleteBuffer() const { return mDeleteBuffer; }

private:
    unsigned char* mBuffer = nullptr;
    int mWidth = 0;
    int mHeight = 0;
    int mStride = 0;
    int mFormat = 0;
    bool mDeleteBuffer = false;
};

} // namespace Moka
