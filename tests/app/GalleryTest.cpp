#include "scenes/Scene.h"
#include "tests/app/ToolTest.h"
#include "tests/support/ImageCompare.h"

#include <set>
#include <sstream>

namespace Moka::Testing {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::Not;

class GalleryTest : public ToolTest {
protected:
    // Everything that a page refers to by this attribute.
    static std::multiset<std::string> FindAll(std::string const& page, std::string const& attribute) {
        std::string const start = attribute + "=\"";
        std::multiset<std::string> found;
        for (std::size_t at = page.find(start); at != std::string::npos; at = page.find(start, at)) {
            at += start.size();
            found.insert(page.substr(at, page.find('"', at) - at));
        }
        return found;
    }
};

TEST_F(GalleryTest, ListsTheScenesWithoutADriver) {
    ProcessOptions options;
    options.environment = {"__EGL_VENDOR_LIBRARY_DIRS=/nonexistent"};
    ProcessResult const result = Run({"gallery", "--list"}, options);
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    std::istringstream lines(result.out);
    for (Scenes::Scene const& scene : Scenes::GetScenes()) {
        std::string line;
        std::getline(lines, line);
        EXPECT_EQ(line.compare(0, scene.name.size() + 1, scene.name + " "), 0) << line;
        EXPECT_THAT(line, HasSubstr(scene.about));
    }
    EXPECT_TRUE(List().empty());
}

TEST_F(GalleryTest, EverySceneIsAPictureOnThePageAndOnDisk) {
    std::string const printed = RunWell({"gallery", "--out", "deep/gallery"});
    EXPECT_THAT(printed, HasSubstr("deep/gallery/index.html\n"));
    std::string const page = ReadFile("deep/gallery/index.html");
    std::multiset<std::string> const shown = FindAll(page, "src");
    std::set<std::string> expected;
    for (Scenes::Scene const& scene : Scenes::GetScenes()) {
        SCOPED_TRACE(scene.name);
        expected.insert(scene.name + ".png");
        if (scene.alsoInStrips) expected.insert(scene.name + "-in-strips.png");
        TestImage const image = Load("deep/gallery/" + scene.name + ".png");
        EXPECT_EQ(image.width, scene.width);
        EXPECT_EQ(image.height, scene.height);
        // Something was drawn.
        std::set<std::string> colors;
        for (std::size_t i = 0; i < image.pixels.size(); i += 4)
            colors.emplace(image.pixels.data() + i, image.pixels.data() + i + 4);
        EXPECT_GE(colors.size(), 3u);
        EXPECT_THAT(printed, HasSubstr("deep/gallery/" + scene.name + ".png\n"));
    }
    EXPECT_EQ(std::set<std::string>(shown.begin(), shown.end()), expected);
    EXPECT_EQ(shown.size(), expected.size());

    // Nothing but the pictures and the page, and every link leads to a place on it.
    expected.insert("index.html");
    std::vector<std::string> const files = List("deep/gallery");
    EXPECT_EQ(std::set<std::string>(files.begin(), files.end()), expected);
    std::multiset<std::string> const places = FindAll(page, "id");
    for (std::string const& link : FindAll(page, "href")) {
        ASSERT_EQ(link[0], '#');
        EXPECT_EQ(places.count(link.substr(1)), 1u) << link;
    }
    EXPECT_EQ(FindAll(page, "alt").count(""), 0u);
    EXPECT_THAT(page, Not(HasSubstr("http")));
}

TEST_F(GalleryTest, ThreeStripsMakeNoDifference) {
    std::vector<std::string> arguments{"gallery", "--out", ".", "--only"};
    std::vector<std::string> names;
    for (Scenes::Scene const& scene : Scenes::GetScenes()) {
        if (scene.alsoInStrips) names.push_back(scene.name);
    }
    arguments.insert(arguments.end(), names.begin(), names.end());
    RunWell(arguments);
    EXPECT_EQ(List().size(), names.size() * 2 + 1);
    for (std::string const& name : names) {
        TestImage const whole = Load(name + ".png");
        TestImage const strips = Load(name + "-in-strips.png");
        // Where a source's strips meet, what lies between their rows is no longer mixed.
        Slack slack(whole.width, whole.height);
        for (int y = 0; y < whole.height; ++y)
            for (int x = 0; x < whole.width; ++x) slack.Set(x, y, 2);
        // A pixel whose centre lies on an edge goes one way or the other: strips round in coordinates of
        // their own.
        EXPECT_LE(CompareImages(whole, strips, &slack).differingPixels, 3) << name;
    }
}

// The screen's rows lie the other way round on the GPU, and its clips are counted from its lower border.
TEST_F(GalleryTest, TheScreenLooksLikeATexture) {
    RunWell({"gallery", "--out", ".", "--only", "screen"});
    RunWell({"draw", std::string(MOKA_SOURCE_FOLDER) + "/scenes/data/screen.json", "-o", "texture.png"});
    TestImage const screen = Load("screen.png");
    TestImage const texture = Load("texture.png");
    EXPECT_LE(CompareImages(screen, texture).differingPixels, 12);
}

// The panels are painted by the canvas, under and over the ink; the ink is cut by clips alone.
TEST_F(GalleryTest, InkEndsAtItsClip) {
    RunWell({"gallery", "--out", ".", "--only", "pen-stroke"});
    TestImage const image = Load("pen-stroke.png");
    ASSERT_EQ(image.width, 480);
    auto const isInk = [&](int x, int y) { return image.GetColor(x, y) == Color{42, 74, 106, 255}; };
    auto const isPaper = [&](int x, int y) { return image.GetColor(x, y) == Color{247, 245, 240, 255}; };
    int inkInside = 0;
    int notPaperOutside = 0;
    for (int y = 0; y < image.height; ++y) {
        for (int x = 170; x < image.width; ++x) {
            bool const isFirst = x >= 190 && x < 290 && y >= 40 && y < 90;
            bool const isSecond = x >= 360 && x < 440 && y >= 25 && y < 115;
            inkInside += (isFirst || isSecond) && isInk(x, y);
            // Half of a frame lies outside.
            bool const isNear =
                (x >= 188 && x < 292 && y >= 38 && y < 92) || (x >= 358 && x < 442 && y >= 23 && y < 117);
            notPaperOutside += !isNear && !isPaper(x, y);
        }
    }
    EXPECT_GT(inkInside, 1000);
    EXPECT_EQ(notPaperOutside, 0);
}

TEST_F(GalleryTest, WrongUsageAndFoldersThatCannotBeMade) {
    WriteFile("file", "no folder");
    struct Case {
        std::vector<std::string> arguments;
        int status;
        char const* part;
    };
    for (Case const& wrong : {Case{{"gallery"}, 2, "--out"},
                              Case{{"gallery", "--out", "g", "--only", "nonesuch"}, 2, "no scene 'nonesuch'"},
                              Case{{"gallery", "--out", ""}, 2, "empty"},
                              Case{{"gallery", "--out", "file", "--only", "clips"}, 1, "folder file"},
                              Case{{"gallery", "--out", "file/g", "--only", "clips"}, 1, "folder file/g"}}) {
        ProcessResult const result = Run(wrong.arguments);
        SCOPED_TRACE(result.err);
        EXPECT_EQ(result.status, wrong.status);
        EXPECT_EQ(result.CountErrorLines(), 1);
        EXPECT_THAT(result.err, HasSubstr(wrong.part));
        EXPECT_EQ(result.out, "");
    }
    EXPECT_THAT(List(), ElementsAre("file"));
}

} // namespace
} // namespace Moka::Testing
