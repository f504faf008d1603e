#include "moka/base/String.h"
#include "tests/support/Allocation.h"
#include "tests/unit/codec/CodecTestSupport.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>
#include <zlib.h>

namespace Moka::Testing {
namespace {

using ::testing::AllOf;
using ::testing::Each;
using ::testing::ElementsAre;
using ::testing::EndsWith;
using ::testing::HasSubstr;
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
    Picture const image = MakeTranslucentNoise(7, 5);
    for (Kind const& kind : kKinds) {
        Bytes const file = Encode(image, kind.extension, kind.quality);
        for (std::size_t i = 0; i < file.size(); ++i) {
            ASSERT_TRUE(Refuses(Bytes(file.begin(), file.begin() + static_cast<std::ptrdiff_t>(i))))
                << kind.extension << " cut to " << i;
            bool const isHeader = i < kind.checkedHeader;
            for (unsigned flip = 1; flip < 256; flip += isHeader ? 1 : 127) {
                SCOPED_TRACE(testing::Message() << kind.extension << " byte " << i << " xor " << flip);
                Bytes changed = file;
                changed[i] = static_cast<unsigned char>(changed[i] ^ flip);
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
    Bytes file = Encode(MakeOpaqueNoise(4, 4), "png");
    auto const store = [&file](std::size_t at, std::uint32_t value) {
        for (std::size_t i = 0; i < 4; ++i) file[at + i] = static_cast<unsigned char>(value >> (24 - 8 * i));
    };
    store(16, width);
    store(20, height);
    store(29, static_cast<std::uint32_t>(crc32(0, &file[12], 17)));
    return file;
}

// An extended header, whose flags and two sides, less one, follow.
Bytes MakeWebpHeader(Bytes const& rest) {
    Bytes const file{'R', 'I', 'F', 'F', 22, 0, 0, 0, 'W', 'E', 'B', 'P', 'V', 'P', '8', 'X', 10, 0, 0, 0};
    return Insert(file, file.size(), rest);
}

TEST_F(Malformed, ClaimsOutsideTheLimitsAreRefusedBeforeAnythingIsAllocated) {
    Bytes const jpeg = Encode(MakeOpaqueNoise(8, 8), "jpg", 80);
    std::size_t const frame = Find(jpeg, {0xFF, 0xC0});
    struct {
        Bytes file;
        char const* reason;
    } const cases[] = {
        {MakePngHeader(65536, 1), "above 65535"},
        {MakePngHeader(0x7FFFFFFF, 0x7FFFFFFF), "above 65535"},
        {MakePngHeader(65535, 65535), "1 GiB"},
        {MakePngHeader(0xFFFFFFFF, 1), "out of range"},
        {Replace(jpeg, frame + 5, {0xFF, 0xFF, 0xFF, 0xFF}), "65500"},
        {Replace(jpeg, frame + 5, {0xFF, 0x00, 0xFF, 0x00}), "1 GiB"},
        {Replace(jpeg, frame + 5, {0, 0, 0, 8}), "'****'"},
        {MakeWebpHeader({0, 0, 0, 0, 255, 255, 255, 0, 0, 0}), "above 65535"},
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
    EXPECT_TRUE(Refuses(Replace(jpeg, frame + 5, {0x20, 0x00, 0x20, 0x00})));
}

TEST_F(Malformed, WhatIsNoImageFileIsRefusedByEveryReader) {
    TempFolder const folder;
    WriteBytes(folder.Path("empty.png"), {});
    WriteBytes(folder.Path("text.png"), {'h', 'e', 'l', 'l', 'o'});
    ASSERT_EQ(mkfifo(folder.Path("pipe.png").c_str(), 0600), 0);
    WriteBytes(folder.Path("large.png"), Encode(MakeOpaqueNoise(4, 4), "png"));
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

} // namespace
} // namespace Moka::Testing
