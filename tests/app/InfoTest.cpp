#include "tests/app/ToolTest.h"

namespace Moka::Testing {
namespace {

using ::testing::MatchesRegex;

using InfoTest = ToolTest;

TEST_F(InfoTest, TellsWhatEachFileIsWithoutADriverAndABrokenOneHidesNoOther) {
    Save(MakeAlphaPattern(30, 20), "a.png");
    Save(MakeGradient(30, 20), "b.png");
    Save(MakeGradient(31, 20), "c d.jpg");
    Save(MakeAlphaPattern(32, 20), "e.webp");
    Save(MakeGradient(33, 20), "f.mki");
    WriteFile("bad.png", "nothing like it");
    ProcessResult const result =
        Run("info bad.png a.png b.png 'c d.jpg' missing.png e.webp f.mki", kWithoutDriver);
    auto const tell = [this](std::string const& name, char const* what, char const* more) {
        return name + ": " + what + ", " + std::to_string(ReadFile(name).size()) + " bytes, " + more + "\n";
    };
    EXPECT_EQ(result.out, tell("a.png", "PNG, 30x20, alpha", "2400 decoded, profile sRGB") +
                              tell("b.png", "PNG, 30x20, opaque", "2400 decoded, profile sRGB") +
                              tell("c d.jpg", "JPEG, 31x20, opaque", "2480 decoded") +
                              tell("e.webp", "WebP, 32x20, alpha", "2560 decoded") +
                              tell("f.mki", "mki, 33x20, alpha", "2640 decoded"));
    EXPECT_EQ(result.status, kFailed);
    EXPECT_THAT(result.err, MatchesRegex("moka: [^\n]*bad\\.png[^\n]*\nmoka: [^\n]*missing\\.png[^\n]*\n"));
}

// An animation of two frames, whose chunk stands before the pixels, and a name that would clear a terminal.
TEST_F(InfoTest, TellsFramesAndShowsNoControlCharacter) {
    Save(MakeGradient(30, 20), "a.png");
    std::string const control{'\0', '\0', '\0', 8, 'a', 'c', 'T', 'L', 0, 0, 0, 2, 0, 0, 0, 0};
    std::string const checksum{'\xF3', '\x8D', '\x93', '\x70'};
    std::string const name = "a\x1B[2J\xC2\x9B\xFF.png";
    WriteFile(name, ReadFile("a.png").insert(33, control + checksum));
    EXPECT_THAT(
        Run("info '" + name + "'").out,
        MatchesRegex("a\\?\\[2J\\?\xEF\xBF\xBD\\.png: PNG, 30x20, opaque, [0-9]+ bytes, 2400 decoded, "
                     "profile sRGB, 2 frames \\(one is read\\)\n"));
}

TEST_F(InfoTest, TellsTheDeviceWithoutAFile) {
    std::string const told = RunWell("info --device");
    EXPECT_THAT(told, MatchesRegex("renderer +[^\n]+\nvendor +[^\n]+\nversion +OpenGL ES 3[^\n]+\n"
                                   "EGL +1\\.[^\n]+\nreached through +[^\n]+\nlargest texture +[0-9]+\n"));
}

} // namespace
} // namespace Moka::Testing
