// PngCodec.cpp: PNG with libpng, row by row. Every colour type, depth and interlacing becomes RGBA8; 16-bit
// channels are rounded.
// Colours: in order of priority, an ICC profile, the sRGB chunk, primaries with gamma, and gamma alone, which
// libpng
//          corrects. Gamma 0.45455 is close enough to sRGB to change nothing.
#include "moka/base/codec/ColorTransform.h"
#include "moka/base/codec/Exif.h"
#include "moka/base/codec/ImageCodec.h"
#include "moka/base/codec/Premultiply.h"

#include <cmath>
#include <csetjmp>
#include <cstdio>
#include <cstring>
#include <new>
#include <png.h>

namespace Moka::detail {
namespace {

// Measured (bench/codec) against libpng's defaults, level 6 and a filter chosen for each row: an ink page
// takes a third of the time and a fifth more bytes, a photo a fifth of the time and 3 % more bytes. At this
// level, choosing a filter for each row is not worth its time, for either.
constexpr int kCompressionLevel = 3;
constexpr int kFilter = PNG_FILTER_SUB;
// The only chunks that are read besides pixels: those that define colours.
constexpr png_byte kColorChunks[] = "gAMA\0cHRM\0sRGB\0iCCP";
constexpr int kColorChunkCount = 4;
// Chunks that are read for GetImageInfo only.
constexpr png_byte kExifChunk[] = "eXIf";
constexpr png_byte kAnimationChunk[] = "acTL";
// One IDAT chunk, and one write, per this many bytes.
constexpr std::size_t kChunkBytes = 65536;

// libpng reports errors by longjmp, which runs no destructors. So functions that call setjmp have only plain
// local variables; their callers own all memory.
struct ErrorText {
    char text[160] = "";
    char profile[160] = ""; // why libpng refuses the colour profile
};

void OnError(png_structp png, png_const_charp message) {
    auto* const error = static_cast<ErrorText*>(png_get_error_ptr(png));
    std::snprintf(error->text, sizeof(error->text), "%s", message);
    png_longjmp(png, 1);
}

// Ignores libpng's warnings, because it continues after them, except that it has refused a colour profile.
void OnWarning(png_structp png, png_const_charp message) {
    constexpr char kProfile[] = "iCCP: ";
    constexpr std::size_t kLength = sizeof(kProfile) - 1;
    auto* const error = static_cast<ErrorText*>(png_get_error_ptr(png));
    if (std::strncmp(message, kProfile, kLength) == 0)
        std::snprintf(error->profile, sizeof(error->profile), "%s", message + kLength);
}

// --- reading

struct Reader {
    Reader() = default;
    Reader(Reader const&) = delete;
    Reader& operator=(Reader const&) = delete;
    ~Reader() { png_destroy_read_struct(&png, &info, nullptr); }

    ErrorText error;
    png_structp png = nullptr;
    png_infop info = nullptr;
    ImageSource* source = nullptr;
    bool isAtEnd = false;
    int passes = 1;
    ColorTransform colors;
    png_fixed_point gamma = 0; // for libpng to correct, times 100,000; 0 is none

    PixelSize GetSize() const {
        return {static_cast<int>(png_get_image_width(png, info)),
                static_cast<int>(png_get_image_height(png, info))};
    }

    bool Explain(std::string& reason) const {
        reason = isAtEnd ? source->GetEndReason() : error.text;
        return false;
    }
};

void OnRead(png_structp png, png_bytep to, std::size_t count) {
    auto* const reader = static_cast<Reader*>(png_get_io_ptr(png));
    if (reader->source->Read(to, count) == count) return;
    reader->isAtEnd = true;
    png_error(png, "");
}

enum class Purpose { Pixels, Info };

bool OpenReader(Reader& reader, ImageSource& source, Purpose purpose) {
    reader.source = &source;
    std::strcpy(reader.error.text, "not enough memory to decode it");
    reader.png = png_create_read_struct(PNG_LIBPNG_VER_STRING, &reader.error, OnError, OnWarning);
    if (!reader.png) return false;
    if (setjmp(png_jmpbuf(reader.png))) return false;
    reader.info = png_create_info_struct(reader.png);
    if (!reader.info) return false;
    png_set_read_fn(reader.png, &reader, OnRead);
    // A negative count skips all other ancillary chunks without reading or inflating them, so they take no
    // memory. The limit on the length of chunks must only be large enough for real files.
    png_set_keep_unknown_chunks(reader.png, PNG_HANDLE_CHUNK_NEVER, nullptr, -1);
    png_set_keep_unknown_chunks(reader.png, PNG_HANDLE_CHUNK_AS_DEFAULT, kColorChunks, kColorChunkCount);
    if (purpose == Purpose::Info) {
        png_set_keep_unknown_chunks(reader.png, PNG_HANDLE_CHUNK_AS_DEFAULT, kExifChunk, 1);
        png_set_keep_unknown_chunks(reader.png, PNG_HANDLE_CHUNK_ALWAYS, kAnimationChunk, 1);
    }
    png_set_chunk_malloc_max(reader.png, 64 << 20);
    // The caller checks the size afterwards, with a message that contains it. Nothing depends on it before.
    png_set_user_limits(reader.png, PNG_UINT_31_MAX, PNG_UINT_31_MAX);
    png_read_info(reader.png, reader.info);
    return true;
}

bool ReadHeader(Reader& reader, ImageSource& source, Purpose purpose, std::string& reason) {
    if (!OpenReader(reader, source, purpose)) return reader.Explain(reason);
    return CheckSize(png_get_image_width(reader.png, reader.info),
                     png_get_image_height(reader.png, reader.info), reason);
}

// Uses the file's ICC profile. Returns false if there is none or it cannot be used.
bool UseProfile(Reader& reader, std::string& reason) {
    png_charp name = nullptr;
    int compression = 0;
    png_bytep data = nullptr;
    png_uint_32 size = 0;
    if (png_get_iCCP(reader.png, reader.info, &name, &compression, &data, &size) != PNG_INFO_iCCP) {
        reason = reader.error.profile;
        return false;
    }
    bool const isGrey = (png_get_color_type(reader.png, reader.info) & PNG_COLOR_MASK_COLOR) == 0;
    return reader.colors.Open({data, size}, isGrey ? PixelKind::Grey : PixelKind::Rgb, reason);
}

bool IsMarkedSrgb(Reader const& reader) {
    int intent = 0;
    return png_get_sRGB(reader.png, reader.info, &intent) == PNG_INFO_sRGB;
}

bool GetPrimaries(Reader const& reader, Chromaticities& p) {
    return png_get_cHRM(reader.png, reader.info, &p.white[0], &p.white[1], &p.red[0], &p.red[1], &p.green[0],
                        &p.green[1], &p.blue[0], &p.blue[1]) == PNG_INFO_cHRM;
}

bool AreOfSrgb(Chromaticities const& p) {
    constexpr Chromaticities kSrgb = {{0.3127, 0.329}, {0.64, 0.33}, {0.3, 0.6}, {0.15, 0.06}};
    constexpr double kNear = 0.002;
    auto const isNear = [](double const(&a)[2], double const(&b)[2]) {
        return std::abs(a[0] - b[0]) < kNear && std::abs(a[1] - b[1]) < kNear;
    };
    return isNear(p.white, kSrgb.white) && isNear(p.red, kSrgb.red) && isNear(p.green, kSrgb.green) &&
           isNear(p.blue, kSrgb.blue);
}

// Sets reason if a profile is ignored.
void ChooseColors(Reader& reader, std::string& reason) {
    if (UseProfile(reader, reason) || IsMarkedSrgb(reader)) return;
    png_fixed_point gamma = 0;
    bool const hasGamma = png_get_gAMA_fixed(reader.png, reader.info, &gamma) == PNG_INFO_gAMA;
    Chromaticities primaries;
    if (GetPrimaries(reader, primaries) && !AreOfSrgb(primaries)) {
        if (reader.colors.Open(primaries, hasGamma ? gamma / 100000.0 : 0, reason)) return;
    }
    if (hasGamma) reader.gamma = gamma;
}

std::string DescribeColors(Reader const& reader) {
    png_charp name = nullptr;
    int compression = 0;
    png_bytep data = nullptr;
    png_uint_32 size = 0;
    if (png_get_iCCP(reader.png, reader.info, &name, &compression, &data, &size) == PNG_INFO_iCCP)
        return GetProfileName({data, size});
    if (reader.error.profile[0] != '\0') return "damaged";
    if (IsMarkedSrgb(reader)) return "sRGB";
    double gamma = 0;
    Chromaticities primaries;
    bool const hasPrimaries = GetPrimaries(reader, primaries) && !AreOfSrgb(primaries);
    if (png_get_gAMA(reader.png, reader.info, &gamma) != PNG_INFO_gAMA)
        return hasPrimaries ? "own primaries" : "";
    char text[40];
    std::snprintf(text, sizeof(text), "gamma %.5g%s", gamma, hasPrimaries ? ", own primaries" : "");
    return text;
}

bool HasAlpha(Reader const& reader) {
    return (png_get_color_type(reader.png, reader.info) & PNG_COLOR_MASK_ALPHA) != 0 ||
           png_get_valid(reader.png, reader.info, PNG_INFO_tRNS) != 0;
}

bool StartPixels(Reader& reader) {
    if (setjmp(png_jmpbuf(reader.png))) return false;
    png_set_expand(reader.png);
    png_set_scale_16(reader.png);
    png_set_gray_to_rgb(reader.png);
    png_set_add_alpha(reader.png, 255, PNG_FILLER_AFTER);
    if (reader.gamma > 0) png_set_gamma_fixed(reader.png, PNG_DEFAULT_sRGB, reader.gamma);
    reader.passes = png_set_interlace_handling(reader.png);
    png_read_update_info(reader.png, reader.info);
    return true;
}

void FinishRow(Reader const& reader, unsigned char* row, std::size_t count) {
    if (reader.colors) reader.colors.Apply(row, count);
    PremultiplyPixels(row, count);
}

// An interlaced image has several passes over the same rows. The last pass completes each row.
bool ReadRows(Reader& reader, PixelBuffer const& image) {
    if (setjmp(png_jmpbuf(reader.png))) return false;
    for (int pass = 1; pass <= reader.passes; ++pass) {
        for (int y = 0; y < image.size.height; ++y) {
            png_read_row(reader.png, image.Row(y), nullptr);
            if (pass == reader.passes)
                FinishRow(reader, image.Row(y), static_cast<std::size_t>(image.size.width));
        }
    }
    png_read_end(reader.png, nullptr);
    return true;
}

bool ReadRowsInto(Reader& reader, RowScaler& scaler, PixelBuffer const& row, int height) {
    if (setjmp(png_jmpbuf(reader.png))) return false;
    for (int y = 0; y < height; ++y) {
        png_read_row(reader.png, row.Row(0), nullptr);
        FinishRow(reader, row.Row(0), row.GetCount());
        scaler.Push(row.Row(0));
    }
    png_read_end(reader.png, nullptr);
    return true;
}

bool DecodeScaled(Reader& reader, PixelSize own, PixelBuffer& image, std::string& reason) {
    PixelBuffer row;
    if (!row.Allocate({own.width, 1}, reason)) return false;
    RowScaler scaler(own, image.size, image.pixels.get());
    if (!scaler.IsReady()) {
        reason = "not enough memory to scale it";
        return false;
    }
    return ReadRowsInto(reader, scaler, row, own.height) || reader.Explain(reason);
}

bool Decode(ImageSource& source, PixelSize target, PixelBuffer& image, std::string& reason) {
    Reader reader;
    if (!ReadHeader(reader, source, Purpose::Pixels, reason)) return false;
    ChooseColors(reader, reason);
    if (!StartPixels(reader)) return reader.Explain(reason);
    PixelSize const own = reader.GetSize();
    PixelSize const wanted = ChooseSize(target, own);
    if (wanted != own && reader.passes == 1) {
        return image.Allocate(wanted, reason) && DecodeScaled(reader, own, image, reason);
    }
    if (!image.Allocate(own, reason)) return false;
    if (!ReadRows(reader, image)) return reader.Explain(reason);
    return ScaleImage(image, wanted, reason);
}

int GetOrientation(Reader const& reader) {
    png_uint_32 size = 0;
    png_bytep data = nullptr;
    bool const hasExif = png_get_eXIf_1(reader.png, reader.info, &size, &data) == PNG_INFO_eXIf;
    return hasExif ? ReadOrientation({data, size}) : 1;
}

// Returns the number of frames from the animation control chunk, whose first number it is.
int CountFrames(Reader const& reader) {
    png_unknown_chunkp chunks = nullptr;
    int const count = png_get_unknown_chunks(reader.png, reader.info, &chunks);
    for (png_unknown_chunkp chunk = chunks; chunk != chunks + count; ++chunk) {
        if (chunk->size < 4) continue;
        png_uint_32 const frames = png_get_uint_32(chunk->data);
        if (frames >= 1 && frames <= PNG_UINT_31_MAX) return static_cast<int>(frames);
    }
    return 1;
}

bool ReadInfo(ImageSource& source, ImageInfo& info, std::string& reason) {
    Reader reader;
    if (!ReadHeader(reader, source, Purpose::Info, reason)) return false;
    info.width = reader.GetSize().width;
    info.height = reader.GetSize().height;
    info.hasAlpha = HasAlpha(reader);
    info.profile = DescribeColors(reader);
    info.orientation = GetOrientation(reader);
    info.frames = CountFrames(reader);
    return true;
}

bool Matches(ByteSpan head) { return head.size >= 8 && png_sig_cmp(head.data, 0, 8) == 0; }

// --- writing

struct Writer {
    Writer() = default;
    Writer(Writer const&) = delete;
    Writer& operator=(Writer const&) = delete;
    ~Writer() { png_destroy_write_struct(&png, &info); }

    ErrorText error;
    png_structp png = nullptr;
    png_infop info = nullptr;
    AtomicFile* file = nullptr;
};

void OnWrite(png_structp png, png_bytep data, std::size_t count) {
    // AtomicFile has the reason, so the message is empty.
    if (!static_cast<Writer*>(png_get_io_ptr(png))->file->Write(data, count)) png_error(png, "");
}

void OnFlush(png_structp) {}

bool OpenWriter(Writer& writer, AtomicFile& file) {
    writer.file = &file;
    std::strcpy(writer.error.text, "not enough memory to encode it");
    writer.png = png_create_write_struct(PNG_LIBPNG_VER_STRING, &writer.error, OnError, OnWarning);
    if (!writer.png) return false;
    if (setjmp(png_jmpbuf(writer.png))) return false;
    writer.info = png_create_info_struct(writer.png);
    if (!writer.info) return false;
    png_set_write_fn(writer.png, &writer, OnWrite, OnFlush);
    png_set_compression_buffer_size(writer.png, kChunkBytes);
    png_set_compression_level(writer.png, kCompressionLevel);
    png_set_filter(writer.png, PNG_FILTER_TYPE_BASE, kFilter);
    return true;
}

bool WriteRows(Writer& writer, PixelView const& view, bool isOpaque, unsigned char* row) {
    if (setjmp(png_jmpbuf(writer.png))) return false;
    png_set_IHDR(writer.png, writer.info, static_cast<png_uint_32>(view.size.width),
                 static_cast<png_uint_32>(view.size.height), 8,
                 isOpaque ? PNG_COLOR_TYPE_RGB : PNG_COLOR_TYPE_RGBA, PNG_INTERLACE_NONE,
                 PNG_COMPRESSION_TYPE_DEFAULT, PNG_FILTER_TYPE_DEFAULT);
    png_set_sRGB(writer.png, writer.info, PNG_sRGB_INTENT_PERCEPTUAL);
    png_write_info(writer.png, writer.info);
    if (isOpaque) png_set_filler(writer.png, 0, PNG_FILLER_AFTER);
    for (int y = 0; y < view.size.height; ++y) {
        UnpremultiplyPixels(view.Row(y), row, view.GetWidth());
        png_write_row(writer.png, row);
    }
    png_write_end(writer.png, nullptr);
    return true;
}

bool Encode(PixelView const& view, int, AtomicFile& file, std::string& reason) {
    Writer writer;
    PixelBuffer row;
    if (!row.Allocate({view.size.width, 1}, reason)) return false;
    // An opaque image is saved without alpha: the file is smaller, and its header says that it has no alpha.
    if (OpenWriter(writer, file) && WriteRows(writer, view, view.IsOpaque(), row.Row(0))) return true;
    reason = writer.error.text;
    return false;
}

} // namespace

extern ImageCodec const kPngCodec{ImageFormat::Png, Matches, ReadInfo, Decode, Encode};

} // namespace Moka::detail
