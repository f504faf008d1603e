#include "moka/graphics/bitmap/MKScreenBitmapRT.h"

#include "moka/renderer/IRenderTarget.h"

namespace Moka {

MKScreenBitmapRT::MKScreenBitmapRT(IGLMsgQueue* queue, int x, int y, int width, int height,
                                   FramebufferType type)
    : MKScreenBitmapBase(queue, x, y, width, height, type) {
    CreateRenderTarget(width, height, type, "MKScreenBitmapRT");
}

MKScreenBitmapRT::~MKScreenBitmapRT() {
    if (IRenderTarget* const target = GetRenderTarget()) target->Release();
}

void MKScreenBitmapRT::GetPixelAsync(Point const& p, void* userData, PixelCallback callback) {
    unsigned int const pixel = ReadPixel(p);
    if (callback) callback(pixel, userData);
}

void MKScreenBitmapRT::GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                                          DataCallback callback) {
    ReadBlock(r, destination);
    if (callback) callback(r, destination, userData);
}

} // namespace Moka
