#include "moka/renderer/gles/GlPixels.h"

#include "moka/renderer/gles/GlTables.h"

#include <algorithm>
#include <limits>

namespace Moka::detail {
namespace {

// Leaves GL's defaults behind, in which foreign code may trust.
template <class Access>
class GlPixelStoreScope {
public:
    GlPixelStoreScope(GlShadow<Access>& shadow, GLint rowLength) : mShadow(shadow) {
        GlPixelStore store;
        store.rowLength = rowLength;
        mShadow.Set(store);
    }
    ~GlPixelStoreScope() { mShadow.Set({}); }
    GlPixelStoreScope(GlPixelStoreScope const&) = delete;
    GlPixelStoreScope& operator=(GlPixelStoreScope const&) = delete;

private:
    GlShadow<Access>& mShadow;
};

void Upload(GLint x, GLint y, GLsizei width, GLsizei height, void const* pixels) {
    glTexSubImage2D(GL_TEXTURE_2D, 0, x, y, width, height, kGlFormat, kGlType, pixels);
}

} // namespace

std::size_t GlBlock::GetBytes() const {
    return static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * kBytesPerPixel;
}

GlBlock GlBlock::Clip(std::int64_t x, std::int64_t y, std::int64_t width, std::int64_t height,
                      GLsizei imageWidth, GLsizei imageHeight) {
    std::int64_t const left = std::max<std::int64_t>(x, 0);
    std::int64_t const top = std::max<std::int64_t>(y, 0);
    std::int64_t const right = std::min<std::int64_t>(x + width, imageWidth);
    std::int64_t const bottom = std::min<std::int64_t>(y + height, imageHeight);
    if (right <= left || bottom <= top) return {};
    GlBlock block;
    block.x = static_cast<GLint>(left);
    block.y = static_cast<GLint>(top);
    block.width = static_cast<GLsizei>(right - left);
    block.height = static_cast<GLsizei>(bottom - top);
    block.skippedRows = static_cast<std::ptrdiff_t>(top - y);
    block.skippedPixels = static_cast<std::ptrdiff_t>(left - x);
    return block;
}

void UploadPixels(GlState& state, GlBlock const& block, void const* pixels, std::int64_t stride) {
    auto const* row = static_cast<unsigned char const*>(pixels) + block.skippedRows * stride +
                      block.skippedPixels * kBytesPerPixel;
    std::int64_t const rowLength = stride / kBytesPerPixel;
    if (stride % kBytesPerPixel == 0 && rowLength <= std::numeric_limits<GLint>::max()) {
        GlPixelStoreScope const store(state.unpack, static_cast<GLint>(rowLength));
        Upload(block.x, block.y, block.width, block.height, row);
        return;
    }
    // GL counts the distance of rows in pixels, so these rows go one by one. Rare: no codec makes them.
    GlPixelStoreScope const store(state.unpack, 0);
    for (GLsizei y = 0; y < block.height; ++y, row += stride)
        Upload(block.x, block.y + y, block.width, 1, row);
}

void ReadBackPixels(GlState& state, GlBlock const& block, void* pixels, GLint rowLength) {
    auto* const first = static_cast<unsigned char*>(pixels) +
                        (block.skippedRows * rowLength + block.skippedPixels) * kBytesPerPixel;
    GlPixelStoreScope const store(state.pack, rowLength);
    glReadPixels(block.x, block.y, block.width, block.height, kGlFormat, kGlType, first);
}

} // namespace Moka::detail
