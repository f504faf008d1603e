#include "tests/app/ToolTest.h"

namespace Moka::Testing {
namespace {

using ::testing::AllOf;
using ::testing::HasSubstr;

using ConvertTest = ToolTest;

// What the tool writes is what saving the decoded input writes, so the way through the GPU changed nothing, and the
// encoder got the quality it should.
TEST_F(ConvertTest, EveryFormatBecomesEveryFormat) {
    for (std::string const from : {"png", "jpg", "webp", "mki"}) {
        Save(MakeAlphaPattern(61, 47), "in." + from, 90);
        for (std::string const to : {"png", "jpg", "webp", "mki"}) {
            std::string const output = from + "-to." + to;
            RunWell("convert in." + from + " " + output);
            Save(Load("in." + from), "expected-" + output, to == "jpg" ? 90 : 100);
            EXPECT_TRUE(ReadFile(output) == ReadFile("expected-" + output)) << output;
            if (to != "jpg") ExpectSamePixels(Load("in." + from), output);
        }
    }
}

TEST_F(ConvertTest, ADashIsStandardInputAndOutput) {
    Picture const image = MakeAlphaPattern(61, 47);
    Save(image, "in.webp");
    WriteFile("out.png", RunWell("convert - - < in.webp"));
    EXPECT_EQ(ReadFile("out.png").substr(1, 3), "PNG");
    ExpectSamePixels(image, "out.png");
    EXPECT_EQ(RunWell("convert - - --to mki < in.webp").substr(0, 4), "MKI1");
    EXPECT_THAT(RunWell("convert - out.mki < in.webp"), HasSubstr("standard input (WebP 61x47) -> "));
    ExpectSamePixels(image, "out.mki");
    EXPECT_THAT(RunWell("info - < in.webp"), HasSubstr("standard input: WebP, 61x47, alpha, "));
    WriteFile("scene.json", R"({"size": [7, 5], "background": "#102030", "operations": []})");
    WriteFile("drawn.webp", RunWell("draw - -o - --to webp < scene.json"));
    EXPECT_EQ(Load("drawn.webp").width, 7);
}

TEST_F(ConvertTest, TellsWhatItDidUnlessQuiet) {
    Save(MakeGradient(30, 20), "in.png");
    std::string const told = RunWell("convert in.png out.mki");
    EXPECT_THAT(told, HasSubstr("in.png (PNG 30x20) -> out.mki (mki, "));
    EXPECT_THAT(told, HasSubstr(std::to_string(ReadFile("out.mki").size()) + " bytes), 1 strip, "));
    EXPECT_THAT(RunWell("convert in.png out.mki --size 15x10"), HasSubstr("(mki 15x10, "));
    EXPECT_EQ(RunWell("convert in.png out.mki -q"), "");
    Picture const tall = MakeGradient(64, 321);
    Save(tall, "tall.webp");
    std::filesystem::rename(Path("tall.webp"), Path("tall.jpg")); // content decides
    EXPECT_THAT(RunWell("convert tall.jpg tall.mki --max-texture 64"),
                AllOf(HasSubstr("tall.jpg (WebP 64x321)"), HasSubstr("6 strips")));
    ExpectSamePixels(tall, "tall.mki");
}

} // namespace
} // namespace Moka::Testing
