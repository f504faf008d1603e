/// PixelBuffer.h: the source of an upload and the destination of a read-back. RGBA8, four bytes a pixel. Rows
/// are rowLength pixels apart.
#pragma once

namespace Moka {

/// The pixels of a texture as a block of a larger image. The block starts at (x, y).
struct PixelSource {
    void const* pixels = nullptr; ///< the image's first pixel; null: the texture starts transparent
    /// The block's first pixel, in pixels of the image.
    int x = 0;
    int y = 0;
    int rowLength = 0; ///< pixels
};

/// A block inside a larger image, skipRows rows below the first row and skipPixels pixels from the left.
struct PixelDestination {
    /// The image's first pixel.
    void* pixels = nullptr;
    int rowLength = 0; ///< pixels
    /// The block's place in the image, in pixels.
    int skipRows = 0;
    int skipPixels = 0;
};

} // namespace Moka
