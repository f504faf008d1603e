#include "moka/renderer/gles/GlPixels.h"

#include "moka/renderer/gles/GlTables.h"

#include <limits>

namespace Moka::detail {
namespace {

// Sets the pixel store parameters for a scope. Restores GL's defaults afterwards, as external GL may expect
// them.
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
    Gl::TexSubImage2D(GL_TEXTURE_2D, 0, x, y, width, height, kGlFormat, kGlType, pixels);
}

} // namespace

void ReservePixels(GlState& state, GLsizei width, GLsizei height) {
    GlPixelStoreScope const store(state.unpack, 0); // unbinds the host's pixel unpack buffer
    Gl::TexImage2D(GL_TEXTURE_2D, 0, static_cast<GLint>(kGlInternalFormat), width, height, 0, kGlFormat,
                   kGlType, nullptr);
}

void UploadPixels(GlState& state, PixelBlock const& block, void const* pixels, std::int64_t stride) {
    auto const* row = static_cast<unsigned char const*>(pixels) + block.skippedRows * stride +
                      block.skippedPixels * kBytesPerPixel;
    std::int64_t const rowLength = stride / kBytesPerPixel;
    if (stride % kBytesPerPixel == 0 && rowLength <= std::numeric_limits<GLint>::max()) {
        GlPixelStoreScope const store(state.unpack, static_cast<GLint>(rowLength));
        Upload(block.x, block.y, block.width, block.height, row);
        return;
    }
    // GL's row length is in whole pixels. Other strides upload row by row; no codec of ours produces them.
    GlPixelStoreScope const store(state.unpack, 0);
    for (GLsizei y = 0; y < block.height; ++y, row += stride)
        Upload(block.x, block.y + y, block.width, 1, row);
}

void ReadBackPixels(GlState& state, PixelBlock const& block, void* pixels, GLint rowLength) {
    auto* const first = static_cast<unsigned char*>(pixels) +
                        (block.skippedRows * rowLength + block.skippedPixels) * kBytesPerPixel;
    GlPixelStoreScope const store(state.pack, rowLength);
    Gl::ReadPixels(block.x, block.y, block.width, block.height, kGlFormat, kGlType, first);
}

} // namespace Moka::detail
