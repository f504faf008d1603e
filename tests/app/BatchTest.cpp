#include "tests/app/ToolTest.h"
#include "tests/support/ImageCompare.h"

#include <sys/stat.h>
#include <unistd.h>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::MatchesRegex;
using ::testing::StartsWith;

constexpr int kFailed = 1;
constexpr int kUsage = 2;

class BatchTest : public ToolTest {
protected:
    BatchTest() { std::filesystem::create_directory(mFolder / "out"); }

    static std::vector<std::string> Batch(std::vector<std::string> inputs, std::string const& format,
                                          std::vector<std::string> const& more = {}) {
        inputs.insert(inputs.begin(), "convert");
        inputs.insert(inputs.end(), {"--to", format, "--out", "out"});
        inputs.insert(inputs.end(), more.begin(), more.end());
        return inputs;
    }

    void ExpectSamePixels(std::string const& a, std::string const& b) const {
        TestImage const first = Load(a);
        ASSERT_GT(first.width, 0) << a;
        EXPECT_EQ(CompareImages(first, Load(b)).differingPixels, 0) << a << " and " << b;
    }

    // Nothing converted, one line that holds every part.
    void ExpectRefused(std::vector<std::string> const& arguments, int status,
                       std::vector<std::string> const& parts) const {
        ProcessResult const result = Run(arguments);
        SCOPED_TRACE(::testing::PrintToString(arguments) + " said: " + result.err);
        EXPECT_EQ(result.status, status);
        EXPECT_EQ(result.CountErrorLines(), 1);
        EXPECT_THAT(result.err, StartsWith("moka: "));
        for (std::string const& part : parts) EXPECT_THAT(result.err, HasSubstr(part));
        EXPECT_EQ(result.out, "");
        EXPECT_THAT(List("out"), IsEmpty());
    }
};

// Each of its own size and format, and more than are in flight at once, so that a mix-up of any two shows.
TEST_F(BatchTest, ManyFilesOfMixedFormatsBecomeEachItsOwn) {
    char const* const formats[] = {"png", "jpg", "webp", "mki"};
    std::vector<std::string> inputs;
    for (int i = 0; i < 23; ++i) {
        inputs.push_back("p" + std::to_string(i) + "." + formats[i % 4]);
        Save(MakeAlphaPattern(20 + 3 * i, 60 - 2 * i), inputs.back(), 90);
    }
    for (std::string const jobs : {"1", "4", "64"}) {
        std::string const told = RunWell(Batch(inputs, "mki", {"--jobs", jobs, "--max-texture", "96"}));
        EXPECT_THAT(told, MatchesRegex("23 of 23 images -> out/ \\(mki\\), [0-9]+\\.[0-9] files/s\n"));
        EXPECT_EQ(List("out").size(), inputs.size());
        for (std::string const& input : inputs)
            ExpectSamePixels(input, "out/" + input.substr(0, input.find('.')) + ".mki");
        std::filesystem::remove(Path("out/p0.mki"));
    }
}

TEST_F(BatchTest, WhatHoldsForOneFileHoldsForMany) {
    Save(MakeAlphaPattern(60, 40), "a.png");
    Save(MakeGradient(64, 300), "tall.png");
    for (std::string const format : {"png", "jpg", "jpeg", "webp"}) {
        EXPECT_EQ(RunWell(Batch({"a.png"}, format, {"-q"})), "");
        RunWell({"convert", "a.png", "one." + format});
        EXPECT_TRUE(ReadFile("out/a." + format) == ReadFile("one." + format)) << format;
    }
    RunWell(Batch({"a.png"}, "webp", {"--quality", "20", "--size", "30x11"}));
    RunWell({"convert", "a.png", "small.webp", "--quality", "20", "--size", "30x11"});
    EXPECT_TRUE(ReadFile("out/a.webp") == ReadFile("small.webp"));
    RunWell(Batch({"tall.png"}, "mki", {"--max-texture", "64"}));
    ExpectSamePixels("tall.png", "out/tall.mki");
}

TEST_F(BatchTest, ABrokenFileStopsNoOtherAndIsNamedWithItsReason) {
    for (std::string const good : {"1.png", "2.jpg", "3.webp", "4.mki", "5.png"})
        Save(MakeInkPage(50, 40), good);
    Save(MakeInkPage(90, 70), "wide.png");
    Save(MakeInkPage(60, 70), "cut.png");
    Truncate("cut.png");
    WriteFile("text.jpg", "no picture");
    std::filesystem::create_directory(mFolder / "folder.png");
    ProcessResult const result = Run(Batch({"missing.png", "1.png", "cut.png", "2.jpg", "wide.png", "3.webp",
                                            "text.jpg", "4.mki", "folder.png", "5.png"},
                                           "png", {"--max-texture", "64"}));
    EXPECT_EQ(result.status, kFailed);
    EXPECT_THAT(result.out, StartsWith("5 of 10 images -> out/ (png), "));
    EXPECT_THAT(List("out"), ElementsAre("1.png", "2.png", "3.png", "4.png", "5.png"));
    for (std::string const good : {"1.png", "2.jpg", "3.webp", "4.mki", "5.png"})
        ExpectSamePixels(good, "out/" + good.substr(0, 2) + "png");
    // In the order of the files.
    EXPECT_THAT(result.err, MatchesRegex("moka: [^\n]*missing\\.png[^\n]*No such file[^\n]*\n"
                                         "moka: [^\n]*cut\\.png[^\n]*truncated[^\n]*\n"
                                         "moka: wide\\.png is 90 pixels wide[^\n]*--size 64x49\n"
                                         "moka: [^\n]*text\\.jpg[^\n]*no PNG, JPEG, WebP[^\n]*\n"
                                         "moka: [^\n]*folder\\.png[^\n]*folder[^\n]*\n"));
}

// Reasons come from several threads while several files are in work; each must find its file.
TEST_F(BatchTest, EveryReasonBelongsToItsFile) {
    std::vector<std::string> inputs;
    for (int i = 0; i < 60; ++i) {
        std::string const name = std::to_string(i) + ".png";
        inputs.push_back(name);
        Save(MakeInkPage(40, 30), name);
        if (i % 3 == 1) Truncate(name);
        // What cannot be replaced is found out when saving.
        if (i % 3 == 2) std::filesystem::create_directory(mFolder / "out" / (std::to_string(i) + ".mki"));
    }
    ProcessResult const result = Run(Batch(inputs, "mki"));
    EXPECT_EQ(result.status, kFailed);
    EXPECT_THAT(result.out, StartsWith("20 of 60 images"));
    EXPECT_EQ(result.CountErrorLines(), 40);
    for (int i = 0; i < 60; ++i) {
        std::string const name = std::to_string(i);
        if (i % 3 == 1) {
            EXPECT_THAT(result.err,
                        HasSubstr("moka: cannot read image '" + name + ".png': the file is truncated"));
        } else if (i % 3 == 2) {
            EXPECT_THAT(result.err,
                        HasSubstr(name + ".png: cannot save image 'out/" + name + ".mki': it is a folder"));
        }
    }
}

TEST_F(BatchTest, NamesMayHoldSpacesAndAnyAlphabet) {
    Save(MakeGradient(8, 8), "в саду ☕ 1.png");
    Save(MakeGradient(9, 8), "été.old.JPG.png");
    Save(MakeGradient(10, 8), "two\nlines.png");
    std::filesystem::rename(mFolder / "out", mFolder / "mes dossiers");
    RunWell({"convert", "в саду ☕ 1.png", "été.old.JPG.png", "two\nlines.png", "--to", "mki", "--out",
             "mes dossiers/"});
    ExpectSamePixels("в саду ☕ 1.png", "mes dossiers/в саду ☕ 1.mki");
    ExpectSamePixels("été.old.JPG.png", "mes dossiers/été.old.JPG.mki");
    ExpectSamePixels("two\nlines.png", "mes dossiers/two\nlines.mki");
}

TEST_F(BatchTest, FilesAreReplacedEvenTheInputs) {
    Save(MakeAlphaPattern(40, 30), "a.png");
    WriteFile("b.mki", "what was there before");
    Save(MakeAlphaPattern(50, 30), "b.png");
    RunWell({"convert", "a.png", "--to", "png", "--out", "."});
    RunWell({"convert", "b.png", "--to", "mki", "--out", "."});
    EXPECT_EQ(CompareImages(MakeAlphaPattern(40, 30), Load("a.png")).differingPixels, 0);
    EXPECT_EQ(CompareImages(MakeAlphaPattern(50, 30), Load("b.mki")).differingPixels, 0);
    EXPECT_THAT(List(), ElementsAre("a.png", "b.mki", "b.png", "out"));
}

TEST_F(BatchTest, WrongUsageIsToldBeforeAnyWork) {
    Save(MakeGradient(8, 8), "a.png");
    std::filesystem::create_directory(mFolder / "more");
    Save(MakeGradient(8, 8), "more/a.jpg");
    ExpectRefused({"convert", "--to", "mki", "--out", "out"}, kUsage, {"INPUT"});
    ExpectRefused({"convert", "a.png", "--to", "mki"}, kUsage, {"--to", "--out"});
    ExpectRefused({"convert", "a.png", "b.png", "--out", "out"}, kUsage, {"--out", "--to"});
    ExpectRefused({"convert", "a.png", "b.png", "--jobs", "2"}, kUsage, {"--jobs", "--to"});
    for (std::string const jobs : {"0", "65", "many"})
        ExpectRefused(Batch({"a.png"}, "mki", {"--jobs", jobs}), kUsage, {"--jobs", jobs});
    for (std::string const format : {"bmp", "PNG", "", "x.png", "../a.png"})
        ExpectRefused(Batch({"a.png"}, format), kUsage, {"--to", "'" + format + "'", "webp"});
    ExpectRefused({"convert", "a.png", "--to", "mki", "--out", "nowhere"}, kUsage, {"nowhere", "create it"});
    ExpectRefused({"convert", "a.png", "--to", "mki", "--out", "a.png"}, kUsage, {"no folder a.png"});
    ExpectRefused({"convert", "a.png", "--to", "mki", "--out", ""}, kUsage, {"--out", "empty"});
    ExpectRefused(Batch({"a.png", ""}, "mki"), kUsage, {"empty"});
    ExpectRefused(Batch({"a.png", "b\xFF.png"}, "mki"), kUsage, {"UTF-8"});
    ExpectRefused(Batch({"a.png", "more/a.jpg"}, "mki"), kUsage, {"a.png", "more/a.jpg", "out/a.mki"});
    ExpectRefused(Batch({"a.png", "./a.png"}, "mki"), kUsage, {"out/a.mki"});
}

TEST_F(BatchTest, WhatConcernsAllIsToldOnce) {
    Save(MakeGradient(8, 8), "a.png");
    Save(MakeGradient(8, 8), "b.png");
    ExpectRefused(Batch({"a.png", "b.png"}, "mki", {"--max-texture", "64", "--size", "65x9"}), kFailed,
                  {"--size asks for 65 pixels", "up to 64"});
    ProcessOptions options;
    options.environment = {"__EGL_VENDOR_LIBRARY_DIRS=/nonexistent"};
    ProcessResult const result = Run(Batch({"a.png", "b.png"}, "mki"), options);
    EXPECT_EQ(result.status, kFailed);
    EXPECT_EQ(result.CountErrorLines(), 1);
    EXPECT_THAT(result.err, HasSubstr("Install"));
}

TEST_F(BatchTest, AFullDiskLeavesWhatWasThere) {
    for (std::string const name : {"a", "b", "c"}) Save(MakeAlphaPattern(90, 70), name + ".png");
    Save(MakeGradient(4, 4), "small.png");
    WriteFile("out/b.mki", "what was there before");
    ProcessOptions options;
    options.fileSizeLimit = 600;
    ProcessResult const result = Run(Batch({"a.png", "b.png", "small.png", "c.png"}, "mki"), options);
    EXPECT_EQ(result.status, kFailed);
    EXPECT_THAT(result.out, StartsWith("1 of 4 images"));
    EXPECT_EQ(result.CountErrorLines(), 3);
    for (std::string const name : {"a", "b", "c"})
        EXPECT_THAT(result.err,
                    HasSubstr("moka: " + name + ".png: cannot save image 'out/" + name + ".mki': "));
    EXPECT_THAT(result.err, HasSubstr("File too large"));
    EXPECT_THAT(List("out"), ElementsAre("b.mki", "small.mki"));
    EXPECT_EQ(ReadFile("out/b.mki"), "what was there before");
}

TEST_F(BatchTest, AFolderThatCannotBeWrittenTo) {
    Save(MakeGradient(8, 8), "a.png");
    ProcessResult const result = Run({"convert", "a.png", "--to", "mki", "--out", "/proc"});
    EXPECT_EQ(result.status, kFailed);
    EXPECT_EQ(result.CountErrorLines(), 1);
    EXPECT_THAT(result.err, HasSubstr("/proc"));
    if (geteuid() == 0) GTEST_SKIP() << "root may write everywhere else";
    chmod(Path("out").c_str(), 0500);
    ExpectRefused(Batch({"a.png"}, "mki"), kFailed, {"permission", "out"});
}

TEST_F(BatchTest, VerboseShowsTheLibrarysLog) {
    Save(MakeGradient(8, 8), "a.png");
    ProcessResult const result = Run(Batch({"a.png", "missing.png"}, "mki", {"--verbose"}));
    EXPECT_EQ(result.status, kFailed);
    EXPECT_THAT(result.err, HasSubstr("error: cannot read image 'missing.png'"));
    EXPECT_THAT(result.err, HasSubstr("info: "));
    EXPECT_THAT(result.out, StartsWith("1 of 2 images"));
}

} // namespace
} // namespace Moka::Testing
