#include "tests/unit/codec/CodecTestSupport.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <zlib.h>
#include <zstd.h>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;

void Append(Bytes& bytes, std::uint64_t value, int count) {
    for (int i = 0; i < count; ++i) bytes.push_back(static_cast<unsigned char>(value >> (8 * i)));
}

struct Fields {
    std::uint64_t width = 3;
    std::uint64_t height = 2;
    std::uint64_t format = 1;
    std::uint64_t compression = 1;
    std::int64_t payloadError = 0; // added to the payload's true length
    std::uint64_t zeros = 0;
};

Bytes MakeMki(Fields const& fields, Bytes const& payload) {
    Bytes bytes = {'M', 'K', 'I', '1'};
    Append(bytes, fields.width, 4);
    Append(bytes, fields.height, 4);
    Append(bytes, fields.format, 2);
    Append(bytes, fields.compression, 2);
    Append(bytes, payload.size() + static_cast<std::uint64_t>(fields.payloadError), 8);
    Append(bytes, crc32(0, bytes.data(), 24), 4);
    Append(bytes, fields.zeros, 4);
    bytes.insert(bytes.end(), payload.begin(), payload.end());
    return bytes;
}

Bytes Compress(Bytes const& content, int level = 1, bool hasChecksum = true, bool hasSize = true) {
    ZSTD_CCtx* const context = ZSTD_createCCtx();
    ZSTD_CCtx_setParameter(context, ZSTD_c_compressionLevel, level);
    ZSTD_CCtx_setParameter(context, ZSTD_c_checksumFlag, hasChecksum);
    ZSTD_CCtx_setParameter(context, ZSTD_c_contentSizeFlag, hasSize);
    Bytes frame(ZSTD_compressBound(content.size()));
    frame.resize(ZSTD_compress2(context, frame.data(), frame.size(), content.data(), content.size()));
    ZSTD_freeCCtx(context);
    return frame;
}

TEST(Mki, ReadsFilesThatItDidNotWrite) {
    ErrorLines const errors;
    Picture const image = MakeTranslucentNoise(3, 2);
    for (int const level : {1, 19}) EXPECT_EQ(Decode(MakeMki({3, 2}, Compress(image.pixels, level))), image);
    EXPECT_EQ(Decode(MakeMki({3, 2, 1, 0}, image.pixels)), image) << "stored";
    Picture const invalid = Fill(1, 1, {9, 200, 0, 5});
    EXPECT_EQ(Decode(MakeMki({1, 1, 1, 0}, invalid.pixels)), invalid) << "pixels are taken as they are";
}

TEST(Mki, RefusesWhateverDoesNotAddUp) {
    Bytes const pixels = MakeTranslucentNoise(3, 2).pixels;
    Bytes const frame = Compress(pixels);
    Bytes const longer(28, 1);
    Bytes badCheck = frame;
    badCheck.back() ^= 1;
    Bytes const skippable = Insert(frame, 0, {0x50, 0x2A, 0x4D, 0x18, 4, 0, 0, 0, 1, 2, 3, 4});
    struct {
        Bytes file;
        char const* reason;
    } const cases[] = {
        {MakeMki({3, 2, 2, 1}, frame), "pixel format 2"},
        {MakeMki({3, 2, 1, 2}, frame), "compression 2"},
        {MakeMki({3, 2, 1, 1, 1}, frame), "truncated"},
        {MakeMki({3, 2, 1, 1, -1}, frame), "longer"},
        {MakeMki({3, 2, 1, 1, 0, 1}, frame), "not zero"},
        {MakeMki({0, 2}, frame), "below 1"},
        {MakeMki({3, 0}, frame), "below 1"},
        {MakeMki({0xFFFFFFFF, 0xFFFFFFFF}, frame), "65535"},
        {MakeMki({65535, 65535}, frame), "1 GiB"},
        {MakeMki({2, 2}, frame), "does not fit"},
        {MakeMki({3, 3}, frame), "does not fit"},
        {MakeMki({3, 2, 1, 0}, longer), "does not fit"},
        {MakeMki({3, 2, 1, 0}, Bytes(20, 1)), "does not fit"},
        {MakeMki({3, 2}, Compress(pixels, 1, false)), "no checksum"},
        {MakeMki({3, 2}, Compress(pixels, 1, true, false)), "does not fit"},
        {MakeMki({3, 2}, badCheck), "damaged"},
        {MakeMki({3, 2}, Insert(frame, 0, frame)), "behind its end"},
        {MakeMki({3, 2}, skippable), "does not fit"},
        {MakeMki({3, 2}, {}), "no Zstandard frame"},
        {MakeMki({3, 2}, longer), "no Zstandard frame"},
    };
    ErrorLines errors;
    for (auto const& one : cases) {
        EXPECT_TRUE(Decode(one.file).pixels.empty()) << one.reason;
        EXPECT_THAT(errors.Take(), ElementsAre(HasSubstr(one.reason)));
    }
}

} // namespace
} // namespace Moka::Testing
