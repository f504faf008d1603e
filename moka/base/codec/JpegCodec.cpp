// JpegCodec.cpp: JPEG with TurboJPEG. Grey, RGB, YCbCr, CMYK and YCCK files become opaque sRGB, by their ICC
// profile if they have one. The EXIF orientation is not applied. Saving flattens on white.
// Damage: a warning of the library means that it guessed pixels, which counts as a failure. Exceptions are a
// few warnings
//         that files of real cameras cause and that do not affect pixels (kHarmless). The library keeps only
//         the first warning of an image, so this file itself checks for the most frequent damage, a missing
//         end.
#include "moka/base/codec/ColorTransform.h"
#include "moka/base/codec/Exif.h"
#include "moka/base/codec/ImageCodec.h"
#include "moka/base/codec/Premultiply.h"

#include <algorithm>
#include <cstring>
#include <turbojpeg.h>
#include <vector>

namespace Moka::detail {
namespace {

// From this quality on chroma has full resolution, so that thin coloured lines stay sharp.
constexpr int kFullColourQuality = 90;
// The header is nearly always within this prefix. Profiles and previews can move it beyond.
constexpr std::uint64_t kFirstPrefix = 65536;

// Parts of the library's warning texts; it has no codes for warnings.
constexpr char const* kHarmless[] = {"extraneous bytes before marker", "unknown JFIF revision number",
                                     "Unknown Adobe color transform code",
                                     "Inconsistent progression sequence"};

class Handle : NonAssignable {
public:
    explicit Handle(tjhandle handle) : mHandle(handle) {}
    ~Handle() {
        if (mHandle) tjDestroy(mHandle);
    }
    explicit operator bool() const { return mHandle != nullptr; }
    tjhandle Get() const { return mHandle; }
    char const* GetText() const { return tjGetErrorStr2(mHandle); }

    bool IsHarmless(int result) const {
        if (result == 0) return true;
        if (tjGetErrorCode(mHandle) != TJERR_WARNING) return false;
        char const* const text = GetText();
        return std::any_of(std::begin(kHarmless), std::end(kHarmless),
                           [text](char const* harmless) { return std::strstr(text, harmless); });
    }

private:
    tjhandle mHandle;
};

bool Refuse(std::string& reason, char const* text) {
    reason = text;
    return false;
}

bool Matches(ByteSpan head) {
    return head.size >= 3 && head.data[0] == 0xFF && head.data[1] == 0xD8 && head.data[2] == 0xFF;
}

// Information from a file's markers that the library does not report.
struct Markers {
    bool hasEnd = false;
    bool hasAdobe = false;
    ByteSpan exif;
    // An ICC profile consists of up to 255 parts in any order. Each contains its number, from 1, and the
    // number of parts.
    std::vector<ByteSpan> profileParts;
    bool isProfileWhole = true;
};

template <std::size_t size>
bool BeginsWith(ByteSpan bytes, char const (&text)[size]) {
    return bytes.size >= size && std::memcmp(bytes.data, text, size) == 0; // including the zero byte
}

void AddProfilePart(ByteSpan part, Markers& markers) {
    unsigned const number = part.size >= 2 ? part.data[0] : 0;
    unsigned const count = part.size >= 2 ? part.data[1] : 0;
    markers.profileParts.resize(std::max<std::size_t>(markers.profileParts.size(), count));
    bool const isNew = number >= 1 && number <= count && markers.profileParts.size() == count &&
                       markers.profileParts[number - 1].data == nullptr;
    if (isNew)
        markers.profileParts[number - 1] = {part.data + 2, part.size - 2};
    else
        markers.isProfileWhole = false;
}

void ReadSegment(unsigned code, ByteSpan content, Markers& markers) {
    constexpr char kProfile[] = "ICC_PROFILE";
    if (code == 0xEE && content.size >= 12 && std::memcmp(content.data, "Adobe", 5) == 0)
        markers.hasAdobe = true;
    if (code == 0xE1 && BeginsWith(content, "Exif\0") && !markers.exif.data) markers.exif = content;
    if (code == 0xE2 && BeginsWith(content, kProfile))
        AddProfilePart({content.data + sizeof(kProfile), content.size - sizeof(kProfile)}, markers);
}

// Skips segments by their length, so that the end marker of an embedded preview does not count. Between
// segments and in coded data, a marker is FF followed by a byte other than stuffing (00, FF) and restart (D0
// ... D7).
Markers FindMarkers(ByteSpan file) {
    Markers markers;
    for (std::size_t i = 2; i + 1 < file.size;) {
        void const* const found = std::memchr(file.data + i, 0xFF, file.size - 1 - i);
        if (!found) break;
        i = static_cast<std::size_t>(static_cast<unsigned char const*>(found) - file.data);
        unsigned const code = file.data[i + 1];
        bool const isMarker = code > 0x01 && code != 0xFF && (code < 0xD0 || code > 0xD8);
        if (!isMarker) {
            ++i;
            continue;
        }
        markers.hasEnd = code == 0xD9;
        if (markers.hasEnd || i + 4 > file.size) break;
        unsigned char const* const segment = file.data + i + 2;
        std::size_t const length = std::max<std::size_t>(segment[0] * 256u + segment[1], 2);
        std::size_t const left = file.size - i - 4;
        ReadSegment(code, {segment + 2, std::min(length - 2, left)}, markers);
        i += 2 + length;
    }
    return markers;
}

struct Header {
    int width = -1;
    int height = -1;
    int subsampling = -1;
    int colourSpace = -1;

    bool IsCmyk() const { return colourSpace == TJCS_CMYK || colourSpace == TJCS_YCCK; }
};

// The library reports an error for unusual subsamplings but decodes them. So the header counts as valid if it
// has a size.
bool ReadHeader(Handle const& handle, ByteSpan file, Header& header, std::string& reason) {
    if (!handle) return Refuse(reason, "not enough memory to decode it");
    int const result = tjDecompressHeader3(handle.Get(), file.data, file.size, &header.width, &header.height,
                                           &header.subsampling, &header.colourSpace);
    if (header.width >= 1 && header.height >= 1) return true;
    return Refuse(reason, result == 0 ? "it contains tables but no image" : handle.GetText());
}

// Returns the joined parts of the profile; empty if there are none or some are missing.
std::vector<unsigned char> JoinProfile(Markers const& markers) {
    std::vector<unsigned char> profile;
    bool const isWhole =
        markers.isProfileWhole && std::all_of(markers.profileParts.begin(), markers.profileParts.end(),
                                              [](ByteSpan part) { return part.data != nullptr; });
    if (!isWhole) return profile;
    for (ByteSpan const& part : markers.profileParts)
        profile.insert(profile.end(), part.data, part.data + part.size);
    return profile;
}

void DescribeMarkers(ByteSpan file, ImageInfo& info) {
    Markers const markers = FindMarkers(file);
    std::vector<unsigned char> const profile = JoinProfile(markers);
    info.orientation = ReadOrientation(markers.exif);
    if (!markers.profileParts.empty()) info.profile = GetProfileName({profile.data(), profile.size()});
}

bool ReadInfo(ImageSource& source, ImageInfo& info, std::string& reason) {
    Handle const handle(tjInitDecompress());
    Header header;
    for (std::uint64_t count = kFirstPrefix;; count *= 8) {
        ByteSpan head;
        if (!source.Prefix(count, head, reason)) return false;
        // After a successful read the prefix contains all markers before the pixels.
        if (ReadHeader(handle, head, header, reason)) {
            DescribeMarkers(head, info);
            break;
        }
        if (count >= source.GetSize()) return false;
    }
    info.width = header.width;
    info.height = header.height;
    info.hasAlpha = false;
    return CheckSize(header.width, header.height, reason);
}

// Returns the smallest size that the decoder can produce and that is at least wanted on each axis that
// shrinks.
PixelSize ChooseDecodedSize(PixelSize own, PixelSize wanted) {
    int count = 0;
    tjscalingfactor const* const factors = tjGetScalingFactors(&count);
    PixelSize best = own;
    for (int i = 0; i < count; ++i) {
        tjscalingfactor const factor = factors[i];
        PixelSize const size{TJSCALED(own.width, factor), TJSCALED(own.height, factor)};
        bool const isEnough = size.width >= std::min(wanted.width, own.width) &&
                              size.height >= std::min(wanted.height, own.height);
        if (isEnough && size.width <= best.width && size.height <= best.height) best = size;
    }
    return best;
}

// Converts CMYK without a profile. Files with Adobe's marker contain inverted values (255 is no ink).
void ConvertCmyk(PixelBuffer const& image, bool isInverted) {
    unsigned const flip = isInverted ? 0 : 255;
    unsigned char* pixel = image.pixels.get();
    for (unsigned char* const end = pixel + image.GetCount() * 4; pixel != end; pixel += 4) {
        unsigned const light = pixel[3] ^ flip;
        for (int i = 0; i < 3; ++i)
            pixel[i] = static_cast<unsigned char>(((pixel[i] ^ flip) * light + 127) / 255);
        pixel[3] = 255;
    }
}

// Sets reason if the file's profile is ignored.
void ConvertColors(Header const& header, Markers const& markers, PixelBuffer const& image,
                   std::string& reason) {
    bool const isCmyk = header.IsCmyk();
    PixelKind const inks = markers.hasAdobe ? PixelKind::CmykLight : PixelKind::CmykInk;
    PixelKind const light = header.colourSpace == TJCS_GRAY ? PixelKind::Grey : PixelKind::Rgb;
    ColorTransform colors;
    if (!markers.profileParts.empty()) {
        std::vector<unsigned char> const profile = JoinProfile(markers);
        colors.Open({profile.data(), profile.size()}, isCmyk ? inks : light, reason);
    }
    if (colors)
        colors.Apply(image.pixels.get(), image.GetCount());
    else if (isCmyk)
        ConvertCmyk(image, markers.hasAdobe);
}

bool Decode(ImageSource& source, PixelSize target, PixelBuffer& image, std::string& reason) {
    ByteSpan file;
    if (!source.Prefix(source.GetSize(), file, reason)) return false;
    Handle const handle(tjInitDecompress());
    Header header;
    if (!ReadHeader(handle, file, header, reason)) return false;
    PixelSize const own{header.width, header.height};
    if (!CheckSize(own.width, own.height, reason)) return false;
    Markers const markers = FindMarkers(file);
    if (!markers.hasEnd) return Refuse(reason, "the file is truncated");

    PixelSize const wanted = ChooseSize(target, own);
    if (!image.Allocate(ChooseDecodedSize(own, wanted), reason)) return false;
    int const result =
        tjDecompress2(handle.Get(), file.data, file.size, image.pixels.get(), image.size.width,
                      static_cast<int>(image.GetStride()), image.size.height,
                      header.IsCmyk() ? TJPF_CMYK : TJPF_RGBA, TJFLAG_ACCURATEDCT | TJFLAG_LIMITSCANS);
    if (!handle.IsHarmless(result)) return Refuse(reason, handle.GetText());
    ConvertColors(header, markers, image, reason);
    return ScaleImage(image, wanted, reason);
}

struct TurboDeleter {
    void operator()(unsigned char* memory) const { tjFree(memory); }
};

bool Compress(unsigned char const* pixels, PixelSize size, std::size_t stride, int format, int quality,
              AtomicFile& file, std::string& reason) {
    Handle const handle(tjInitCompress());
    if (!handle) return Refuse(reason, "not enough memory to encode it");
    unsigned char* encoded = nullptr;
    unsigned long count = 0;
    int const result = tjCompress2(
        handle.Get(), pixels, size.width, static_cast<int>(stride), size.height, format, &encoded, &count,
        quality >= kFullColourQuality ? TJSAMP_444 : TJSAMP_420, quality, TJFLAG_ACCURATEDCT);
    std::unique_ptr<unsigned char, TurboDeleter> const owner(encoded);
    if (result != 0) return Refuse(reason, handle.GetText());
    return file.Write(encoded, count);
}

bool Encode(PixelView const& view, int quality, AtomicFile& file, std::string& reason) {
    if (view.IsOpaque())
        return Compress(view.pixels, view.size, view.stride, TJPF_RGBX, quality, file, reason);
    std::size_t const stride = view.GetWidth() * 3;
    std::unique_ptr<unsigned char[]> const flat(
        new (std::nothrow) unsigned char[stride * static_cast<std::size_t>(view.size.height)]);
    if (!flat) return Refuse(reason, "not enough memory to flatten it on white");
    for (int y = 0; y < view.size.height; ++y) {
        FlattenOnWhite(view.Row(y), flat.get() + stride * static_cast<std::size_t>(y), view.GetWidth());
    }
    return Compress(flat.get(), view.size, stride, TJPF_RGB, quality, file, reason);
}

} // namespace

extern ImageCodec const kJpegCodec{ImageFormat::Jpeg, Matches, ReadInfo, Decode, Encode};

} // namespace Moka::detail
