// ImageCodec.h: the shape all codecs share. A codec is a constant table of functions without state.
// Fails:  false and the reason, a phrase without the file's name; whatever was allocated is freed. A reason
//         left empty by encode means the file itself failed and knows why.
// Order:  every codec checks the size a file claims with CheckSize before it allocates by it.
#pragma once

#include "moka/base/BitmapFactory.h"
#include "moka/base/codec/AtomicFile.h"
#include "moka/base/codec/ImageSource.h"
#include "moka/base/codec/RowScaler.h"

#include <memory>
#include <string>

namespace Moka::detail {

// A decoded image: RGBA8, premultiplied, rows without gaps.
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

    // Whether a file that begins like this is the codec's to read. head has kSignatureBytes, fewer only when
    // the file has.
    bool (*matches)(ByteSpan head);

    // Fills in all but format and fileBytes, from what stands before the pixels where that is enough.
    bool (*readInfo)(ImageSource& source, ImageInfo& info, std::string& reason);

    // target is the size the image shall have; {0, 0} is its own. target is within the limits. Where it
    // succeeds, a reason is why the file's colour profile was ignored.
    bool (*decode)(ImageSource& source, PixelSize target, PixelBuffer& image, std::string& reason);

    // view is within the limits; quality is 0 ... 100.
    bool (*encode)(PixelView const& view, int quality, AtomicFile& file, std::string& reason);
};

constexpr std::size_t kSignatureBytes = 16;

extern ImageCodec const kPngCodec;
extern ImageCodec const kJpegCodec;
extern ImageCodec const kWebpCodec;
extern ImageCodec const kMkiCodec;

// Every side 1 ... kMaxSide and the pixels within kMaxBytes.
bool CheckSize(std::int64_t width, std::int64_t height, std::string& reason);

// What is decoded when target is asked for and the file has own.
inline PixelSize ChooseSize(PixelSize target, PixelSize own) { return target == PixelSize{} ? own : target; }

// For codecs that deliver a whole image: brings it to the size, in its own memory when the result fills most
// of that, so that two large copies never stand side by side.
bool ScaleImage(PixelBuffer& image, PixelSize size, std::string& reason);

} // namespace Moka::detail
