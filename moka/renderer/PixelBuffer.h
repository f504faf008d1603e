/// PixelBuffer.h: source of an upload and destination of a read-back. RGBA8, four bytes
/// a pixel, rows packed at rowLength pixels.
#pragma once

namespace Moka {

/// A texture's pixels inside a larger image: the block that starts at (x, y) of an image rowLength pixels
/// wide.
struct PixelSource {
    void const* pixels = nullptr; ///< null: no pixels, the texture starts transparent
    /// The block's first pixel.
    int x = 0;
    int y = 0;
    int rowLength = 0; ///< pixels
};

/// A block inside a larger image: skipRows rows down and skipPixels pixels in.
struct PixelDestination {
    /// The image's first pixel.
    void* pixels = nullptr;
    int rowLength = 0; ///< pixels
    /// The block's place in the image, in pixels.
    int skipRows = 0;
    int skipPixels = 0;
};

} // namespace Moka
