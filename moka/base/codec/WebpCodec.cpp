// WebpCodec.cpp: WebP through libwebp, still images only. Quality 100 is lossless, below it lossy with
// lossless alpha. The library holds a decoded lossless image once more inside while it decodes.
#include "moka/base/codec/ImageCodec.h"
#include "moka/base/codec/Premultiply.h"

#include <cstring>
#include <webp/decode.h>
#include <webp/encode.h>

namespace Moka::detail {
namespace {

// The header with every chunk a still image may have before its data.
constexpr std::uint64_t kFirstPrefix = 4096;
constexpr int kLosslessQuality = 100;
// Measured (bench/codec) against level 2: ink pages come out a fifth smaller for a sixth more time, photos 6
// % smaller for nearly twice the time. Levels 4 and 6 take longer again and save no more than 1 %.
constexpr int kLosslessLevel = 3;

bool Refuse(std::string& reason, char const* text) {
    reason = text;
    return false;
}

bool Matches(ByteSpan head) {
    return head.size >= 12 && std::memcmp(head.data, "RIFF", 4) == 0 &&
           std::memcmp(head.data + 8, "WEBP", 4) == 0;
}

char const* Describe(VP8StatusCode status) {
    switch (status) {
    case VP8_STATUS_OUT_OF_MEMORY:
        return "not enough memory to decode it";
    case VP8_STATUS_UNSUPPORTED_FEATURE:
        return "it uses a feature that is not supported";
    case VP8_STATUS_SUSPENDED:
    case VP8_STATUS_NOT_ENOUGH_DATA:
        return "the file is truncated";
    case VP8_STATUS_OK:
    case VP8_STATUS_INVALID_PARAM:
    case VP8_STATUS_BITSTREAM_ERROR:
    case VP8_STATUS_USER_ABORT:
        break;
    }
    return "the file is damaged";
}

bool ReadFeatures(ImageSource& source, WebPBitstreamFeatures& features, std::string& reason) {
    VP8StatusCode status = VP8_STATUS_NOT_ENOUGH_DATA;
    for (std::uint64_t count = kFirstPrefix; status == VP8_STATUS_NOT_ENOUGH_DATA; count *= 8) {
        ByteSpan head;
        if (!source.Prefix(count, head, reason)) return false;
        status = WebPGetFeatures(head.data, head.size, &features);
        if (count >= source.GetSize()) break;
    }
    if (status != VP8_STATUS_OK) return Refuse(reason, Describe(status));
    if (features.has_animation) return Refuse(reason, "it is animated, and only still images can be read");
    return CheckSize(features.width, features.height, reason);
}

bool ReadInfo(ImageSource& source, ImageInfo& info, std::string& reason) {
    WebPBitstreamFeatures features;
    if (!ReadFeatures(source, features, reason)) return false;
    info.width = features.width;
    info.height = features.height;
    info.hasAlpha = features.has_alpha != 0;
    return true;
}

// Straight alpha, because the library's own premultiplying does not round to nearest.
bool DecodePixels(ByteSpan file, bool isScaled, PixelBuffer const& image, std::string& reason) {
    WebPDecoderConfig config;
    if (!WebPInitDecoderConfig(&config)) return Refuse(reason, "libwebp does not fit the one built against");
    config.options.use_scaling = isScaled;
    config.options.scaled_width = image.size.width;
    config.options.scaled_height = image.size.height;
    config.output.colorspace = MODE_RGBA;
    config.output.is_external_memory = 1;
    config.output.u.RGBA.rgba = image.pixels.get();
    config.output.u.RGBA.stride = static_cast<int>(image.GetStride());
    config.output.u.RGBA.size = image.GetCount() * 4;
    VP8StatusCode const status = WebPDecode(file.data, file.size, &config);
    WebPFreeDecBuffer(&config.output);
    if (status != VP8_STATUS_OK) return Refuse(reason, Describe(status));
    PremultiplyPixels(image.pixels.get(), image.GetCount());
    return true;
}

bool Decode(ImageSource& source, PixelSize target, PixelBuffer& image, std::string& reason) {
    WebPBitstreamFeatures features;
    ByteSpan file;
    if (!ReadFeatures(source, features, reason)) return false;
    if (!source.Prefix(source.GetSize(), file, reason)) return false;
    PixelSize const own{features.width, features.height};
    PixelSize const wanted = ChooseSize(target, own);
    // The library's scaler is an area filter too, but only where both axes shrink.
    bool const isScaledByLibrary = wanted != own && wanted.width <= own.width && wanted.height <= own.height;
    return image.Allocate(isScaledByLibrary ? wanted : own, reason) &&
           DecodePixels(file, isScaledByLibrary, image, reason) && ScaleImage(image, wanted, reason);
}

struct Picture : NonAssignable {
    ~Picture() { WebPPictureFree(&picture); }
    WebPPicture picture;
};

bool FillPicture(PixelView const& view, WebPPicture& picture, std::string& reason) {
    PixelBuffer row;
    if (!row.Allocate({view.size.width, 1}, reason)) return false;
    for (int y = 0; y < view.size.height; ++y) {
        UnpremultiplyPixels(view.Row(y), row.Row(0), view.GetWidth());
        std::uint32_t* to = picture.argb + static_cast<std::ptrdiff_t>(picture.argb_stride) * y;
        unsigned char const* from = row.Row(0);
        for (unsigned char const* const end = from + row.GetStride(); from != end; from += 4) {
            *to++ = std::uint32_t{from[3]} << 24 | std::uint32_t{from[0]} << 16 |
                    std::uint32_t{from[1]} << 8 | from[2];
        }
    }
    return true;
}

int OnWrite(std::uint8_t const* data, std::size_t count, WebPPicture const* picture) {
    return static_cast<AtomicFile*>(picture->custom_ptr)->Write(data, count);
}

bool MakeConfig(int quality, WebPConfig& config) {
    if (!WebPConfigInit(&config)) return false;
    config.quality = static_cast<float>(quality);
    if (quality == kLosslessQuality) {
        if (!WebPConfigLosslessPreset(&config, kLosslessLevel)) return false;
        config.exact = 1;
    }
    return WebPValidateConfig(&config) != 0;
}

char const* Describe(WebPEncodingError error) {
    bool const isMemory =
        error == VP8_ENC_ERROR_OUT_OF_MEMORY || error == VP8_ENC_ERROR_BITSTREAM_OUT_OF_MEMORY;
    return isMemory ? "not enough memory to encode it" : "libwebp cannot encode it";
}

bool Encode(PixelView const& view, int quality, AtomicFile& file, std::string& reason) {
    if (view.size.width > WEBP_MAX_DIMENSION || view.size.height > WEBP_MAX_DIMENSION) {
        return Refuse(reason, "a WebP file has no side above 16383; use png or mki");
    }
    WebPConfig config;
    Picture owner;
    WebPPicture& picture = owner.picture;
    if (!WebPPictureInit(&picture) || !MakeConfig(quality, config)) {
        return Refuse(reason, "libwebp does not fit the one built against");
    }
    picture.use_argb = 1;
    picture.width = view.size.width;
    picture.height = view.size.height;
    picture.writer = OnWrite;
    picture.custom_ptr = &file;
    if (!WebPPictureAlloc(&picture)) return Refuse(reason, "not enough memory to encode it");
    if (!FillPicture(view, picture, reason)) return false;
    return WebPEncode(&config, &picture) != 0 || Refuse(reason, Describe(picture.error_code));
}

} // namespace

extern ImageCodec const kWebpCodec{ImageFormat::Webp, Matches, ReadInfo, Decode, Encode};

} // namespace Moka::detail
