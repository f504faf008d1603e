/// BitmapFactory: decodes and encodes image files: PNG, JPEG, WebP and this platform's "mki". Reading selects
/// the codec by content, writing by the path's extension ("png", "jpg", "jpeg", "webp", "mki"; any case).
/// Decoded images are RGBA8, premultiplied, sRGB, with stride width * 4, in a buffer that the bitmap owns.
/// Colours are converted to sRGB, 8 bits a channel, by the file's ICC profile, or a PNG's gamma and
/// primaries. Without these, the bytes are not changed. A profile that cannot be used is ignored and logs a
/// warning. Of an animated WebP the first frame is decoded, of an animated PNG the default image. The EXIF
/// orientation is not applied.
/// Thread:  any; the factory has no state.
/// Fails:   returns null or false and logs an error, "cannot read image 'name': reason" or "cannot save ...".
///          Outside of engineering builds the name is masked (Log::ConvertSecureLog). A failed decode frees
///          its memory. An encode writes a temporary file next to the target, flushes and renames it, so no
///          partial file is left.
/// Reason:  the overloads with one more argument also set it to the reason alone, for callers who may show
/// the path. On
///          success it does not change.
/// Limits:  no side above 65,535 pixels, no image above 1 GiB decoded. Both are checked before anything is
///          allocated.
/// Cost:    one decoded copy, plus the codec's buffers for a row or a block.
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
    /// The values of the file's header. Sizes in pixels.
    ImageFormat format = ImageFormat::Unknown;
    int width = 0;
    int height = 0;
    bool hasAlpha = false;
    std::uint64_t fileBytes = 0;
    std::string profile; ///< the name of the ICC profile, "sRGB", or "gamma 0.45455"; empty without any
    int orientation = 1; ///< the EXIF orientation, 1 to 8; 1 is upright
    int frames = 1;      ///< the number of frames of an animation
};

class MOKA_API BitmapFactory {
public:
    /// The limits: the largest side in pixels, and the largest decoded image in bytes.
    static constexpr int kMaxSide = 65535;
    static constexpr std::uint64_t kMaxBytes = std::uint64_t{1} << 30;

    /// Decodes a file and scales it to exactly width x height, both at least 1. The codec scales as far as it
    /// can; the rest is area averaging for reducing and bilinear for enlarging.
    static Bitmap* CreateBitmap(String const* path, int width, int height);
    static Bitmap* CreateBitmap(String const* path, int width, int height, std::string* reason);

    /// Decodes a file in its own size.
    static Bitmap* CreateBitmapForGraphics(String const* path);
    static Bitmap* CreateBitmapForGraphics(String const* path, std::string* reason);

    /// Decodes an image file in memory. name appears in messages in place of a path.
    static Bitmap* CreateBitmapFromMemory(void const* data, std::size_t size, char const* name);

    /// Creates a bitmap that uses raw pixels; see Bitmap::Construct. With deleteBuffer the bitmap takes
    /// ownership of the buffer. Returns null, and does not take ownership, if Construct fails.
    static Bitmap* CreateBitmapFromBuffer(unsigned char* buffer, int width, int height, int stride,
                                          int format, bool deleteBuffer);

    /// Encodes a bitmap to a file. quality is 0 ... 100 (clamped), on the scale of JPEG or WebP; WebP with
    /// 100 is lossless. PNG and "mki" ignore it. JPEG images are flattened on white.
    static bool SaveBitmap(Bitmap const* bitmap, String const* path, int quality);
    static bool SaveBitmap(Bitmap const* bitmap, String const* path, int quality, std::string* reason);

    /// Reads the header only.
    static bool GetImageInfo(String const* path, ImageInfo* info);
    static bool GetImageInfo(String const* path, ImageInfo* info, std::string* reason);

    /// The format for the path's extension; Unknown if SaveBitmap does not support it.
    static ImageFormat GetFormatByExtension(String const* path);
    static char const* GetFormatName(ImageFormat format); ///< "PNG", "JPEG", "WebP", "mki", "unknown"
};

} // namespace Moka
