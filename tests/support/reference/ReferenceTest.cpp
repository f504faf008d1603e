// How exact the reference is: a picture that it lets differ anywhere proves nothing.
#include "tests/support/reference/ReferenceCanvas.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

TEST(ReferenceCanvas, AllowsOneStepAndMoreOnlyWhereThePictureJumpsAtAPixelsCentre) {
    ReferenceBitmap bitmap(Picture(20, 20));
    ReferenceCanvas canvas(bitmap, {});
    Slack const& slack = canvas.GetSlack();
    MKPaint paint;
    canvas.DrawRect(5.5f, 5, 10, 10, &paint);
    EXPECT_EQ(slack.CountOver(1), 5);
    EXPECT_EQ(slack.Get(5, 7), 255);
    EXPECT_EQ(slack.Get(4, 7), 0);
    paint.SetAntiAliasing(true);
    canvas.DrawRect(2, 2, 12, 12, &paint);
    EXPECT_EQ(slack.CountOver(1), 0); // overwritten
    EXPECT_EQ(bitmap.image.GetColor(2, 2), (Color{255, 255, 255, 255}));
    EXPECT_EQ(bitmap.image.GetColor(1, 2), (Color{0, 0, 0, 0}));
    paint.SetXFermode(MKPaint::Src);
    canvas.DrawRect(4, 4, 8, 8, &paint);
    EXPECT_EQ(slack.CountOver(1), 20); // the ring where its coverage is 0
    EXPECT_EQ(slack.Get(3, 5), 255);
    // A thin layer of another colour hides a tenth of what was open.
    paint.SetXFermode(MKPaint::SrcOver);
    paint.SetAlpha(0.1f);
    canvas.DrawRect(2, 2, 12, 12, &paint);
    EXPECT_NEAR(slack.Get(3, 5), 0.9 * 255, 3);
}

} // namespace
} // namespace Moka::Testing
