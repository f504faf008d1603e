#include "tests/app/ToolTest.h"

#include <sys/stat.h>
#include <unistd.h>

namespace Moka::Testing {
namespace {

using ::testing::ContainsRegex;
using ::testing::HasSubstr;

class FailureTest : public ToolTest {
protected:
    FailureTest() {
        Save(MakeAlphaPattern(90, 70), "in.png");
        WriteFile("old.png", "what was there before");
        std::filesystem::create_directory(mFolder / "folder.png");
        Save(MakeGradient(8, 8), "folder.png/in.jpg");
    }
};

struct Refusal {
    char const* arguments;
    char const* parts; // of the error line
};

TEST_F(FailureTest, WrongUsageIsToldWithWhatIsWrongBeforeAnyWork) {
    constexpr Refusal kRefusals[] = {
        {"", "convert or info|moka --help"},
        {"paint", "command 'paint'|moka --help"},
        {"--paint", "option '--paint'|moka --help"},
        {"info --divice", "--divice|moka info --help"},
        {"convert", "INPUT|moka convert --help"},
        {"convert in.png", "OUTPUT"},
        {"convert in.png out.mki third", "third"},
        {"convert '' out.mki", "empty"},
        {"convert in.png out.bmp", "out.bmp|.webp"},
        {"convert in.png folder.png/out", "folder.png/out|.webp"},
        {"convert in.png out.mki --to webp", "--to needs --out"},
        {"convert --to mki --out out", "INPUT"},
        {"convert in.png --to mki", "--to|--out"},
        {"convert in.png - --to mki --out out", "standard input|OUTPUT"},
        {"convert in.png b.png --out out", "--out|--to"},
        {"convert in.png b.png --jobs 2", "--jobs|--out"},
        {"convert in.png --to mki --out out --jobs 65", "--jobs|65"},
        {"convert in.png --to PNG --out out", "--to|'PNG'|webp"},
        {"convert in.png '' --to mki --out out", "empty"},
        {"convert in.png folder.png/in.jpg --to mki --out out", "in.png|folder.png/in.jpg|out/in.mki"},
        {"draw in.json", "-o|moka draw --help"},
        {"draw in.json -o out.png --to png", "out.png|extension"},
        {"draw --watch - -o out.png", "--watch"},
        {"draw in.json -o - --statistics", "--statistics|name a file"},
        {"gallery", "--out"},
        {"gallery --out g --only nonesuch", "no scene 'nonesuch'"},
    };
    for (auto const& [arguments, parts] : kRefusals) ExpectFails(arguments, kUsage, parts);
    std::string const convert = "convert in.png out.jpg ";
    for (std::string const option : {"--quality 101", "--quality high", "--quality ''", "--max-texture 0",
                                     "--max-texture -4", "--max-texture 65536", "--max-texture 1.5"})
        ExpectFails(convert + option, kUsage, option.substr(0, option.find(' ')));
    for (std::string const size : {"12", "0x5", "5x", "5x5x5", "65536x1", "99999999999x1", "40000x40000"})
        ExpectFails(convert + "--size " + size, kUsage, "--size|WIDTHxHEIGHT|" + size);
}

TEST_F(FailureTest, WhatCannotBeReadOrWrittenIsNamedWithItsReason) {
    WriteFile("text.png", "no picture at all, just words");
    WriteFile("empty.webp", "");
    WriteFile("bad.json", "{\"size\": [30, 20],\n\"operations\": [\n{\"DrawCircle\": {\"cx\": \"x\"}}]}");
    WriteFile("broken.json", "{\"size\": [30, 20],\n\"operations\": [");
    WriteFile("image.json",
              "{\"size\": [30, 20], \"operations\": [],\n\"bitmaps\": {\"a\": {\"file\": \"no.png\"}}}");
    WriteFile("good.json", "{\"size\": [30, 20], \"operations\": []}");
    ASSERT_EQ(mkfifo(Path("pipe.png").c_str(), 0600), 0);
    Save(MakeGradient(1, 16400), "long.png");
    constexpr Refusal kRefusals[] = {
        {"convert missing.png old.png", "missing.png|No such file"},
        {"convert text.png old.png", "text.png|PNG, JPEG, WebP"},
        {"convert - old.png < text.png", "standard input|PNG, JPEG, WebP"},
        {"info - < text.png", "standard input|PNG, JPEG, WebP"},
        {"draw - -o old.png < text.png", "standard input:1:"},
        {"convert empty.webp old.png", "empty.webp|empty"},
        {"convert folder.png old.png", "folder.png|folder"},
        {"convert /dev/zero old.png", "/dev/zero|regular file"},
        {"convert in\xFF.png old.png", "in\xEF\xBF\xBD.png|No such file"},
        {"convert 'two\nlines.png' old.png", "lines.png"},
        {"convert in.png folder.png", "folder.png|is a folder"},
        {"convert in.png nowhere/out.png", "nowhere/out.png|create it first"},
        {"convert in.png old.png/out.png", "old.png/out.png|no folder old.png"},
        {"convert in.png /proc/moka.png", "/proc/moka.png"},
        {"convert in.png pipe.png", "pipe.png|regular file"},
        {"convert long.png out.webp", "out.webp|16383|png"},
        {"convert in.png --to mki --out old.png/b", "folder old.png/b"},
        {"gallery --out old.png/g --only clips", "folder old.png/g"},
        {"draw bad.json -o old.png", "bad.json:3:23: operations[0].DrawCircle.cx must be a number"},
        {"draw broken.json -o new.png", "broken.json:2:15: |end of input"},
        {"draw image.json -o new.png", "image.json:2:27: bitmaps.a.file|no.png|No such file"},
        {"draw missing.json -o new.png", "missing.json|No such file"},
        {"draw --watch missing.json -o old.png", "missing.json|No such file"},
        {"draw . -o new.png", "is a folder"},
        {"draw /dev/zero -o new.png", "/dev/zero is larger than 64 MiB"},
        {"draw good.json -o nowhere/new.png", "nowhere|create it first"},
        {"convert in.png old.png --max-texture 64", "in.png is 90 pixels wide|--max-texture 64 limits the "
                                                    "width|at least 90|--size 64x49"},
        {"convert in.png old.png --max-texture 64 --size 65x9", "--size asks for 65 pixels|--max-texture 64"},
        // What concerns all is told once.
        {"convert in.png long.png --to mki --out out --max-texture 64 --size 65x9", "--size asks for 65"},
    };
    for (auto const& [arguments, parts] : kRefusals) ExpectFails(arguments, kFailed, parts);
    for (std::string const name : {"cut.png", "cut.jpg", "cut.webp", "cut.mki"}) {
        Save(MakeAlphaPattern(90, 70), name);
        Truncate(name);
        ExpectFails("convert " + name + " old.png", kFailed, name + "|truncated");
    }
}

TEST_F(FailureTest, AFolderWithoutPermission) {
    if (geteuid() == 0) GTEST_SKIP() << "root may write everywhere";
    std::filesystem::create_directory(mFolder / "locked");
    chmod(Path("locked").c_str(), 0500);
    ExpectFails("convert in.png locked/out.png", kFailed, "locked/out.png|permission");
    ExpectFails("convert in.png --to mki --out locked", kFailed, "permission|locked");
}

TEST_F(FailureTest, AFullDiskOrOutputThatIsLost) {
    for (std::string const output : {"out.png", "out.jpg", "out.webp", "out.mki", "old.png"})
        ExpectFails("convert in.png " + output, kFailed, output + "|File too large",
                    "ulimit -f 1;"); // 512 bytes
    ExpectFails("info in.png > /dev/full", kFailed, "standard output");
    ExpectFails("convert in.png - > /dev/full", kFailed, "standard output|No space");
}

TEST_F(FailureTest, WithoutADriverNothingIsWritten) {
    ExpectFails("convert in.png old.png", kFailed, "Install", kWithoutDriver);
    ExpectFails("convert in.png --to mki --out new", kFailed, "Install", kWithoutDriver);
    ExpectFails("info --device", kFailed,
                "OpenGL ES 3.0|Tried: |default display|EGL_|Install|libegl1|libgl1-mesa-dri", kWithoutDriver);
}

TEST_F(FailureTest, WhatTheGpuReportsOfAPictureKeepsItFromBeingSaved) {
    WriteFile("scene.json", R"({"size": [9, 9], "operations": []})");
    std::string const failing = "ASAN_OPTIONS=verify_asan_link_order=0 LD_PRELOAD=" MOKA_FAILING_DRIVER;
    ExpectFails("draw scene.json -o old.png", kFailed, "scene|GL", failing);
    ExpectFails("convert in.png old.png", kFailed, "GL", failing);
    EXPECT_THAT(Run("convert in.png --to mki --out out", failing).err,
                HasSubstr("in.png: cannot be read back"));
    EXPECT_FALSE(std::filesystem::exists(mFolder / "out"));
}

TEST_F(FailureTest, VerboseTellsWhatHappensWithTheLibrarysLog) {
    ProcessResult const result = Run("convert missing.png in.png --to mki --out . --verbose");
    EXPECT_EQ(result.status, kFailed);
    for (char const* part : {"error: cannot read image 'missing.png'", "moka: cannot read",
                             "info: ", "moka: in.png -> ./in.mki\n", ", EGL "})
        EXPECT_THAT(result.err, HasSubstr(part));
    ProcessResult const single = Run("convert in.png one.mki -v");
    for (char const* stage : {"decode", "upload", "read back", "encode"})
        EXPECT_THAT(single.err, ContainsRegex("moka: " + std::string(stage) + " took [0-9.]+ s\n"));
}

} // namespace
} // namespace Moka::Testing
