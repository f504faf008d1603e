// PngCodec.cpp: PNG through libpng, row by row. Every colour type, depth and interlacing becomes RGBA8;
// 16-bit channels are rounded. Gamma, colour profiles and text are not looked at: the file's numbers are the
// pixels.
#include "moka/base/codec/ImageCodec.h"
#include "moka/base/codec/Premultiply.h"

#include <csetjmp>
#include <cstdio>
#include <cstring>
#include <new>
#include <png.h>

namespace Moka::detail {
namespace {

// Measured (bench/codec) against libpng's defaults, level 6 and a filter chosen for each row: an ink page is
// written in a third of the time with a fifth more bytes, a photo in a fifth of the time with 3 % more. At
// this level choosing filters costs more time than it saves bytes, for either.
constexpr int kCompressionLevel = 3;
constexpr int kFilter = PNG_FILTER_SUB;
// One IDAT chunk, and one write, per this many bytes.
constexpr std::size_t kChunkBytes = 65536;

// libpng reports an error by a jump that runs no destructors. So everything that owns memory lives in the
// callers of the functions that call setjmp, and those have only plain locals.
struct ErrorText {
    char text[160] = "";
};

void OnError(png_structp png, png_const_charp message) {
    auto* const error = static_cast<ErrorText*>(png_get_error_ptr(png));
    std::snprintf(error->text, sizeof(error->text), "%s", message);
    png_longjmp(png, 1);
}

// What libpng can go on from is no news to a caller who gets the pixels.
void OnWarning(png_structp, png_const_charp) {}

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

bool OpenReader(Reader& reader, ImageSource& source) {
    reader.source = &source;
    std::strcpy(reader.error.text, "not enough memory to decode it");
    reader.png = png_create_read_struct(PNG_LIBPNG_VER_STRING, &reader.error, OnError, OnWarning);
    if (!reader.png) return false;
    if (setjmp(png_jmpbuf(reader.png))) return false;
    reader.info = png_create_info_struct(reader.png);
    if (!reader.info) return false;
    png_set_read_fn(reader.png, &reader, OnRead);
    // A negative count skips, unread and not inflated, every chunk that changes no pixel. So none of them
    // costs memory, and the limit on their length only has to let through what real files carry.
    png_set_keep_unknown_chunks(reader.png, PNG_HANDLE_CHUNK_NEVER, nullptr, -1);
    png_set_chunk_malloc_max(reader.png, 64 << 20);
    // The sides are checked right after this, where the message can name them; nothing is allocated by them
    // before.
    png_set_user_limits(reader.png, PNG_UINT_31_MAX, PNG_UINT_31_MAX);
    png_read_info(reader.png, reader.info);
    return true;
}

bool ReadHeader(Reader& reader, ImageSource& source, std::string& reason) {
    if (!OpenReader(reader, source)) return reader.Explain(reason);
    return CheckSize(png_get_image_width(reader.png, reader.info),
                     png_get_image_height(reader.png, reader.info), reason);
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
    reader.passes = png_set_interlace_handling(reader.png);
    png_read_update_info(reader.png, reader.info);
    return true;
}

// An interlaced image comes in passes over the same rows; the last one completes each.
bool ReadRows(Reader& reader, PixelBuffer const& image) {
    if (setjmp(png_jmpbuf(reader.png))) return false;
    for (int pass = 1; pass <= reader.passes; ++pass) {
        for (int y = 0; y < image.size.height; ++y) {
            png_read_row(reader.png, image.Row(y), nullptr);
            if (pass == reader.passes)
                PremultiplyPixels(image.Row(y), static_cast<std::size_t>(image.size.width));
        }
    }
    png_read_end(reader.png, nullptr);
    return true;
}

bool ReadRowsInto(Reader& reader, RowScaler& scaler, PixelBuffer const& row, int height) {
    if (setjmp(png_jmpbuf(reader.png))) return false;
    for (int y = 0; y < height; ++y) {
        png_read_row(reader.png, row.Row(0), nullptr);
        PremultiplyPixels(row.Row(0), row.GetCount());
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
    if (!ReadHeader(reader, source, reason)) return false;
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

bool ReadInfo(ImageSource& source, ImageInfo& info, std::string& reason) {
    Reader reader;
    if (!ReadHeader(reader, source, reason)) return false;
    info.width = reader.GetSize().width;
    info.height = reader.GetSize().height;
    info.hasAlpha = HasAlpha(reader);
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
    // The file knows the reason, so the message stays empty.
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
    // Without alpha the file is smaller and says truly that it has none.
    if (OpenWriter(writer, file) && WriteRows(writer, view, view.IsOpaque(), row.Row(0))) return true;
    reason = writer.error.text;
    return false;
}

} // namespace

extern ImageCodec const kPngCodec{ImageFormat::Png, Matches, ReadInfo, Decode, Encode};

} // namespace Moka::detail
