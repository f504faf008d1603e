#include "tests/support/Allocation.h"
#include "tests/unit/codec/CodecTestSupport.h"

#include <sys/stat.h>
#include <unistd.h>
#include <zlib.h>
#include <zstd.h>

namespace Moka::Testing {
namespace {

using ::testing::Each;
using ::testing::EndsWith;
using ::testing::SizeIs;

struct Kind {
    char const* extension;
    int quality;
    std::size_t checkedHeader; // bytes; 0 for a format without checksums
};
constexpr Kind kKinds[] = {
    {"png", 100, 33}, {"jpg", 80, 0}, {"webp", 100, 0}, {"webp", 60, 0}, {"mki", 100, 32}};

class Malformed : public ::testing::Test {
protected:
    void SetUp() override { ::testing::internal::CaptureStderr(); }
    void TearDown() override {
        EXPECT_EQ(::testing::internal::GetCapturedStderr(), "") << "a library wrote to stderr";
    }

    // Either the file is refused with one line that masks its name, or it is an image and nothing is said.
    bool Refuses(Bytes const& file) {
        std::size_t const live = ArrayMemory::GetLive();
        bool const isNull = Decode(file, "some/folder/broken.img").pixels.empty();
        EXPECT_EQ(ArrayMemory::GetLive(), live) << "memory was kept";
        std::vector<std::string> const lines = errors.Take();
        EXPECT_EQ(lines.size(), isNull ? 1u : 0u) << ::testing::PrintToString(lines);
        for (std::string const& line : lines) EXPECT_THAT(line, HasSubstr("'****/******/******.img'"));
        return isNull;
    }

    ErrorLines errors;
};

// With checksums wrong pixels are never shown, and no header is believed that is not the one written.
TEST_F(Malformed, EveryCutIsRefusedAndEveryChangedByteToo) {
    Picture const image = MakeAlphaPattern(7, 5);
    for (Kind const& kind : kKinds) {
        Bytes const file = Encode(image, kind.extension, kind.quality);
        for (std::size_t i = 0; i < file.size(); ++i) {
            ASSERT_TRUE(Refuses(file.substr(0, i))) << kind.extension << " cut to " << i;
            bool const isHeader = i < kind.checkedHeader;
            for (unsigned flip = 1; flip < 256; flip += isHeader ? 1 : 127) {
                SCOPED_TRACE(testing::Message() << kind.extension << " byte " << i << " xor " << flip);
                Bytes changed = file;
                changed[i] = static_cast<char>(changed[i] ^ static_cast<char>(flip));
                bool const isRefused = Refuses(changed);
                ASSERT_TRUE(isRefused || !isHeader);
                if (kind.checkedHeader > 0 && !isRefused) {
                    EXPECT_EQ(Decode(changed), image);
                }
            }
        }
    }
}

Bytes MakePngHeader(std::uint32_t width, std::uint32_t height) {
    Bytes const file = Encode(MakeGradient(4, 4), "png");
    Bytes const size = ToBigEndian(width, 4) + ToBigEndian(height, 4);
    return file.substr(0, 8) + MakePngChunk("IHDR", size + file.substr(24, 5)) + file.substr(33);
}

TEST_F(Malformed, ClaimsOutsideTheLimitsAreRefusedBeforeAnythingIsAllocated) {
    Bytes const jpeg = Encode(MakeGradient(8, 8), "jpg", 80);
    auto const withSides = [&](unsigned height, unsigned width) {
        return Bytes(jpeg).replace(jpeg.find("\xFF\xC0") + 5, 4,
                                   ToBigEndian(height, 2) + ToBigEndian(width, 2));
    };
    struct {
        Bytes file;
        char const* reason;
    } const cases[] = {
        {MakePngHeader(65536, 1), "above 65535"},
        {MakePngHeader(0x7FFFFFFF, 0x7FFFFFFF), "above 65535"},
        {MakePngHeader(65535, 65535), "1 GiB"},
        {MakePngHeader(0xFFFFFFFF, 1), "out of range"},
        {withSides(0xFFFF, 0xFFFF), "65500"},
        {withSides(0xFF00, 0xFF00), "1 GiB"},
        {withSides(0, 8), "'****'"},
        {MakeWebpFile(0, 1 << 24, 1, ""), "above 65535"},
    };
    for (auto const& one : cases) {
        ArrayMemory::ResetPeak();
        std::size_t const before = ArrayMemory::GetPeak();
        EXPECT_TRUE(Decode(one.file, "huge").pixels.empty()) << one.reason;
        EXPECT_LT(ArrayMemory::GetPeak() - before, 100000u) << one.reason;
        EXPECT_THAT(errors.Take(), ElementsAre(HasSubstr(one.reason)));
    }
    // Within the limits, but there is nothing behind it.
    EXPECT_TRUE(Refuses(MakePngHeader(16384, 16384)));
    EXPECT_TRUE(Refuses(withSides(0x2000, 0x2000)));
}

TEST_F(Malformed, WhatIsNoImageFileIsRefusedByEveryReader) {
    TempFolder const folder;
    WriteFile(folder.Path("empty.png"), {});
    WriteFile(folder.Path("text.png"), "hello");
    ASSERT_EQ(mkfifo(folder.Path("pipe.png").c_str(), 0600), 0);
    WriteFile(folder.Path("large.png"), Encode(MakeGradient(4, 4), "png"));
    ASSERT_EQ(truncate(folder.Path("large.png").c_str(), off_t{1} << 31), 0); // sparse
    struct {
        std::string path;
        char const* reason;
    } const cases[] = {
        {folder.Path("empty.png"), "/*****.png': the file is empty"},
        {folder.Path("text.png"), "/****.png': it is no"},
        {folder.Path("missing.png"), "/*******.png': No such file"},
        {folder.Path("pipe.png"), "/****.png': it is not a regular file"},
        {folder.Path("large.png"), "2147483648 bytes"},
        {folder.Path("empty.png") + std::string("\0.png", 5), "zero byte"},
        {"", "no path"},
    };
    for (auto const& one : cases) {
        String const text(one.path);
        ImageInfo info;
        std::string reasons[3];
        EXPECT_EQ(BitmapFactory::CreateBitmapForGraphics(&text, &reasons[0]), nullptr);
        EXPECT_EQ(BitmapFactory::CreateBitmap(&text, 4, 4, &reasons[1]), nullptr);
        EXPECT_FALSE(BitmapFactory::GetImageInfo(&text, &info, &reasons[2]));
        EXPECT_EQ(info.format, ImageFormat::Unknown);
        std::vector<std::string> const lines = errors.Take();
        EXPECT_THAT(lines, AllOf(SizeIs(3), Each(HasSubstr(one.reason)), Each(EndsWith("': " + reasons[0]))));
        EXPECT_THAT(reasons, Each(reasons[0]));
    }
    EXPECT_EQ(BitmapFactory::CreateBitmapForGraphics(nullptr), nullptr);
    EXPECT_EQ(BitmapFactory::CreateBitmapFromMemory(nullptr, 10, nullptr), nullptr);
    EXPECT_EQ(errors.Take().size(), 2u);
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
    std::uint64_t const length = payload.size() + static_cast<std::uint64_t>(fields.payloadError);
    Bytes const header = "MKI1" + ToLittleEndian(fields.width, 4) + ToLittleEndian(fields.height, 4) +
                         ToLittleEndian(fields.format, 2) + ToLittleEndian(fields.compression, 2) +
                         ToLittleEndian(length, 8);
    uLong const checksum = crc32(0, reinterpret_cast<Bytef const*>(header.data()), 24);
    return header + ToLittleEndian(checksum, 4) + ToLittleEndian(fields.zeros, 4) + payload;
}

Bytes PixelsOf(Picture const& image) { return {image.pixels.begin(), image.pixels.end()}; }

Bytes Compress(Bytes const& content, int level = 1, bool hasChecksum = true, bool hasSize = true) {
    ZSTD_CCtx* const context = ZSTD_createCCtx();
    ZSTD_CCtx_setParameter(context, ZSTD_c_compressionLevel, level);
    ZSTD_CCtx_setParameter(context, ZSTD_c_checksumFlag, hasChecksum);
    ZSTD_CCtx_setParameter(context, ZSTD_c_contentSizeFlag, hasSize);
    Bytes frame(ZSTD_compressBound(content.size()), '\0');
    frame.resize(ZSTD_compress2(context, frame.data(), frame.size(), content.data(), content.size()));
    ZSTD_freeCCtx(context);
    return frame;
}

TEST(Mki, ReadsFilesThatItDidNotWrite) {
    ErrorLines const errors;
    Picture const image = MakeAlphaPattern(3, 2);
    for (int const level : {1, 19})
        EXPECT_EQ(Decode(MakeMki({3, 2}, Compress(PixelsOf(image), level))), image);
    EXPECT_EQ(Decode(MakeMki({3, 2, 1, 0}, PixelsOf(image))), image) << "stored";
    Picture const invalid = Fill(1, 1, {9, 200, 0, 5});
    EXPECT_EQ(Decode(MakeMki({1, 1, 1, 0}, PixelsOf(invalid))), invalid) << "pixels are taken as they are";
}

TEST(Mki, RefusesWhateverDoesNotAddUp) {
    Bytes const pixels = PixelsOf(MakeAlphaPattern(3, 2));
    Bytes const frame = Compress(pixels);
    Bytes const longer(28, '\1');
    Bytes badCheck = frame;
    ++badCheck.back();
    Bytes const skippable = ToLittleEndian(0x184D2A50, 4) + ToLittleEndian(4, 4) + "skip" + frame;
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
        {MakeMki({3, 2, 1, 0}, Bytes(20, '\1')), "does not fit"},
        {MakeMki({3, 2}, Compress(pixels, 1, false)), "no checksum"},
        {MakeMki({3, 2}, Compress(pixels, 1, true, false)), "does not fit"},
        {MakeMki({3, 2}, badCheck), "damaged"},
        {MakeMki({3, 2}, frame + frame), "behind its end"},
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
