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
    }
};

TEST_F(FailureTest, WrongUsageIsToldWithWhatIsWrong) {
    using Arguments = std::vector<std::string>;
    struct {
        Arguments arguments;
        Arguments parts; // of the error line
    } const cases[] = {
        {{}, {"convert or info", "moka --help"}},
        {{"paint"}, {"command 'paint'", "moka --help"}},
        {{"--paint"}, {"option '--paint'", "moka --help"}},
        {{"info", "--divice"}, {"--divice", "moka info --help"}},
        {{"convert"}, {"INPUT", "moka convert --help"}},
        {{"convert", "in.png"}, {"OUTPUT"}},
        {{"convert", "in.png", "out.mki", "third"}, {"third"}},
        {{"convert", "", "out.mki"}, {"empty"}},
        {{"convert", "in.png", "out.bmp"}, {"out.bmp", ".webp"}},
        {{"convert", "in.png", "folder.png/out"}, {"folder.png/out", ".webp"}},
        {{"convert", "in.png", "out.mki", "--to", "webp"}, {"--to needs --out"}},
        {{"draw", "in.json"}, {"-o", "moka draw --help"}},
        {{"draw", "in.json", "-o", "out.png", "--to", "png"}, {"out.png", "extension"}},
        {{"draw", "--watch", "-", "-o", "out.png"}, {"--watch"}},
        {{"draw", "in.json", "-o", "-", "--statistics"}, {"--statistics", "name a file"}},
        {{"gallery"}, {"--out"}},
        {{"gallery", "--out", "g", "--only", "nonesuch"}, {"no scene 'nonesuch'"}},
    };
    for (auto const& [arguments, parts] : cases) ExpectFails(arguments, kUsage, parts);
    for (char const* const quality : {"101", "high", ""})
        ExpectFails({"convert", "in.png", "out.jpg", "--quality", quality}, kUsage, {"--quality", quality});
    for (char const* const side : {"0", "-4", "65536", "1.5"})
        ExpectFails({"convert", "in.png", "out.jpg", "--max-texture", side}, kUsage, {"--max-texture", side});
    for (char const* const size : {"12", "0x5", "5x", "5x5x5", "65536x1", "99999999999x1", "40000x40000"})
        ExpectFails({"convert", "in.png", "out.jpg", "--size", size}, kUsage,
                    {"--size", size, "WIDTHxHEIGHT"});
}

TEST_F(FailureTest, InputsThatAreNoImage) {
    WriteFile("text.png", "no picture at all, just words");
    WriteFile("empty.webp", "");
    std::filesystem::create_directory(mFolder / "folder.png");
    ExpectFails({"convert", "missing.png", "old.png"}, kFailed, {"missing.png", "No such file"});
    ExpectFails({"convert", "text.png", "old.png"}, kFailed, {"text.png", "PNG, JPEG, WebP"});
    ExpectFails({"convert", "empty.webp", "old.png"}, kFailed, {"empty.webp", "empty"});
    ExpectFails({"convert", "folder.png", "old.png"}, kFailed, {"folder.png", "folder"});
    ExpectFails({"convert", "/dev/zero", "old.png"}, kFailed, {"/dev/zero", "regular file"});
    ExpectFails({"convert", "two\nlines.png", "old.png"}, kFailed, {"lines.png"});
    ExpectFails({"convert", "in\xFF.png", "old.png"}, kFailed, {"in\xEF\xBF\xBD.png", "No such file"});
    ProcessOptions options;
    options.in = Path("text.png");
    ExpectFails({"convert", "-", "old.png"}, kFailed, {"standard input", "PNG, JPEG, WebP"}, options);
    ExpectFails({"info", "-"}, kFailed, {"standard input", "PNG, JPEG, WebP"}, options);
    ExpectFails({"draw", "-", "-o", "old.png"}, kFailed, {"standard input:1:"}, options);
    for (std::string const name : {"cut.png", "cut.jpg", "cut.webp", "cut.mki"}) {
        Save(MakeInkPage(90, 70), name);
        Truncate(name);
        ExpectFails({"convert", name, "old.png"}, kFailed, {name, "truncated"});
    }
}

TEST_F(FailureTest, OutputsThatCannotBeWritten) {
    std::filesystem::create_directory(mFolder / "folder.png");
    ExpectFails({"convert", "in.png", "folder.png"}, kFailed, {"folder.png", "is a folder"});
    ExpectFails({"convert", "in.png", "nowhere/out.png"}, kFailed, {"nowhere/out.png", "create it first"});
    ExpectFails({"convert", "in.png", "old.png/out.png"}, kFailed, {"old.png/out.png", "no folder old.png"});
    ExpectFails({"convert", "in.png", "/proc/moka.png"}, kFailed, {"/proc/moka.png"});
    ASSERT_EQ(mkfifo(Path("pipe.png").c_str(), 0600), 0);
    ExpectFails({"convert", "in.png", "pipe.png"}, kFailed, {"pipe.png", "regular file"});
    Save(MakeGradient(1, 16400), "long.png");
    ExpectFails({"convert", "long.png", "out.webp"}, kFailed, {"out.webp", "16383", "png"});
}

TEST_F(FailureTest, AFolderWithoutPermission) {
    if (geteuid() == 0) GTEST_SKIP() << "root may write everywhere";
    std::filesystem::create_directory(mFolder / "locked");
    chmod(Path("locked").c_str(), 0500);
    ExpectFails({"convert", "in.png", "locked/out.png"}, kFailed, {"locked/out.png", "permission"});
    ExpectFails({"convert", "in.png", "--to", "mki", "--out", "locked"}, kFailed, {"permission", "locked"});
}

TEST_F(FailureTest, AFullDisk) {
    ProcessOptions options;
    options.fileSizeLimit = 600;
    for (std::string const output : {"out.png", "out.jpg", "out.webp", "out.mki", "old.png"})
        ExpectFails({"convert", "in.png", output}, kFailed, {output, "File too large"}, options);
}

TEST_F(FailureTest, NoDriver) {
    ExpectFails({"convert", "in.png", "old.png"}, kFailed, {"Install"}, WithoutDriver());
    ExpectFails({"convert", "in.png", "old.png", "--to", "mki", "--out", "."}, kFailed, {"Install"},
                WithoutDriver());
    ExpectFails(
        {"info", "--device"}, kFailed,
        {"OpenGL ES 3.0", "Tried: ", "default display", "EGL_", "Install", "libegl1", "libgl1-mesa-dri"},
        WithoutDriver());
}

TEST_F(FailureTest, WiderThanATexture) {
    ExpectFails(
        {"convert", "in.png", "old.png", "--max-texture", "64"}, kFailed,
        {"in.png is 90 pixels wide", "--max-texture 64 limits the width", "at least 90", "--size 64x49"});
    ExpectFails({"convert", "in.png", "old.png", "--max-texture", "64", "--size", "65x9"}, kFailed,
                {"--size asks for 65 pixels", "--max-texture 64"});
    RunWell({"convert", "in.png", "out.png", "--max-texture", "64", "--size", "64x49"});
}

TEST_F(FailureTest, VerboseTellsWhatHappensWithTheLibrarysLog) {
    ProcessResult const result =
        Run({"convert", "missing.png", "in.png", "--to", "mki", "--out", ".", "--verbose"});
    EXPECT_EQ(result.status, kFailed);
    for (char const* part : {"error: cannot read image 'missing.png'", "moka: cannot read",
                             "info: ", "moka: in.png -> ./in.mki\n", ", EGL "})
        EXPECT_THAT(result.err, HasSubstr(part));
    ProcessResult const single = Run({"convert", "in.png", "one.mki", "-v"});
    for (char const* stage : {"decode", "upload", "read back", "encode"})
        EXPECT_THAT(single.err, ContainsRegex("moka: " + std::string(stage) + " took [0-9.]+ s\n"));
}

TEST_F(FailureTest, OutputThatIsLost) {
    ProcessOptions options;
    options.out = "/dev/full";
    ExpectFails({"info", "in.png"}, kFailed, {"standard output"}, options);
}

} // namespace
} // namespace Moka::Testing
