// The reference itself, at points whose values were worked out by hand; else it is no oracle.
#include "tests/support/reference/LineCoverage.h"
#include "tests/support/reference/ReferenceCanvas.h"
#include "tests/support/reference/RoundRectCoverage.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

constexpr double kNone = -1;

double At(Shape const& shape, double x, double y) {
    Coverage const c = shape.at({x, y});
    EXPECT_FALSE(c && c->vague) << x << ", " << y;
    return c ? c->coverage : kNone;
}

double At(std::vector<Shape> const& shapes, double x, double y) {
    double found = kNone;
    for (Shape const& shape : shapes) {
        double const c = At(shape, x, y);
        EXPECT_TRUE(c == kNone || found == kNone) << "two pieces at " << x << ", " << y;
        if (c != kNone) found = c;
    }
    return found;
}

TEST(ReferenceCoverage, ARectanglesRampsMeetAtMitredCorners) {
    Shape const fill = FilledRect({10.25f, 20.5f, 30, 40}, true);
    EXPECT_DOUBLE_EQ(At(fill, 10.5, 30.5), 0.75);
    EXPECT_DOUBLE_EQ(At(fill, 9.5, 30.5), kNone);
    EXPECT_DOUBLE_EQ(At(fill, 10.5, 20.5), 0.5); // the minimum, not 0.375
    EXPECT_DOUBLE_EQ(At(fill, 29.5, 39.5), 1);
    Shape const stroke = StrokedRect({10, 10, 30, 30}, 3, true);
    EXPECT_DOUBLE_EQ(At(stroke, 8.25, 20), 0.25);
    EXPECT_DOUBLE_EQ(At(stroke, 9, 20), 1);
    EXPECT_DOUBLE_EQ(At(stroke, 11.75, 20), 0.25);
    EXPECT_DOUBLE_EQ(At(stroke, 12.25, 20), kNone);
    EXPECT_DOUBLE_EQ(At(StrokedRect({10, 10, 30, 30}, 3, false), 11.75, 20), kNone);
    EXPECT_TRUE(StrokedRect({10, 10, 12, 30}, 3, true).at({11, 20})->vague);
}

TEST(ReferenceCoverage, CirclesAndCornersRampAcrossTheirRadius) {
    Shape const fill = FilledCircle({0, 0}, 5);
    EXPECT_DOUBLE_EQ(At(fill, 3, 4), 0.5);
    EXPECT_DOUBLE_EQ(At(fill, 5.5, 0), 0);
    EXPECT_DOUBLE_EQ(At(fill, 5.51, 0), kNone);
    Shape const stroke = StrokedCircle({0, 0}, 5, 2);
    EXPECT_DOUBLE_EQ(At(stroke, 0, 5), 1);
    EXPECT_DOUBLE_EQ(At(stroke, 0, 6.25), 0.25);
    EXPECT_DOUBLE_EQ(At(stroke, 0, 3.75), 0.25);
    // Corner centre (10, 10). On the y axis of a corner twice as high as wide the ramp is the x axis's.
    auto const round = FilledRoundRect({0, 0, 40, 60}, 10, 10);
    EXPECT_NEAR(At(round, 10 - 6, 10 - 8), 1 - (100 / 90.25 - 1) / (110.25 / 90.25 - 1), 1e-9);
    EXPECT_DOUBLE_EQ(At(round, 20, 0), 0.5);
    EXPECT_DOUBLE_EQ(At(round, 20, 30), 1);
    auto const ring = StrokedRoundRect({0, 0, 40, 60}, 10, 10, 4);
    EXPECT_DOUBLE_EQ(At(ring, 2.25, 30), 0.25);
    EXPECT_DOUBLE_EQ(At(ring, 20, 30), kNone);
    EXPECT_NEAR(At(ring, 10 - 0.6 * 8, 10 - 0.8 * 8), (64 / 56.25 - 1) / (72.25 / 56.25 - 1), 1e-6);
}

TEST(ReferenceCoverage, LinesEndInTheirCapsAndDashes) {
    MKPaint paint;
    paint.SetLineWidth(4);
    auto const at = [&](double x, double y) { return At(Line({0, 0}, {10, 0}, paint), x, y); };
    EXPECT_DOUBLE_EQ(at(-0.25, 0), 0.25);
    EXPECT_DOUBLE_EQ(at(0.25, 0), 0.75);
    EXPECT_DOUBLE_EQ(at(5, 2.25), 0.25);
    paint.SetLineCapType(MKPaint::Square);
    EXPECT_DOUBLE_EQ(at(12.25, 0), 0.25);
    EXPECT_DOUBLE_EQ(at(11.75, 2.25), 0.25);
    paint.SetLineCapType(MKPaint::Round);
    EXPECT_DOUBLE_EQ(at(11.2, 1.6), 0.5);
    EXPECT_DOUBLE_EQ(at(12.4, 2.4), 0);
    paint.SetDashedLinePattern(Vector2<float>(4, 2));
    paint.SetLineCapType(MKPaint::Butt);
    EXPECT_DOUBLE_EQ(at(3.75, 0), 0.75);
    EXPECT_DOUBLE_EQ(at(4.25, 0), 0.25);
    EXPECT_DOUBLE_EQ(at(5, 0), 0);
    EXPECT_DOUBLE_EQ(at(5.75, 0), 0.25);
    EXPECT_DOUBLE_EQ(at(10.25, 0), 0.25); // the line ends with a dash
}

TEST(ReferenceBlend, FollowsTheEquationsOnBytes) {
    Rgba const s{0.4, 0.22, 0, 0.5};
    Rgba const d{0.1, 0.6, 0.3, 0.75};
    auto const blend = [&](int mode) { return ToBytes(Blend(mode, s, d)); };
    EXPECT_EQ(blend(MKPaint::SrcOver), (Color{115, 133, 38, 223}));
    EXPECT_EQ(blend(MKPaint::DstOver), (Color{51, 167, 77, 255}));
    EXPECT_EQ(blend(MKPaint::SrcAtop), (Color{89, 119, 38, 191}));
    EXPECT_EQ(blend(MKPaint::SrcNonPremultiplied), (Color{51, 28, 0, 128}));
    EXPECT_EQ(blend(99), blend(MKPaint::SrcOver));
    // By colours of their own: source (0.8, 0.44, 0), destination (0.1333, 0.8, 0.4).
    EXPECT_EQ(ToBytes(DarkenOrLighten(true, s, d)), (Color{51, 133, 38, 223}));
}

TEST(ReferenceClipSet, CutsStraightClipsTowardsZeroAndOthersAtPixelCentres) {
    ClipEntry const a{0, 0, 10, 4, IMKCanvasBase::Difference, Matrix3f::translateMatrix(2.75f, 8.25f)};
    ClipSet const straight({a}, 20);
    auto const has = [](ClipSet const& set, int x, int y) { return set.Contains(x, y, {x + 0.5, y + 0.5}); };
    EXPECT_TRUE(has(straight, 2, 9) && has(straight, 11, 12)); // alone, whatever it asks for
    EXPECT_FALSE(has(straight, 2, 8) || has(straight, 2, 13) || has(straight, 12, 9) || has(straight, 1, 9));
    ClipEntry const b{0, 0, 10, 10, IMKCanvasBase::Union, Matrix3f()};
    ClipEntry const c{5, 5, 10, 10, IMKCanvasBase::Xor, Matrix3f()};
    ClipEntry const r{2, 2, 4, 4, IMKCanvasBase::Replace, Matrix3f::rotateMatrix(0.001f)};
    ClipSet const points({a, r, b, c}, 20);
    EXPECT_TRUE(has(points, 1, 1) && has(points, 14, 14));
    EXPECT_FALSE(has(points, 6, 6) || has(points, 17, 17));
    EXPECT_FALSE(has(ClipSet({a, b, {0, 0, 0, 0, IMKCanvasBase::Intersect, Matrix3f(0.0f)}}, 20), 5, 5));
}

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
