/// BitmapFactory: decodes and encodes image files: PNG, JPEG, WebP and this platform's "mki". Reading chooses
/// the codec by content, writing by the path's extension ("png", "jpg", "jpeg", "webp", "mki"; any case). In
/// memory always RGBA8, premultiplied, sRGB, stride width * 4, in a buffer the bitmap owns. Colours: what a
/// file says of them (an ICC profile; a PNG's gamma and primaries) is converted to sRGB, 8 bits a channel; a
/// file that says nothing keeps every byte. A profile that cannot be used is ignored, with one warning. Of an
/// animated WebP the first frame is decoded, of an animated PNG its default image. Not applied: the
/// orientation that a camera notes; rows come as they are stored.
/// Thread:  any; no state.
/// Fails:   null or false, and logs an error, "cannot read image 'name': reason" or "cannot save ...", whose
///          name is masked outside engineering builds (Log::ConvertSecureLog). Nothing is left behind: a
///          decode frees what it had, an encode writes a temporary file beside the target, flushes it and
///          renames.
/// Reason:  the overloads with one more argument also fill it with the reason alone, for callers who may name
///          the file. It is untouched on success.
/// Limits:  no side above 65,535, no image above 1 GiB decoded, checked before anything is allocated.
/// Cost:    one decoded copy at a time, plus the codec's buffers for a row or a block.
#pragma once

#include "moka/base/Export.h"

#include <cstddef>
#include <cstdint>
#include <string>

namespace Moka {

class Bitmap;
class String;

/// The formats of image files.
enum class ImageFormat { Unknown, Png, Jpeg, Webp, Mki };

/// The header of an image file.
struct ImageInfo {
    /// As the file's header says. Sizes in pixels.
    ImageFormat format = ImageFormat::Unknown;
    int width = 0;
    int height = 0;
    bool hasAlpha = false;
    std::uint64_t fileBytes = 0;
    std::string profile; ///< of colours: an ICC profile's name, "sRGB", or "gamma 0.45455"; empty without any
    int orientation = 1; ///< as EXIF numbers it, 1 to 8; 1 is upright
    int frames = 1;      ///< of an animation
};

class MOKA_API BitmapFactory {
public:
    /// The largest images: a side in pixels, the decoded pixels in bytes.
    static constexpr int kMaxSide = 65535;
    static constexpr std::uint64_t kMaxBytes = std::uint64_t{1} << 30;

    /// Scaled to exactly width x height (both at least 1): by the codec where it can, by area averaging for
    /// the rest when shrinking and bilinear when growing.
    static Bitmap* CreateBitmap(String const* path, int width, int height);
    static Bitmap* CreateBitmap(String const* path, int width, int height, std::string* reason);

    /// At the file's own size.
    static Bitmap* CreateBitmapForGraphics(String const* path);
    static Bitmap* CreateBitmapForGraphics(String const* path, std::string* reason);

    /// From an encoded file in memory. name appears in messages as a path would.
    static Bitmap* CreateBitmapFromMemory(void const* data, std::size_t size, char const* name);

    /// Wraps raw pixels; see Bitmap::Construct. With deleteBuffer the new bitmap owns the buffer. Null when
    /// Construct refuses; the buffer then still belongs to the caller.
    static Bitmap* CreateBitmapFromBuffer(unsigned char* buffer, int width, int height, int stride,
                                          int format, bool deleteBuffer);

    /// quality is 0 ... 100 (clamped), on the codec's scale: JPEG's and WebP's own scale (WebP:
    /// 100 is lossless), ignored by PNG and "mki". JPEG is flattened on white.
    static bool SaveBitmap(Bitmap const* bitmap, String const* path, int quality);
    static bool SaveBitmap(Bitmap const* bitmap, String const* path, int quality, std::string* reason);

    /// Reads the header only.
    static bool GetImageInfo(String const* path, ImageInfo* info);
    static bool GetImageInfo(String const* path, ImageInfo* info, std::string* reason);

    /// Whether SaveBitmap knows the path's extension.
    static ImageFormat GetFormatByExtension(String const* path);
    static char const* GetFormatName(ImageFormat format); ///< "PNG", "JPEG", "WebP", "mki", "unknown"
};

} // namespace Moka
