#include "apps/samples/Compare.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"

#include <cstddef>
#include <cstring>
#include <memory>

namespace Moka::Samples {
namespace {

std::unique_ptr<Bitmap> Load(std::string const& path) {
    String const text(path);
    return std::unique_ptr<Bitmap>(BitmapFactory::CreateBitmapForGraphics(&text));
}

unsigned char const* PixelAt(Bitmap const& image, int x, int y) {
    auto const row = static_cast<std::size_t>(image.GetStride()) * static_cast<std::size_t>(y);
    return &image.GetBuffer()[row + 4 * static_cast<std::size_t>(x)];
}

} // namespace

Comparison Compare(std::string const& a, std::string const& b) {
    std::unique_ptr<Bitmap> const first = Load(a);
    std::unique_ptr<Bitmap> const second = Load(b);
    Comparison result;
    result.isRead = first && second;
    result.isSameSize =
        result.isRead && first->GetWidth() == second->GetWidth() && first->GetHeight() == second->GetHeight();
    if (!result.isSameSize) return result;
    for (int y = 0; y < first->GetHeight(); ++y)
        for (int x = 0; x < first->GetWidth(); ++x)
            result.differing += std::memcmp(PixelAt(*first, x, y), PixelAt(*second, x, y), 4) != 0;
    return result;
}

} // namespace Moka::Samples
