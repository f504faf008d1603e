// What files say of their colours, and of what else they hold besides pixels.
#include "moka/base/log/AndroidLog.h"
#include "tests/support/ColorProfiles.h"
#include "tests/unit/codec/CodecTestSupport.h"

#include <cmath>
#include <functional>
#include <memory>
#include <turbojpeg.h>

namespace Moka::Testing {
namespace {

Bytes MakeNumbers(char const* type, std::vector<double> const& values) {
    Bytes content;
    for (double const value : values)
        content = content + ToBigEndian(static_cast<std::uint64_t>(std::lround(value * 100000)), 4);
    return MakePngChunk(type, content);
}

std::vector<double> const kAdobePrimaries{0.3127, 0.3290, 0.64, 0.33, 0.21, 0.71, 0.15, 0.06};

// The colours of Display P3 are those that "transicc -i p3.icc -o '*sRGB'" tells, the others come from the formulas.
TEST(Color, WhatAFileSaysOfItsColoursIsConvertedToSrgbAtEverySize) {
    ErrorLines const errors;
    TempFolder const folder;
    Bytes const p3 = ReadProfile("p3");
    auto const embed = [&](char const* extension, std::size_t part) {
        return [=](Picture const& image) { return EmbedProfile(Encode(image, extension), p3, part); };
    };
    auto const mark = [](Bytes const& chunks) {
        return [chunks](Picture const& image) { return PutBeforePixels(Encode(image, "png"), chunks); };
    };
    Color const before[] = {{200, 100, 50, 255}, {30, 200, 90, 255}, {90, 90, 90, 255}};
    std::vector<Color> const p3ToSrgb = {{215, 93, 31, 255}, {0, 204, 73, 255}, {90, 90, 90, 255}};
    Bytes const adobe = MakeNumbers("cHRM", kAdobePrimaries);
    struct {
        std::function<Bytes(Picture const&)> encode;
        std::vector<Color> after;
        char const* told;
    } const cases[] = {
        {embed("png", 60000), p3ToSrgb, "Display P3"},
        {embed("webp", 60000), p3ToSrgb, "Display P3"},
        {embed("jpg", 60000), p3ToSrgb, "Display P3"},
        {embed("jpg", 100), p3ToSrgb, "Display P3"}, // in several parts, out of order
        // Gamma alone is corrected for a display of gamma 2.2.
        {mark(MakeNumbers("gAMA", {0.2})),
         {{147, 30, 6, 255}, {2, 147, 24, 255}, {24, 24, 24, 255}},
         "gamma 0.2"},
        {mark(adobe + MakeNumbers("gAMA", {0.45455})),
         {{227, 100, 42, 255}, {0, 201, 80, 255}, {90, 90, 90, 255}},
         "gamma 0.45455, own primaries"},
        {mark(adobe), {{226, 100, 46, 255}, {0, 200, 81, 255}, {90, 90, 90, 255}}, "own primaries"},
    };
    for (auto const& one : cases) {
        for (std::size_t i = 0; i < std::size(before); ++i) {
            SCOPED_TRACE(one.told + (" " + std::to_string(&one - cases)) + " of " + std::to_string(i));
            WriteBytes(folder.Path("a"), one.encode(Fill(16, 16, before[i])));
            EXPECT_LE(LargestDifference(DecodeFile(folder.Path("a")), Fill(16, 16, one.after[i])), 2);
            EXPECT_LE(LargestDifference(DecodeScaled(folder.Path("a"), 5, 7), Fill(5, 7, one.after[i])), 2);
            EXPECT_EQ(GetInfo(folder.Path("a")).profile, one.told);
        }
    }
    // Half transparent.
    Picture const veil = Fill(16, 16, {100, 50, 25, 128});
    EXPECT_LE(
        LargestDifference(Decode(EmbedProfile(Encode(veil, "png"), p3)), Fill(16, 16, {108, 47, 16, 128})),
        2);
    Picture const image = MakeGradient(64, 48, false);
    EXPECT_EQ(Decode(EmbedProfile(Encode(image, "png"), ReadProfile("srgb"))), image);
}

TEST(Color, GreyAndInkHaveProfilesOfTheirOwn) {
    ErrorLines const errors;
    Bytes const grey = MakePlainJpeg({55}, TJPF_GRAY, TJSAMP_GRAY);
    EXPECT_LE(LargestDifference(Decode(EmbedProfile(grey, ReadProfile("grey"))),
                                Fill(16, 16, {128, 128, 128, 255})), // 55 of 255 of the light
              1);
    EXPECT_EQ(Decode(EmbedProfile(grey, ReadProfile("srgb"))), Decode(grey));
    // Adobe's marker: 255 is no ink. What they are is told by "transicc -i cmyk.icc -o '*sRGB'".
    Bytes const cmyk = ReadProfile("ink");
    std::pair<Bytes, Color> const inks[] = {{{255, 255, 255, 255}, {255, 255, 255, 255}},
                                            {{255, 255, 255, 0}, {0, 0, 0, 255}},
                                            {{0, 255, 255, 255}, {0, 138, 186, 255}}};
    for (auto const& [ink, color] : inks) {
        Bytes file = EmbedProfile(MakePlainJpeg(ink, TJPF_CMYK, TJSAMP_444), cmyk);
        EXPECT_LE(LargestDifference(Decode(file), Fill(16, 16, color)), 3)
            << int{ink[0]} << ' ' << int{ink[3]};
    }
}

TEST(Color, AProfileThatCannotBeUsedIsIgnoredWithOneWarning) {
    Picture const image = MakeGradient(16, 16, false);
    Bytes const p3 = ReadProfile("p3");
    Bytes const profiles[] = {{1, 2, 3}, Bytes(p3.begin(), p3.begin() + 200), ReadProfile("ink")};
    for (std::string const extension : {"png", "webp", "jpg"}) {
        Bytes const plain = Encode(image, extension);
        Picture const expected = Decode(plain);
        for (Bytes const& profile : profiles) {
            SCOPED_TRACE(extension + " " + std::to_string(&profile - profiles));
            LogCapture const log;
            EXPECT_EQ(Decode(EmbedProfile(plain, profile), "some/folder/odd.img"), expected);
            EXPECT_THAT(log.GetTexts(ANDROID_LOG_WARN),
                        ElementsAre(HasSubstr("'****/******/***.img': its colour profile is ignored: ")));
            EXPECT_EQ(log.GetTexts().size(), 1u);
        }
    }
    // A part of a JPEG's is missing, or there twice.
    Bytes const jpeg = Encode(image, "jpg");
    Bytes parts = EmbedProfile(jpeg, p3, 100);
    parts[17] = 2;
    LogCapture const log;
    EXPECT_EQ(Decode(parts), Decode(jpeg));
    EXPECT_EQ(log.Count(ANDROID_LOG_WARN), 1);
    // It is no reason for a failure.
    TempFolder const folder;
    String const path(folder.Path("odd.jpg"));
    WriteBytes(folder.Path("odd.jpg"), parts);
    std::string reason;
    EXPECT_TRUE(std::unique_ptr<Bitmap>(BitmapFactory::CreateBitmapForGraphics(&path, &reason)));
    EXPECT_EQ(reason, "");
}

// The directory of a camera: two entries, of which the second is the orientation.
Bytes MakeExif(bool isBigEndian, unsigned char orientation) {
    if (isBigEndian)
        return {'M', 'M',  0, 42, 0, 0, 0, 8, 0, 2,           1, 0x0F, 0, 2, 0, 0, 0, 1, 0, 0, 0, 0, //
                1,   0x12, 0, 3,  0, 0, 0, 1, 0, orientation, 0, 0};
    return {'I',  'I', 42, 0, 8, 0, 0, 0, 2,           0, 0x0F, 1, 2, 0, 1, 0, 0, 0, 0, 0, 0, 0, //
            0x12, 1,   3,  0, 1, 0, 0, 0, orientation, 0, 0,    0};
}

TEST(Metadata, OrientationIsToldAndNotApplied) {
    ErrorLines const errors;
    TempFolder const folder;
    Picture const image = MakeGradient(24, 16, true);
    for (bool const isBigEndian : {true, false}) {
        for (auto const& [noted, told] : {std::pair<unsigned char, int>{9, 1}, {6, 6}}) {
            Bytes const exif = MakeExif(isBigEndian, noted);
            Bytes const app1 = Bytes{'E', 'x', 'i', 'f', 0, 0} + exif;
            Bytes const jpeg = Encode(image, "jpg");
            Bytes const webp = Encode(image, "webp");
            std::pair<Bytes, Bytes> const files[] = {
                {jpeg,
                 Insert(jpeg, 2, Bytes{0xFF, 0xE1, 0, static_cast<unsigned char>(app1.size() + 2)} + app1)},
                {Encode(image, "png"), PutBeforePixels(Encode(image, "png"), MakePngChunk("eXIf", exif))},
                {webp, MakeWebpFile(8, 24, 16,
                                    Bytes(webp.begin() + 12, webp.end()) + MakeWebpChunk("EXIF", exif))}};
            for (auto const& [plain, marked] : files) {
                WriteBytes(folder.Path("photo"), marked);
                EXPECT_EQ(GetInfo(folder.Path("photo")).orientation, told) << int{noted};
                EXPECT_EQ(DecodeFile(folder.Path("photo")), Decode(plain));
            }
        }
    }
}

// A frame at (x, y), from a lossless file of our own.
Bytes MakeFrame(Picture const& image, int x, int y) {
    Bytes const file = Encode(image, "webp");
    Bytes content;
    for (int const value : {x / 2, y / 2, image.width - 1, image.height - 1, 100})
        content = content + ToLittleEndian(static_cast<std::uint64_t>(value), 3);
    return MakeWebpChunk("ANMF", content + Bytes{0} + Bytes(file.begin() + 12, file.end()));
}

TEST(Animation, TheFirstFrameOfAWebpIsDecodedWhereItLies) {
    ErrorLines errors;
    TempFolder const folder;
    Picture const frame = MakeTranslucentNoise(10, 6);
    Bytes const head = MakeWebpChunk("ANIM", {255, 255, 255, 255, 0, 0});
    Bytes const second = MakeFrame(MakeOpaqueNoise(20, 12), 0, 0);
    Bytes const file = MakeWebpFile(0x12, 20, 12, head + MakeFrame(frame, 4, 2) + second);
    Picture const expected = Picture(20, 12).With(4, 2, frame);
    WriteBytes(folder.Path("a.webp"), file);
    EXPECT_EQ(DecodeFile(folder.Path("a.webp")), expected);
    EXPECT_EQ(DecodeScaled(folder.Path("a.webp"), 7, 5), Scale(expected, 7, 5));
    EXPECT_EQ(GetInfo(folder.Path("a.webp")).frames, 2);
    Bytes const png = PutBeforePixels(Encode(frame, "png"), MakePngChunk("acTL", {0, 0, 0, 12, 0, 0, 0, 0}));
    WriteBytes(folder.Path("a.png"), png);
    EXPECT_EQ(Decode(png), frame) << "the default image";
    EXPECT_EQ(GetInfo(folder.Path("a.png")).frames, 12);
    // Half of the second frame, no frame, and one that leaves the canvas.
    Bytes const cut(file.begin(), file.end() - 40);
    Bytes const empty = MakeWebpFile(0x12, 20, 12, head);
    Bytes const outside = MakeWebpFile(0x12, 20, 12, head + MakeFrame(frame, 12, 2));
    for (Bytes const& bad : {cut, empty, outside}) {
        EXPECT_TRUE(Decode(bad).pixels.empty());
        EXPECT_EQ(errors.Take().size(), 1u);
    }
}

} // namespace
} // namespace Moka::Testing
