#include "tests/app/ToolTest.h"

#include <chrono>
#include <csignal>
#include <thread>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;

using DrawTest = ToolTest;

TEST_F(DrawTest, DrawsWhatTheFileSaysInEveryFormat) {
    Save(MakeGradient(4, 4), "part.png");
    std::filesystem::create_directory(mFolder / "scenes");
    WriteFile("scenes/s.json", R"({"size": [30, 20], "background": "#102030",
        "bitmaps": {"part": {"file": "../part.png"}},
        "operations": [{"DrawBitmap": {"bitmap": "part", "x": 24, "y": 2}}]})");
    EXPECT_EQ(RunWell("draw scenes/s.json -o out.png"), "scenes/s.json -> out.png (30x20)\n");
    Picture const image = Load("out.png");
    ASSERT_EQ(image.width, 30);
    EXPECT_THAT(image.GetColor(9, 5), ElementsAre(0x10, 0x20, 0x30, 255));
    EXPECT_EQ(image.GetColor(25, 3), Load("part.png").GetColor(1, 1));
    for (std::string const name : {"out.webp", "out.mki"}) {
        RunWell("draw scenes/s.json -o " + name);
        ExpectSamePixels(image, name);
    }
    RunWell("draw scenes/s.json -o out.jpg");
    EXPECT_EQ(Load("out.jpg").width, 30);
}

// Whole: a fault in the document's text or in the reading of it shows as an error, one in the drawing at these pixels.
TEST_F(DrawTest, DrawsTheExampleOfTheFormatsDocument) {
    std::string const text = Testing::ReadFile(MOKA_SOURCE_FOLDER "/docs/scene-format.md");
    std::size_t const begin = text.find("```json\n") + 8;
    WriteFile("example.json", text.substr(begin, text.find("```", begin) - begin));
    RunWell("draw example.json -o example.png");
    Picture const image = Load("example.png");
    EXPECT_THAT(image.GetColor(4, 4), ElementsAre(0xF7, 0xF5, 0xF0, 255));    // the background
    EXPECT_THAT(image.GetColor(19, 120), ElementsAre(0x2A, 0x4A, 0x6A, 255)); // the frame of the card
    // A petal: 0x90 of 255 of its colour over the background.
    EXPECT_NEAR(image.GetColor(287, 120)[0], (0xC0 * 0x90 + 0xF7 * (255 - 0x90)) / 255.0, 1);
}

// 40 rectangles merge, whatever their matrices; the circle touches them, and the next rectangle the circle; the
// last one has a clip. Each run is one draw call.
TEST_F(DrawTest, StatisticsTellWhatMergedAndWhatDidNot) {
    WriteFile("s.json", R"({"size": [64, 64], "operations": [
        {"Group": {"repeat": {"count": 40, "translate": [1, 1]}, "operations": [{"DrawRect": {"rect": [0, 0, 9, 9]}}]}},
        {"DrawCircle": {"cx": 20, "cy": 20, "radius": 8}},
        {"DrawRect": {"rect": [20, 20, 40, 40]}},
        {"Group": {"clip": [10, 10, 20, 20], "operations": [{"DrawRect": {"rect": [20, 20, 40, 40]}}]}}]})");
    EXPECT_EQ(RunWell("draw s.json -o out.png --statistics"),
              "s.json -> out.png (64x64)\ndraws requested: 43\nruns: 4\ndraw calls: 4\nrecords: 43\n"
              "variants: 1\nend of run, program: 2\nend of run, scissor: 1\nend of run, other: 1\n");
}

// A mistake leaves the picture as it was; the next good version replaces it.
TEST_F(DrawTest, WatchingDrawsAgainWhenTheFileChanges) {
    auto const write = [this](std::string const& size) {
        WriteFile("next.json", "{\"size\": [" + size + "], \"operations\": []}");
        std::filesystem::rename(Path("next.json"), Path("s.json"));
    };
    auto const becomes = [this](int width) { return Soon([&] { return Load("out.png").width == width; }); };
    write("4, 3");
    Save(MakeGradient(2, 2), "out.png");
    MokaProcess process = Start("draw --watch s.json -o out.png");
    EXPECT_TRUE(becomes(4));
    write("\"wide\", 3");
    std::this_thread::sleep_for(std::chrono::milliseconds(600));
    EXPECT_EQ(Load("out.png").width, 4);
    write("5, 3");
    EXPECT_TRUE(becomes(5));
    process.Signal(SIGINT);
    ProcessResult const result = process.Wait();
    EXPECT_EQ(result.signal, SIGINT);
    EXPECT_EQ(result.err, "moka: s.json:1:11: size[0] must be a number, not \"wide\"\n");
    EXPECT_THAT(List(), ElementsAre("out.png", "s.json"));
}

} // namespace
} // namespace Moka::Testing
