/// Bitmap: a CPU image over one pixel buffer.
/// Units:  pixels, first row first; format 1 is RGBA8, premultiplied, four bytes a pixel. Stride is in bytes.
/// Owner:  the buffer is `new unsigned char[]`; it is freed with array delete on destruction while the
///         delete-buffer switch is on, and otherwise belongs to the code that switched it off.
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

    /// Takes the buffer over as it is, or a copy of its pixels at stride width * 4 (copyPixels: the bitmap
    /// then owns its copy, regardless of deleteBuffer, and the buffer stays the caller's). False, with the
    /// bitmap and the buffer untouched, when the bitmap already has pixels, the buffer is null, a side is
    /// below 1, the stride is below width * 4, the format is not 1, or the copy cannot be allocated.
    bool Construct(unsigned char* buffer, int width, int height, int stride, int format, bool copyPixels,
                   bool deleteBuffer);

    /// Sizes in pixels, the stride in bytes; all 0 before Construct.
    int GetWidth() const { return mWidth; }
    int GetHeight() const { return mHeight; }
    int GetStride() const { return mStride; }
    /// kFormatRgba8888, or 0 before Construct.
    int GetFormat() const { return mFormat; }
    /// The pixels, first row first; null before Construct.
    unsigned char* GetBuffer() const { return mBuffer; }

    /// Whether the destructor frees the buffer.
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
