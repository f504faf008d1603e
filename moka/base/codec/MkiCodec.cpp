// MkiCodec.cpp: the "mki" format: a header of 32 bytes, then the pixels as they are in memory, uncompressed
// or as one Zstandard frame. It is designed for fast loading. docs/mki-format.md describes it.
#include "moka/base/codec/ImageCodec.h"

#include <cstring>
#include <zlib.h>
#include <zstd.h>

namespace Moka::detail {
namespace {

constexpr std::size_t kHeaderBytes = 32;
constexpr std::size_t kCheckedBytes = 24; // covered by the header's checksum
constexpr unsigned char kMagic[4] = {'M', 'K', 'I', '1'};
constexpr std::uint64_t kFormatRgba8 = 1;
constexpr std::uint64_t kStored = 0;
constexpr std::uint64_t kZstandard = 1;
// The longest header of a Zstandard frame, and the position and value of its content checksum flag.
constexpr std::size_t kFrameHeaderBytes = 18;
constexpr std::size_t kFrameDescriptor = 4;
constexpr unsigned kFrameChecksumFlag = 1u << 2;
// The Zstandard level that is as fast as the disk. Higher levels take much more time and save little.
constexpr int kLevel = 1;

struct Header {
    std::uint64_t width = 0;
    std::uint64_t height = 0;
    std::uint64_t format = 0;
    std::uint64_t compression = 0;
    std::uint64_t payloadBytes = 0;

    std::uint64_t GetPixelBytes() const { return width * height * 4; }
    PixelSize GetSize() const { return {static_cast<int>(width), static_cast<int>(height)}; }
};

std::uint64_t Load(unsigned char const* from, int bytes) {
    std::uint64_t value = 0;
    for (int i = 0; i < bytes; ++i) value |= std::uint64_t{from[i]} << (8 * i);
    return value;
}

void Store(unsigned char* to, int bytes, std::uint64_t value) {
    for (int i = 0; i < bytes; ++i) to[i] = static_cast<unsigned char>(value >> (8 * i));
}

std::uint64_t HeaderChecksum(unsigned char const* header) { return crc32(0, header, kCheckedBytes); }

void StoreHeader(Header const& header, unsigned char* to) {
    std::memcpy(to, kMagic, sizeof(kMagic));
    Store(to + 4, 4, header.width);
    Store(to + 8, 4, header.height);
    Store(to + 12, 2, header.format);
    Store(to + 14, 2, header.compression);
    Store(to + 16, 8, header.payloadBytes);
    Store(to + 24, 4, HeaderChecksum(to));
    Store(to + 28, 4, 0);
}

bool Matches(ByteSpan head) { return head.size >= 4 && std::memcmp(head.data, kMagic, sizeof(kMagic)) == 0; }

bool Refuse(std::string& reason, char const* text) {
    reason = text;
    return false;
}

bool LoadHeader(ImageSource& source, Header& header, std::string& reason) {
    ByteSpan head;
    if (!source.Prefix(kHeaderBytes, head, reason)) return false;
    if (head.size < kHeaderBytes) return Refuse(reason, "the file is truncated");
    unsigned char const* const bytes = head.data;
    if (Load(bytes + 24, 4) != HeaderChecksum(bytes)) return Refuse(reason, "the header's checksum is wrong");
    if (Load(bytes + 28, 4) != 0) return Refuse(reason, "the header's last four bytes are not zero");
    header = {Load(bytes + 4, 4), Load(bytes + 8, 4), Load(bytes + 12, 2), Load(bytes + 14, 2),
              Load(bytes + 16, 8)};
    if (header.format != kFormatRgba8) {
        reason = "unknown pixel format " + std::to_string(header.format);
    } else if (header.compression != kStored && header.compression != kZstandard) {
        reason = "unknown compression " + std::to_string(header.compression);
    } else if (source.GetSize() - kHeaderBytes < header.payloadBytes) {
        reason = "the file is truncated";
    } else if (source.GetSize() - kHeaderBytes > header.payloadBytes) {
        reason = "the file is longer than its header says";
    } else {
        return CheckSize(static_cast<std::int64_t>(header.width), static_cast<std::int64_t>(header.height),
                         reason);
    }
    return false;
}

bool ReadInfo(ImageSource& source, ImageInfo& info, std::string& reason) {
    Header header;
    if (!LoadHeader(source, header, reason)) return false;
    info.width = header.GetSize().width;
    info.height = header.GetSize().height;
    info.hasAlpha = true;
    return true;
}

// Reads the payload's pixels in pieces of any size.
class PayloadReader {
public:
    explicit PayloadReader(ImageSource& source) : mSource(source) {}

    bool Open(Header const& header, std::string& reason) {
        unsigned char skipped[kHeaderBytes];
        if (mSource.Read(skipped, kHeaderBytes) < kHeaderBytes) return Stop(reason);
        if (header.compression == kStored) {
            return header.payloadBytes == header.GetPixelBytes() ||
                   Refuse(reason, "the payload's length does not fit the size");
        }
        if (!CheckFrame(header, reason)) return false;
        mContext.reset(ZSTD_createDCtx());
        return mContext || Refuse(reason, "not enough memory to decompress it");
    }

    bool Read(unsigned char* to, std::size_t count, std::string& reason) {
        if (!mContext) return mSource.Read(to, count) == count || Stop(reason);
        ZSTD_outBuffer out{to, count, 0};
        while (out.pos < out.size) {
            if (mEnded) return Refuse(reason, "the payload has too few pixels");
            if (!Step(out, reason)) return false;
        }
        return true;
    }

    // Checks the content checksum, which follows the last pixel.
    bool Finish(std::string& reason) {
        if (!mContext) return true;
        unsigned char nothing = 0;
        ZSTD_outBuffer out{&nothing, 0, 0};
        while (!mEnded) {
            if (!Step(out, reason)) return false;
        }
        bool const isAllUsed = mInput.pos == mInput.size && mSource.NextBlock().size == 0;
        return isAllUsed || Refuse(reason, "the payload has bytes behind its end");
    }

private:
    struct ContextDeleter {
        void operator()(ZSTD_DCtx* context) const { ZSTD_freeDCtx(context); }
    };

    bool CheckFrame(Header const& header, std::string& reason) {
        ByteSpan head;
        if (!mSource.Prefix(kHeaderBytes + kFrameHeaderBytes, head, reason)) return false;
        ByteSpan const frame{head.data + kHeaderBytes, head.size - kHeaderBytes};
        std::uint64_t const content = ZSTD_getFrameContentSize(frame.data, frame.size);
        if (content == ZSTD_CONTENTSIZE_ERROR) return Refuse(reason, "the payload is no Zstandard frame");
        if (content != header.GetPixelBytes()) {
            return Refuse(reason, "the payload's content does not fit the size");
        }
        return (frame.data[kFrameDescriptor] & kFrameChecksumFlag) != 0 ||
               Refuse(reason, "the payload has no checksum");
    }

    bool Step(ZSTD_outBuffer& out, std::string& reason) {
        if (mInput.pos == mInput.size) {
            ByteSpan const block = mSource.NextBlock();
            if (block.size == 0) return Stop(reason);
            mInput = {block.data, block.size, 0};
        }
        std::size_t const result = ZSTD_decompressStream(mContext.get(), &out, &mInput);
        if (ZSTD_isError(result)) {
            reason = std::string("the payload is damaged: ") + ZSTD_getErrorName(result);
            return false;
        }
        mEnded = result == 0;
        return true;
    }

    bool Stop(std::string& reason) {
        reason = mSource.GetEndReason();
        return false;
    }

    ImageSource& mSource;
    std::unique_ptr<ZSTD_DCtx, ContextDeleter> mContext;
    ZSTD_inBuffer mInput{nullptr, 0, 0};
    bool mEnded = false;
};

bool ReadScaled(PayloadReader& reader, PixelSize own, PixelBuffer& image, std::string& reason) {
    PixelBuffer row;
    RowScaler scaler(own, image.size, image.pixels.get());
    if (!scaler.IsReady()) return Refuse(reason, "not enough memory to scale it");
    if (!row.Allocate({own.width, 1}, reason)) return false;
    for (int y = 0; y < own.height; ++y) {
        if (!reader.Read(row.Row(0), row.GetStride(), reason)) return false;
        scaler.Push(row.Row(0));
    }
    return true;
}

bool Decode(ImageSource& source, PixelSize target, PixelBuffer& image, std::string& reason) {
    Header header;
    if (!LoadHeader(source, header, reason)) return false;
    PixelSize const own = header.GetSize();
    PayloadReader reader(source);
    if (!reader.Open(header, reason) || !image.Allocate(ChooseSize(target, own), reason)) return false;
    bool const isRead = image.size == own ? reader.Read(image.Row(0), image.GetCount() * 4, reason)
                                          : ReadScaled(reader, own, image, reason);
    return isRead && reader.Finish(reason);
}

struct CompressorDeleter {
    void operator()(ZSTD_CCtx* context) const { ZSTD_freeCCtx(context); }
};
using Compressor = std::unique_ptr<ZSTD_CCtx, CompressorDeleter>;

// Compresses pixels to the file. If they are the last ones, also ends the frame.
bool Compress(ZSTD_CCtx* context, ByteSpan pixels, bool isLast, AtomicFile& file, std::string& reason) {
    unsigned char block[16 * 1024];
    ZSTD_inBuffer in{pixels.data, pixels.size, 0};
    for (;;) {
        ZSTD_outBuffer out{block, sizeof(block), 0};
        std::size_t const left =
            ZSTD_compressStream2(context, &out, &in, isLast ? ZSTD_e_end : ZSTD_e_continue);
        if (ZSTD_isError(left)) {
            reason = std::string("cannot compress it: ") + ZSTD_getErrorName(left);
            return false;
        }
        if (!file.Write(block, out.pos)) return false;
        if (isLast ? left == 0 : in.pos == in.size) return true;
    }
}

bool Encode(PixelView const& view, int, AtomicFile& file, std::string& reason) {
    Header header{static_cast<std::uint64_t>(view.size.width), static_cast<std::uint64_t>(view.size.height),
                  kFormatRgba8, kZstandard, 0};
    Compressor const context(ZSTD_createCCtx());
    if (!context) return Refuse(reason, "not enough memory to compress it");
    ZSTD_CCtx_setParameter(context.get(), ZSTD_c_compressionLevel, kLevel);
    ZSTD_CCtx_setParameter(context.get(), ZSTD_c_checksumFlag, 1);
    ZSTD_CCtx_setPledgedSrcSize(context.get(), header.GetPixelBytes());

    // The header contains the payload's length, so it is written last.
    unsigned char bytes[kHeaderBytes] = {};
    if (!file.Write(bytes, kHeaderBytes)) return false;
    for (int y = 0; y < view.size.height; ++y) {
        bool const isLast = y == view.size.height - 1;
        if (!Compress(context.get(), {view.Row(y), view.GetWidth() * 4}, isLast, file, reason)) return false;
    }
    header.payloadBytes = file.GetBytesWritten() - kHeaderBytes;
    StoreHeader(header, bytes);
    return file.WriteStart(bytes, kHeaderBytes);
}

} // namespace

extern ImageCodec const kMkiCodec{ImageFormat::Mki, Matches, ReadInfo, Decode, Encode};

} // namespace Moka::detail
