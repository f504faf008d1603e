#include "tests/app/ToolTest.h"

namespace Moka::Testing {
namespace {

using ::testing::HasSubstr;
using ::testing::MatchesRegex;

using InfoTest = ToolTest;

TEST_F(InfoTest, TellsWhatEachFileIs) {
    Save(MakeAlphaPattern(30, 20), "a.png");
    Save(MakeGradient(30, 20), "b.png");
    Save(MakeGradient(31, 20), "c d.jpg");
    Save(MakeAlphaPattern(32, 20), "e.webp");
    Save(MakeGradient(33, 20), "f.mki");
    auto const size = [this](char const* name) { return std::to_string(ReadFile(name).size()); };
    EXPECT_EQ(RunWell({"info", "a.png", "b.png", "c d.jpg", "e.webp", "f.mki"}),
              "a.png: PNG, 30x20, alpha, " + size("a.png") + " bytes, 2400 decoded\n" +
                  "b.png: PNG, 30x20, opaque, " + size("b.png") + " bytes, 2400 decoded\n" +
                  "c d.jpg: JPEG, 31x20, opaque, " + size("c d.jpg") + " bytes, 2480 decoded\n" +
                  "e.webp: WebP, 32x20, alpha, " + size("e.webp") + " bytes, 2560 decoded\n" +
                  "f.mki: mki, 33x20, alpha, " + size("f.mki") + " bytes, 2640 decoded\n");
}

TEST_F(InfoTest, ABrokenFileHidesNoOther) {
    Save(MakeGradient(30, 20), "good.png");
    WriteFile("bad.png", "nothing like it");
    ProcessResult const result = Run({"info", "bad.png", "good.png", "missing.png"});
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.out, HasSubstr("good.png: PNG, 30x20"));
    EXPECT_EQ(result.CountErrorLines(), 2);
    EXPECT_THAT(result.err, HasSubstr("bad.png"));
    EXPECT_THAT(result.err, HasSubstr("missing.png"));
}

TEST_F(InfoTest, TellsTheDeviceWithoutAFile) {
    std::string const told = RunWell({"info", "--device"});
    EXPECT_THAT(told, MatchesRegex("renderer +[^\n]+\nvendor +[^\n]+\nversion +OpenGL ES 3[^\n]+\n"
                                   "EGL +1\\.[^\n]+\nreached through +[^\n]+\nlargest texture +[0-9]+\n"));
}

TEST_F(InfoTest, WithoutADriverTheDeviceIsAFailureAndFilesAreNot) {
    ProcessOptions options;
    options.environment = {"__EGL_VENDOR_LIBRARY_DIRS=/nonexistent"};
    Save(MakeGradient(30, 20), "a.png");
    EXPECT_EQ(Run({"info", "a.png"}, options).status, 0);
    ProcessResult const result = Run({"info", "--device"}, options);
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.CountErrorLines(), 1);
    EXPECT_THAT(result.err, HasSubstr("Install"));
}

} // namespace
} // namespace Moka::Testing
