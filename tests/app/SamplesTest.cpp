// The comparison of the demonstration sees every pixel.
#include "apps/samples/Compare.h"
#include "tests/app/ToolTest.h"

namespace Moka::Testing {
namespace {

using SamplesTest = ToolTest;

TEST_F(SamplesTest, ComparesEveryPixel) {
    Picture image = MakeGradient(30, 20);
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

} // namespace
} // namespace Moka::Testing
