// What the demonstration relies on: its pictures keep to their borders, and its comparison sees every pixel.
#include "apps/samples/Compare.h"
#include "apps/samples/Picture.h"
#include "tests/app/ToolTest.h"

namespace Moka::Testing {
namespace {

using SamplesTest = ToolTest;

TEST_F(SamplesTest, ComparesEveryPixel) {
    TestImage image = MakeGradient(30, 20);
    Save(image, "a.png");
    Save(image, "same.mki");
    image.SetColor(0, 0, {9, 9, 9, 255});
    image.SetColor(28, 19, {9, 9, 9, 255});
    Save(image, "b.png");
    Save(MakeGradient(20, 30), "turned.png");
    EXPECT_EQ(Samples::Compare(Path("a.png"), Path("same.mki")).differing, 0);
    EXPECT_EQ(Samples::Compare(Path("a.png"), Path("b.png")).differing, 2);
    EXPECT_FALSE(Samples::Compare(Path("a.png"), Path("turned.png")).isSameSize);
    EXPECT_FALSE(Samples::Compare(Path("a.png"), Path("none.png")).isRead);
}

TEST_F(SamplesTest, PaintsWithinTheBorders) {
    Samples::Picture picture(4, 3);
    for (int const y : {-1, 0, 1, 2, 3}) {
        picture.Blend(-1, y, {1, 1, 1, 1}, 1);
        picture.Blend(4, y, {1, 1, 1, 1}, 1);
    }
    picture.Blend(1, 1, {1, 0, 0, 0.5f}, 1);
    ASSERT_TRUE(picture.Save(Path("out.mki"), 100));
    TestImage expected(4, 3);
    expected.SetColor(1, 1, {128, 0, 0, 128});
    ExpectSamePixels(expected, "out.mki");
}

} // namespace
} // namespace Moka::Testing
