#include "moka/base/codec/ImageCodec.h"

#include "moka/base/codec/Premultiply.h"

#include <new>
#include <utility>

namespace Moka::detail {

bool PixelBuffer::Allocate(PixelSize newSize, std::string& reason) {
    size = newSize;
    pixels.reset(new (std::nothrow) unsigned char[GetCount() * 4]);
    if (!pixels) reason = "not enough memory for " + std::to_string(GetCount() * 4) + " bytes of pixels";
    return pixels != nullptr;
}

bool PixelView::IsOpaque() const {
    for (int y = 0; y < size.height; ++y) {
        if (!detail::IsOpaque(Row(y), GetWidth())) return false;
    }
    return true;
}

bool CheckSize(std::int64_t width, std::int64_t height, std::string& reason) {
    std::string const size = std::to_string(width) + " x " + std::to_string(height) + " pixels";
    if (width < 1 || height < 1) {
        reason = size + ": a side is below 1";
    } else if (width > BitmapFactory::kMaxSide || height > BitmapFactory::kMaxSide) {
        reason = size + ": a side is above " + std::to_string(BitmapFactory::kMaxSide);
    } else if (static_cast<std::uint64_t>(width * height) * 4 > BitmapFactory::kMaxBytes) {
        reason = size + ": more than 1 GiB decoded";
    } else {
        return true;
    }
    return false;
}

bool ScaleImage(PixelBuffer& image, PixelSize size, std::string& reason) {
    if (size == image.size) return true;
    PixelBuffer scaled;
    scaled.size = size;
    bool const grows = size.width > image.size.width || size.height > image.size.height;
    bool const inPlace = !grows && scaled.GetCount() * 2 > image.GetCount();
    if (!inPlace && !scaled.Allocate(size, reason)) return false;
    RowScaler scaler(image.size, size, inPlace ? image.pixels.get() : scaled.pixels.get());
    if (!scaler.IsReady()) {
        reason = "not enough memory to scale it";
        return false;
    }
    for (int y = 0; y < image.size.height; ++y) scaler.Push(image.Row(y));
    if (inPlace) scaled.pixels = std::move(image.pixels);
    image = std::move(scaled);
    return true;
}

} // namespace Moka::detail
