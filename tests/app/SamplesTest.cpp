// Parts of programs that no run shows: the comparison of the demonstration, and which of several errors is told.
#include "apps/moka/LogCollector.h"
#include "apps/samples/Compare.h"
#include "moka/base/log/AndroidLog.h"
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

TEST_F(SamplesTest, OfTwoErrorsTheFirstIsTheCause) {
    Tool::LogCollector const log(false);
    for (char const* const text : {"the cause", "a consequence"})
        __android_log_print(ANDROID_LOG_ERROR, "test", "%s", text);
    EXPECT_EQ(log.GetError(), "the cause");
}

} // namespace
} // namespace Moka::Testing
