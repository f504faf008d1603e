#include "tests/app/ToolTest.h"

namespace Moka::Testing {
namespace {

using ::testing::MatchesRegex;
using ::testing::StartsWith;

class BatchTest : public ToolTest {
protected:
    BatchTest() { std::filesystem::create_directory(mFolder / "out"); }

    static std::string Batch(std::string const& inputs, std::string const& format,
                             std::string const& more = {}) {
        return "convert " + inputs + " --to " + format + " --out out " + more;
    }
};

// Each of its own size and format, and more than are in flight at once, so that a mix-up of any two shows.
TEST_F(BatchTest, ManyFilesOfMixedFormatsBecomeEachItsOwn) {
    char const* const formats[] = {"png", "jpg", "webp", "mki"};
    std::vector<std::string> inputs;
    for (int i = 0; i < 23; ++i) {
        inputs.push_back("p" + std::to_string(i) + "." + formats[i % 4]);
        Save(MakeAlphaPattern(20 + 3 * i, 200 - 2 * i), inputs.back(), 90); // of two or three strips
    }
    for (std::string const jobs : {"1", "4", "64"}) {
        std::string const told = RunWell(Batch("p*", "mki", "--max-texture 96 --jobs " + jobs));
        EXPECT_THAT(told, MatchesRegex("23 of 23 images -> out/ \\(mki\\), [0-9]+\\.[0-9] files/s\n"));
        EXPECT_EQ(List("out").size(), inputs.size());
        for (std::string const& input : inputs)
            ExpectSamePixels(Load(input), "out/" + input.substr(0, input.find('.')) + ".mki");
        std::filesystem::remove(Path("out/p0.mki"));
    }
}

TEST_F(BatchTest, WhatHoldsForOneFileHoldsForMany) {
    Save(MakeAlphaPattern(60, 40), "a.png");
    Save(MakeGradient(64, 300), "tall.png");
    for (std::string const format : {"jpg", "webp"}) {
        EXPECT_EQ(RunWell(Batch("a.png", format, "-q --quality 20 --size 30x11")), "");
        RunWell("convert a.png one." + format + " --quality 20 --size 30x11");
        EXPECT_TRUE(ReadFile("out/a." + format) == ReadFile("one." + format)) << format;
    }
    // One after the other, and each over what is there.
    std::string const told = Run("convert a.png tall.png --to png --out . --jobs 1 --verbose").err;
    EXPECT_LT(told.find("moka: a.png -> ./a.png\n"), told.find("RequestLoad(1, tall.png)"));
    ExpectSamePixels(MakeAlphaPattern(60, 40), "a.png");
}

// Reasons come from several threads while several files are in work; each must find its file.
TEST_F(BatchTest, ABrokenFileStopsNoOtherAndIsNamedInItsTurnWithItsReason) {
    std::vector<std::string> good, present;
    std::string told;
    for (int i = 10; i < 70; ++i) {
        std::string const name = std::to_string(i);
        Save(MakeAlphaPattern(i % 4 == 3 ? 90 : 40, 30), name + ".png");
        if (i % 2 == 0) present.push_back(name + ".mki");
        switch (i % 4) {
        case 0:
            good.push_back(present.back());
            break;
        case 1:
            Truncate(name + ".png");
            told += "moka: cannot read image '" + name + "\\.png': the file is truncated\n";
            break;
        case 2: // what cannot be replaced is found out when saving
            std::filesystem::create_directory(mFolder / "out" / present.back());
            told += "moka: " + name + "\\.png: cannot save image 'out/" + name + "\\.mki': it is a folder\n";
            break;
        default:
            told += "moka: " + name + "\\.png is 90 pixels wide[^\n]*--size 64x21\n";
        }
    }
    ProcessResult const result = Run(Batch("*.png", "mki", "--max-texture 64"));
    EXPECT_EQ(result.status, kFailed);
    EXPECT_THAT(result.out, StartsWith("15 of 60 images -> out/ (mki), "));
    EXPECT_THAT(result.err, MatchesRegex(told));
    EXPECT_EQ(List("out"), present);
    for (std::string const& name : good) ExpectSamePixels(MakeAlphaPattern(40, 30), "out/" + name);
}

TEST_F(BatchTest, NamesMayHoldAnyBytes) {
    Save(MakeGradient(8, 8), "в саду ☕ 1.png");
    Save(MakeGradient(10, 8), "two\nlines.png");
    std::filesystem::rename(mFolder / "out", mFolder / "mes dossiers");
    RunWell("convert 'в саду ☕ 1.png' 'two\nlines.png' --to mki --out 'mes dossiers/'");
    ExpectSamePixels(Load("в саду ☕ 1.png"), "mes dossiers/в саду ☕ 1.mki");
    ExpectSamePixels(Load("two\nlines.png"), "mes dossiers/two\nlines.mki");
    // Not UTF-8.
    Save(MakeGradient(11, 8), "plain.png");
    std::filesystem::rename(Path("plain.png"), Path("caf\xE9.png"));
    RunWell("convert caf\xE9.png --to mki --out \xFF");
    ExpectSamePixels(MakeGradient(11, 8), "\xFF/caf\xE9.mki");
    EXPECT_THAT(RunWell("convert caf\xE9.png \xE9.webp"), StartsWith("caf\xEF\xBF\xBD.png (PNG 11x8)"));
    ExpectSamePixels(MakeGradient(11, 8), "\xE9.webp");
}

} // namespace
} // namespace Moka::Testing
