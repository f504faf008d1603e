#include "moka/graphics/paint/MKPaint.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

using Color = Vector4<float>;

TEST(PaintTest, ColoursUnpackFromArgbAndThreeComponentsKeepTheAlpha) {
    MKPaint paint;
    paint.SetColor(static_cast<int>(0x80FF0000u));
    EXPECT_EQ(paint.GetColor(), Color(1, 0, 0, 128.0f / 255.0f));
    paint.SetColor(0x01020304);
    EXPECT_EQ(paint.GetColor(), Color(2.0f / 255, 3.0f / 255, 4.0f / 255, 1.0f / 255));
    paint.SetColor(0.2f, 0.3f, 0.4f);
    EXPECT_EQ(paint.GetColor(), Color(0.2f, 0.3f, 0.4f, 1.0f / 255));
    paint.SetAlpha(0.5f);
    EXPECT_EQ(paint.GetColor(), Color(0.2f, 0.3f, 0.4f, 0.5f));
    paint.SetColor(2.0f, -1.0f, 0.0f, 7.0f); // stored as given
    EXPECT_EQ(paint.GetColor(), Color(2, -1, 0, 7));
    EXPECT_EQ(paint.GetAlpha(), 7.0f);
}

} // namespace
} // namespace Moka::Testing
