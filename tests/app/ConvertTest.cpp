#include "moka/base/BitmapFactory.h"
#include "tests/app/ToolTest.h"
#include "tests/support/ImageCompare.h"

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;

class ConvertTest : public ToolTest {
protected:
    // What the tool writes is what saving the decoded input writes, so the way through the GPU changed
    // nothing, and the encoder got the quality it should.
    void ExpectEncodes(std::string const& input, std::string const& output, int quality) const {
        Save(Load(input), "expected-" + output, quality);
        EXPECT_TRUE(ReadFile(output) == ReadFile("expected-" + output)) << input << " to " << output;
    }

    void ExpectSamePixels(std::string const& a, std::string const& b) const {
        TestImage const first = Load(a);
        ASSERT_GT(first.width, 0);
        EXPECT_EQ(CompareImages(first, Load(b)).differingPixels, 0) << a << " and " << b;
    }
};

TEST_F(ConvertTest, EveryFormatBecomesEveryFormat) {
    for (std::string const from : {"png", "jpg", "webp", "mki"}) {
        Save(MakeAlphaPattern(61, 47), "in." + from, 90);
        for (std::string const to : {"png", "jpg", "webp", "mki"}) {
            std::string const output = from + "-to." + to;
            RunWell({"convert", "in." + from, output});
            ExpectEncodes("in." + from, output, to == "jpg" ? 90 : 100);
            if (to != "jpg") ExpectSamePixels("in." + from, output);
        }
    }
}

TEST_F(ConvertTest, AnImageTallerThanATextureIsCutAndComesBackWhole) {
    TestImage const tall = MakeGradient(64, 321);
    Save(tall, "tall.png");
    EXPECT_THAT(RunWell({"convert", "tall.png", "out.mki", "--max-texture", "64"}), HasSubstr("6 strips"));
    EXPECT_EQ(CompareImages(tall, Load("out.mki")).differingPixels, 0);
}

TEST_F(ConvertTest, QualityReachesTheEncoder) {
    Save(MakeAlphaPattern(61, 47), "in.png");
    for (std::string const output : {"low.jpg", "low.webp"}) {
        RunWell({"convert", "in.png", output, "--quality", "20"});
        ExpectEncodes("in.png", output, 20);
    }
}

TEST_F(ConvertTest, SizeScalesExactly) {
    Save(MakeChecker(60, 40, 20, {200, 0, 0, 255}, {0, 100, 0, 255}), "in.png");
    RunWell({"convert", "in.png", "out.mki", "--size", "3x2"});
    TestImage const scaled = Load("out.mki");
    ASSERT_EQ(scaled.width, 3);
    ASSERT_EQ(scaled.height, 2);
    EXPECT_THAT(scaled.GetColor(0, 0), ElementsAre(200, 0, 0, 255));
    EXPECT_THAT(scaled.GetColor(1, 0), ElementsAre(0, 100, 0, 255));
    EXPECT_THAT(scaled.GetColor(1, 1), ElementsAre(200, 0, 0, 255));
}

TEST_F(ConvertTest, TellsWhatItDidUnlessQuiet) {
    Save(MakeGradient(30, 20), "in.png");
    std::string const told = RunWell({"convert", "in.png", "out.mki"});
    EXPECT_THAT(told, HasSubstr("in.png (PNG 30x20) -> out.mki (mki, "));
    EXPECT_THAT(told, HasSubstr(std::to_string(ReadFile("out.mki").size()) + " bytes), 1 strip, "));
    EXPECT_THAT(RunWell({"convert", "in.png", "out.mki", "--size", "15x10"}), HasSubstr("(mki 15x10, "));
    EXPECT_EQ(RunWell({"convert", "in.png", "out.mki", "-q"}), "");
}

TEST_F(ConvertTest, NamesMayHoldSpacesAndAnyAlphabet) {
    Save(MakeGradient(8, 8), "в саду ☕ 1.png");
    std::filesystem::create_directory(mFolder / "mes dossiers");
    RunWell({"convert", "в саду ☕ 1.png", "mes dossiers/été.PNG"});
    ExpectSamePixels("в саду ☕ 1.png", "mes dossiers/été.PNG");
}

TEST_F(ConvertTest, TheInputMayBeTheOutput) {
    Save(MakeAlphaPattern(40, 30), "page.png");
    RunWell({"convert", "page.png", "page.png"});
    EXPECT_EQ(CompareImages(MakeAlphaPattern(40, 30), Load("page.png")).differingPixels, 0);
    EXPECT_THAT(List(), ElementsAre("page.png"));
}

TEST_F(ConvertTest, ContentDecidesTheInputsFormat) {
    Save(MakeGradient(8, 8), "real.webp");
    std::filesystem::rename(Path("real.webp"), Path("page.jpg"));
    EXPECT_THAT(RunWell({"convert", "page.jpg", "out.png"}), HasSubstr("page.jpg (WebP 8x8)"));
    EXPECT_EQ(CompareImages(MakeGradient(8, 8), Load("out.png")).differingPixels, 0);
}

} // namespace
} // namespace Moka::Testing
