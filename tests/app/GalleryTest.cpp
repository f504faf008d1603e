#include "scenes/Scene.h"
#include "tests/app/ToolTest.h"
#include "tests/support/ImageCompare.h"

#include <algorithm>
#include <sstream>

namespace Moka::Testing {
namespace {

using ::testing::AllOf;
using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::Not;
using ::testing::StartsWith;
using ::testing::UnorderedElementsAreArray;

using GalleryTest = ToolTest;

// Everything that a page refers to by this attribute.
std::vector<std::string> FindAll(std::string const& page, std::string const& attribute) {
    std::string const start = attribute + "=\"";
    std::vector<std::string> found;
    for (std::size_t at = page.find(start); at != std::string::npos; at = page.find(start, at)) {
        at += start.size();
        found.push_back(page.substr(at, page.find('"', at) - at));
    }
    return found;
}

TEST_F(GalleryTest, ListsTheScenesWithoutADriver) {
    std::istringstream lines(RunWell("gallery --list", kWithoutDriver));
    for (Scenes::Scene const& scene : Scenes::GetScenes()) {
        std::string line;
        std::getline(lines, line);
        EXPECT_THAT(line, AllOf(StartsWith(scene.name + " "), HasSubstr(scene.about)));
    }
    EXPECT_TRUE(List().empty());
}

TEST_F(GalleryTest, EverySceneIsAPictureOnThePageAndOnDisk) {
    std::string const printed = RunWell("gallery --out deep/gallery");
    EXPECT_THAT(printed, HasSubstr("deep/gallery/index.html\n"));
    std::string const page = ReadFile("deep/gallery/index.html");
    std::vector<std::string> expected;
    for (Scenes::Scene const& scene : Scenes::GetScenes()) {
        SCOPED_TRACE(scene.name);
        expected.push_back(scene.name + ".png");
        Picture const image = Load("deep/gallery/" + scene.name + ".png");
        ASSERT_EQ(std::pair(image.width, image.height), std::pair(scene.width, scene.height));
        if (scene.alsoInStrips) {
            expected.push_back(scene.name + "-in-strips.png");
            // All but what lies on an edge, and where a source's own strips meet.
            EXPECT_LT(
                CompareImages(image, Load("deep/gallery/" + scene.name + "-in-strips.png")).differingPixels,
                image.width * image.height / 20);
        }
        // Something was drawn.
        Color const first = image.GetColor(0, 0);
        EXPECT_FALSE(image == MakeChecker(image.width, image.height, 1, first, first));
        EXPECT_THAT(printed, HasSubstr("deep/gallery/" + scene.name + ".png\n"));
    }
    EXPECT_THAT(FindAll(page, "src"), UnorderedElementsAreArray(expected));

    // Nothing but the pictures and the page, and every link leads to a place on it.
    expected.push_back("index.html");
    EXPECT_THAT(List("deep/gallery"), UnorderedElementsAreArray(expected));
    std::vector<std::string> places = expected;
    for (std::string const& id : FindAll(page, "id")) places.push_back("#" + id);
    for (std::string const& link : FindAll(page, "href"))
        EXPECT_EQ(std::count(places.begin(), places.end(), link), 1) << link;
    EXPECT_THAT(FindAll(page, "alt"), Not(Contains("")));
    EXPECT_THAT(page, Not(HasSubstr("http")));
    // 32 rectangles in a row.
    EXPECT_THAT(page, HasSubstr("draws requested: 32, draw calls: 1<"));
    EXPECT_THAT(page, HasSubstr(">ReverseDifference</span>"));
    EXPECT_THAT(page, HasSubstr("{&quot;xfermode&quot;: &quot;Add&quot;}"));
    EXPECT_THAT(page, Not(HasSubstr("{{")));
}

// The screen's rows lie the other way round on the GPU, and its clips are counted from its lower border.
TEST_F(GalleryTest, TheScreenLooksLikeATexture) {
    RunWell("gallery --mki --out . --only screen clips");
    EXPECT_THAT(List(), ElementsAre("clips-in-strips.mki", "clips.mki", "screen.mki"));
    RunWell("draw " MOKA_SOURCE_FOLDER "/scenes/data/screen.json -o texture.mki");
    EXPECT_LE(CompareImages(Load("screen.mki"), Load("texture.mki")).differingPixels, 12);
}

} // namespace
} // namespace Moka::Testing
