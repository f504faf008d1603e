// ImageCodec.h: the common interface of the codecs. A codec is a constant table of stateless functions.
// Fails:  functions return false and the reason, a phrase without the file's name, and free all memory. If
//         encode leaves the reason empty, writing the file failed, and AtomicFile has the reason.
// Order:  every codec checks the size in the file's header with CheckSize before it allocates.
#pragma once

#include "moka/base/BitmapFactory.h"
#include "moka/base/codec/AtomicFile.h"
#include "moka/base/codec/ImageSource.h"
#include "moka/base/codec/RowScaler.h"

#include <memory>
#include <string>

namespace Moka::detail {

// A decoded image: RGBA8, premultiplied, rows packed.
struct PixelBuffer {
    std::unique_ptr<unsigned char[]> pixels;
    PixelSize size;

    bool Allocate(PixelSize newSize, std::string& reason);
    unsigned char* Row(int y) const { return pixels.get() + GetStride() * static_cast<std::size_t>(y); }
    std::size_t GetStride() const { return static_cast<std::size_t>(size.width) * 4; }
    std::size_t GetCount() const {
        return static_cast<std::size_t>(size.width) * static_cast<std::size_t>(size.height);
    }
};

// An image to encode: RGBA8, premultiplied.
struct PixelView {
    unsigned char const* pixels;
    PixelSize size;
    std::size_t stride; // bytes

    unsigned char const* Row(int y) const { return pixels + stride * static_cast<std::size_t>(y); }
    std::size_t GetWidth() const { return static_cast<std::size_t>(size.width); }
    bool IsOpaque() const;
};

struct ImageCodec {
    ImageFormat format;

    // True if the codec reads files that begin like this. head has kSignatureBytes, or fewer if the file is
    // shorter.
    bool (*matches)(ByteSpan head);

    // Sets all members except format and fileBytes. Reads only the data before the pixels, if that is enough.
    bool (*readInfo)(ImageSource& source, ImageInfo& info, std::string& reason);

    // Decodes the image, scaled to target, or in its own size if target is {0, 0}. target is within the
    // limits. If it succeeds and sets a reason, that is why the file's colour profile was ignored.
    bool (*decode)(ImageSource& source, PixelSize target, PixelBuffer& image, std::string& reason);

    // view is within the limits; quality is 0 ... 100.
    bool (*encode)(PixelView const& view, int quality, AtomicFile& file, std::string& reason);
};

constexpr std::size_t kSignatureBytes = 16;

extern ImageCodec const kPngCodec;
extern ImageCodec const kJpegCodec;
extern ImageCodec const kWebpCodec;
extern ImageCodec const kMkiCodec;

// Returns true if both sides are in 1 ... kMaxSide and the pixels take at most kMaxBytes. Otherwise sets
// reason.
bool CheckSize(std::int64_t width, std::int64_t height, std::string& reason);

// Returns target, or own if target is {0, 0}.
inline PixelSize ChooseSize(PixelSize target, PixelSize own) { return target == PixelSize{} ? own : target; }

// Scales a whole image, for codecs that cannot decode row by row. If the result fills most of the image's
// memory, it scales in place, so that there are never two large copies.
bool ScaleImage(PixelBuffer& image, PixelSize size, std::string& reason);

} // namespace Moka::detail
