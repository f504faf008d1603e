#include "moka/base/Bitmap.h"

#include <cstddef>
#include <cstring>
#include <new>

namespace Moka {
namespace {

unsigned char* CopyPixels(unsigned char const* source, std::size_t sourceStride, std::size_t rowBytes,
                          std::size_t rows) {
    auto* const copy = new (std::nothrow) unsigned char[rowBytes * rows];
    if (!copy) return nullptr;
    // Copies row by row, because the source may end after its last pixel, before a whole stride.
    for (std::size_t row = 0; row < rows; ++row) {
        std::memcpy(copy + row * rowBytes, source + row * sourceStride, rowBytes);
    }
    return copy;
}

} // namespace

Bitmap::~Bitmap() {
    if (mDeleteBuffer) delete[] mBuffer;
}

bool Bitmap::Construct(unsigned char* buffer, int width, int height, int stride, int format, bool copyPixels,
                       bool deleteBuffer) {
    if (mBuffer || !buffer || width < 1 || height < 1 || format != kFormatRgba8888) return false;
    if (stride / 4 < width) return false;
    if (copyPixels) {
        buffer = CopyPixels(buffer, static_cast<std::size_t>(stride), static_cast<std::size_t>(width) * 4,
                            static_cast<std::size_t>(height));
        if (!buffer) return false;
        stride = width * 4;
        deleteBuffer = true;
    }
    mBuffer = buffer;
    mWidth = width;
    mHeight = height;
    mStride = stride;
    mFormat = format;
    mDeleteBuffer = deleteBuffer;
    return true;
}

} // namespace Moka
