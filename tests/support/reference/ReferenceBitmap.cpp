#include "tests/support/reference/ReferenceBitmap.h"

#include <cstring>
#include <new>

namespace Moka::Testing {
namespace {

Wrap ToWrap(TextureParamWrappingValue value) {
    switch (value) {
    case TextureWrapRepeat:
        return Wrap::Repeat;
    case TextureWrapMirroredRepeat:
        return Wrap::Mirror;
    default:
        return Wrap::Clamp;
    }
}

} // namespace

unsigned int ReferenceBitmap::GetPixel(Point const& p) {
    unsigned int pixel = 0;
    GetBitmapData(Rect(p.x, p.y, p.x + 1, p.y + 1), &pixel);
    return pixel;
}

void ReferenceBitmap::GetPixelAsync(Point const& p, void* userData, PixelCallback callback) {
    if (callback) callback(GetPixel(p), userData);
}

void ReferenceBitmap::GetBitmapData(Rect const& r, void* destination) {
    Rect const inside = r.Intersect(GetBitmapRect());
    auto const stride = static_cast<std::size_t>(r.GetWidth()) * 4;
    for (int y = inside.top; y < inside.bottom; ++y) {
        auto* const row =
            static_cast<unsigned char*>(destination) + static_cast<std::size_t>(y - r.top) * stride;
        std::memcpy(row + static_cast<std::size_t>(inside.left - r.left) * 4, image.At(inside.left, y),
                    static_cast<std::size_t>(inside.GetWidth()) * 4);
    }
}

void ReferenceBitmap::GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                                         DataCallback callback) {
    GetBitmapData(r, destination);
    if (callback) callback(r, destination, userData);
}

IMKBitmap* ReferenceBitmap::Clone() { return new (std::nothrow) ReferenceBitmap(image); }

void ReferenceBitmap::SetTextureFilter(TextureParamFilteringValue value) {
    sampler.linear = value == TextureFilterLinear;
}

// The reference tells no growing from shrinking.
void ReferenceBitmap::SetTextureFilter(TextureParamFiltering, TextureParamFilteringValue value) {
    SetTextureFilter(value);
}

void ReferenceBitmap::SetTextureWrap(TextureParamWrappingValue value) {
    sampler.x = sampler.y = ToWrap(value);
}

void ReferenceBitmap::SetTextureWrap(TextureParamWrapping kind, TextureParamWrappingValue value) {
    (kind == TextureParamWrappingS ? sampler.x : sampler.y) = ToWrap(value);
}

} // namespace Moka::Testing
