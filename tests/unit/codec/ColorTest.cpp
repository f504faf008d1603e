// What files say of their colours, and of what else they hold besides pixels.
#include "moka/base/log/AndroidLog.h"
#include "tests/unit/codec/CodecTestSupport.h"

#include <memory>
#include <turbojpeg.h>

namespace Moka::Testing {
namespace {

Bytes MakeNumbers(char const* type, std::vector<unsigned> const& values) {
    Bytes content;
    for (unsigned const value : values) content += ToBigEndian(value, 4);
    return MakePngChunk(type, content);
}

// The colours of Display P3 are those that "transicc -i p3.icc -o '*sRGB'" tells, the others come from the formulas.
TEST(Color, WhatAFileSaysOfItsColoursIsConvertedToSrgbAtEverySize) {
    ErrorLines const errors;
    TempFolder const folder;
    Bytes const p3 = ReadProfile("p3");
    Bytes const adobe = MakeNumbers("cHRM", {31270, 32900, 64000, 33000, 21000, 71000, 15000, 6000});
    std::vector<Color> const p3ToSrgb = {{215, 93, 31, 255}, {0, 204, 73, 255}, {90, 90, 90, 255}};
    Color const before[] = {{200, 100, 50, 255}, {30, 200, 90, 255}, {90, 90, 90, 255}};
    struct {
        char const* extension;
        std::size_t partBytes; // of the profile
        Bytes chunks;          // in place of a profile
        std::vector<Color> after;
        char const* told;
    } const cases[] = {
        {"png", 60000, "", p3ToSrgb, "Display P3"},
        {"webp", 60000, "", p3ToSrgb, "Display P3"},
        {"jpg", 60000, "", p3ToSrgb, "Display P3"},
        {"jpg", 100, "", p3ToSrgb, "Display P3"}, // out of order
        // Gamma alone is corrected for a display of gamma 2.2.
        {"png",
         0,
         MakeNumbers("gAMA", {20000}),
         {{147, 30, 6, 255}, {2, 147, 24, 255}, {24, 24, 24, 255}},
         "gamma 0.2"},
        {"png",
         0,
         adobe + MakeNumbers("gAMA", {45455}),
         {{227, 100, 42, 255}, {0, 201, 80, 255}, {90, 90, 90, 255}},
         "gamma 0.45455, own primaries"},
        {"png", 0, adobe, {{226, 100, 46, 255}, {0, 200, 81, 255}, {90, 90, 90, 255}}, "own primaries"},
    };
    for (auto const& one : cases) {
        for (std::size_t i = 0; i < std::size(before); ++i) {
            SCOPED_TRACE(one.told + (" " + std::to_string(&one - cases)) + " of " + std::to_string(i));
            Bytes const plain = Encode(Fill(16, 16, before[i]), one.extension);
            WriteFile(folder.Path("a"), one.partBytes > 0 ? EmbedProfile(plain, p3, one.partBytes)
                                                          : PutBeforePixels(plain, one.chunks));
            EXPECT_LE(LargestDifference(LoadImage(folder.Path("a")), Fill(16, 16, one.after[i])), 2);
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
    // In Adobe's files 255 is no ink. What they are is told by "transicc -i cmyk.icc -o '*sRGB'".
    struct {
        Color file;
        int format;
        char const* profile;
        Color seen;
    } const cases[] = {{{55, 55, 55, 55}, TJPF_GRAY, "grey", {128, 128, 128, 255}}, // 55 of 255 of the light
                       {{55, 55, 55, 55}, TJPF_GRAY, "srgb", {55, 55, 55, 255}},
                       {{255, 255, 255, 255}, TJPF_CMYK, "ink", {255, 255, 255, 255}},
                       {{255, 255, 255, 0}, TJPF_CMYK, "ink", {0, 0, 0, 255}},
                       {{0, 255, 255, 255}, TJPF_CMYK, "ink", {0, 138, 186, 255}}};
    for (auto const& [file, format, profile, seen] : cases) {
        Bytes const jpeg =
            MakeJpeg(Fill(16, 16, file), format, format == TJPF_GRAY ? TJSAMP_GRAY : TJSAMP_444);
        EXPECT_LE(LargestDifference(Decode(EmbedProfile(jpeg, ReadProfile(profile))), Fill(16, 16, seen)), 3)
            << profile << ' ' << int{file[0]} << ' ' << int{file[3]};
    }
}

TEST(Color, AProfileThatCannotBeUsedIsIgnoredWithOneWarning) {
    Picture const image = MakeGradient(16, 16, false);
    Bytes const p3 = ReadProfile("p3");
    Bytes const profiles[] = {"no profile", p3.substr(0, 200), ReadProfile("ink")};
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
    WriteFile(folder.Path("odd.jpg"), parts);
    std::string reason;
    EXPECT_TRUE(std::unique_ptr<Bitmap>(BitmapFactory::CreateBitmapForGraphics(&path, &reason)));
    EXPECT_EQ(reason, "");
}

// The directory of a camera: two entries, of which the second is the orientation.
Bytes MakeExif(bool isBigEndian, unsigned orientation) {
    Bytes exif = isBigEndian ? "MM" : "II";
    std::pair<unsigned, int> const numbers[] = {
        {42, 2},    {8, 4}, {2, 2},         // where the directory is, and its length
        {0x10F, 2}, {2, 2}, {1, 4}, {0, 4}, //
        {0x112, 2}, {3, 2}, {1, 4}, {orientation, 2}, {0, 2}};
    for (auto const& [number, bytes] : numbers)
        exif += isBigEndian ? ToBigEndian(number, bytes) : ToLittleEndian(number, bytes);
    return exif;
}

TEST(Metadata, OrientationIsToldAndNotApplied) {
    ErrorLines const errors;
    TempFolder const folder;
    Picture const image = MakeGradient(24, 16, true);
    for (bool const isBigEndian : {true, false}) {
        for (auto const& [noted, told] : {std::pair<unsigned, int>{9, 1}, {6, 6}}) {
            Bytes const exif = MakeExif(isBigEndian, noted);
            Bytes const app1 = "\xFF\xE1" + ToBigEndian(exif.size() + 8, 2) + Bytes("Exif\0", 6) + exif;
            Bytes const jpeg = Encode(image, "jpg"), png = Encode(image, "png"), webp = Encode(image, "webp");
            std::pair<Bytes, Bytes> const files[] = {
                {jpeg, Bytes(jpeg).insert(2, app1)},
                {png, PutBeforePixels(png, MakePngChunk("eXIf", exif))},
                {webp, MakeWebpFile(8, 24, 16, webp.substr(12) + MakeWebpChunk("EXIF", exif))}};
            for (auto const& [plain, marked] : files) {
                WriteFile(folder.Path("photo"), marked);
                EXPECT_EQ(GetInfo(folder.Path("photo")).orientation, told) << noted;
                EXPECT_EQ(LoadImage(folder.Path("photo")), Decode(plain));
            }
        }
    }
}

// A frame at (x, y), from a lossless file of our own.
Bytes MakeFrame(Picture const& image, int x, int y) {
    Bytes content;
    for (int const value : {x / 2, y / 2, image.width - 1, image.height - 1, 100})
        content += ToLittleEndian(static_cast<std::uint64_t>(value), 3);
    return MakeWebpChunk("ANMF", content + '\0' + Encode(image, "webp").substr(12));
}

TEST(Animation, TheFirstFrameOfAWebpIsDecodedWhereItLies) {
    ErrorLines errors;
    TempFolder const folder;
    Picture const frame = MakeAlphaPattern(10, 6);
    Bytes const head = MakeWebpChunk("ANIM", Bytes("\xFF\xFF\xFF\xFF\0", 6));
    Bytes const second = MakeFrame(MakeGradient(20, 12), 0, 0);
    Bytes const file = MakeWebpFile(0x12, 20, 12, head + MakeFrame(frame, 4, 2) + second);
    Picture const expected = Picture(20, 12).With(4, 2, frame);
    WriteFile(folder.Path("a.webp"), file);
    EXPECT_EQ(LoadImage(folder.Path("a.webp")), expected);
    EXPECT_EQ(DecodeScaled(folder.Path("a.webp"), 7, 5), Scale(expected, 7, 5));
    EXPECT_EQ(GetInfo(folder.Path("a.webp")).frames, 2);
    Bytes const png =
        PutBeforePixels(Encode(frame, "png"), MakePngChunk("acTL", ToBigEndian(12, 4) + ToBigEndian(0, 4)));
    WriteFile(folder.Path("a.png"), png);
    EXPECT_EQ(Decode(png), frame) << "the default image";
    EXPECT_EQ(GetInfo(folder.Path("a.png")).frames, 12);
    // Half of the second frame, no frame, and one that leaves the canvas.
    Bytes const cut = file.substr(0, file.size() - 40);
    Bytes const empty = MakeWebpFile(0x12, 20, 12, head);
    Bytes const outside = MakeWebpFile(0x12, 20, 12, head + MakeFrame(frame, 12, 2));
    for (Bytes const& bad : {cut, empty, outside}) {
        EXPECT_TRUE(Decode(bad).pixels.empty());
        EXPECT_EQ(errors.Take().size(), 1u);
    }
}

} // namespace
} // namespace Moka::Testing
