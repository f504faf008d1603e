// Strokes against the maximum over their segments of the clamped distance, computed in double precision for each
// pixel: turns, crossings, widths and zooms; and in strips, under clips, appended to piece by piece.
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "tests/pixel/canvas/CanvasDrawing.h"
#include "tests/support/reference/Plane.h"

#include <cmath>
#include <random>

namespace Moka::Testing {
namespace {

using Points = std::vector<MKStrokePoint>;
using StrokePtr = RefPtr<MKStrokeDrawable>;

constexpr int kWidth = 120;
constexpr int kHeight = 100;
// Points that are left out and rounding, of 255. Where several thin parts of a stroke meet, single pixels may be
// farther off.
constexpr int kClose = 14;
constexpr int kFar = 24;

// A pixel's centre on the canvas, and how long the pixel is there along the target's axes.
struct Pixel {
    Pixel(Transform const& transform, double x, double y) : center(*transform.Unmap({x, y})) {
        constexpr double kStep = 1e-4;
        PointD const beside = *transform.Unmap({x + kStep, y});
        PointD const below = *transform.Unmap({x, y + kStep});
        right = {(beside.x - center.x) / kStep, (beside.y - center.y) / kStep};
        down = {(below.x - center.x) / kStep, (below.y - center.y) / kStep};
    }

    PointD center;
    PointD right;
    PointD down;
};

double Cover(MKStrokePoint const& a, MKStrokePoint const& b, Pixel const& pixel) {
    double const dx = double{b.x} - a.x;
    double const dy = double{b.y} - a.y;
    double const square = dx * dx + dy * dy;
    double const along = (pixel.center.x - a.x) * dx + (pixel.center.y - a.y) * dy;
    double const length = std::sqrt(square);
    double const growth = (double{b.width} - a.width) * 0.5;
    double t = growth > 0 ? 1 : 0;
    if (std::fabs(growth) < length) {
        // Edges lean by this angle from the line; the disc of the nearest one is found across them.
        double const lean = std::asin(growth / length);
        double const across = std::fabs((pixel.center.x - a.x) * dy - (pixel.center.y - a.y) * dx) / length;
        t = std::clamp((along / length + across * std::tan(lean)) / length, 0.0, 1.0);
    }
    double const awayX = pixel.center.x - a.x - t * dx;
    double const awayY = pixel.center.y - a.y - t * dy;
    double const distance = std::sqrt(awayX * awayX + awayY * awayY);
    double const width = double{a.width} + t * (double{b.width} - a.width);
    // So much the distance grows over a pixel of the target.
    double const unit = distance > 0 ? 1 / distance : 0;
    double const x = (pixel.right.x * awayX + pixel.right.y * awayY) * unit;
    double const y = (pixel.down.x * awayX + pixel.down.y * awayY) * unit;
    double const step = distance > 0 ? std::sqrt(x * x + y * y) : std::hypot(pixel.right.x, pixel.right.y);
    return std::clamp(0.5 + (std::max(width, step) * 0.5 - distance) / step, 0.0, 1.0) *
           std::min(1.0, width / step);
}

Picture DrawReferenceStroke(Points const& points, Matrix3f const& matrix) {
    Picture picture(kWidth, kHeight);
    Transform const transform(matrix);
    for (int y = 0; y < kHeight; ++y) {
        for (int x = 0; x < kWidth; ++x) {
            Pixel const pixel(transform, x + 0.5, y + 0.5);
            double most = 0;
            for (std::size_t i = 0; i < points.size() && most < 1; ++i) {
                most = std::max(most, Cover(points[i], points[std::min(i + 1, points.size() - 1)], pixel));
            }
            auto const level = static_cast<unsigned char>(std::lround(most * 255));
            picture.SetColor(x, y, {level, level, level, level});
        }
    }
    return picture;
}

StrokePtr MakeStroke(Scenes::SceneStage& stage, Points const& points) {
    auto stroke = StrokePtr::Adopt(new MKStrokeDrawable(stage.GetQueue()));
    stroke->Append(points.data(), static_cast<int>(points.size()));
    return stroke;
}

Drawing OneStroke(Points const& points, Matrix3f const& matrix, MKPaint const& paint = {}) {
    return {Picture(kWidth, kHeight), [=](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                canvas.SetMatrix(matrix);
                canvas.Draw(MakeStroke(stage, points).Get(), &paint);
            }};
}

// Points of width 1 at most.
struct Shape {
    char const* name;
    Points points;

    Points Widened(float width) const {
        Points widened = points;
        for (MKStrokePoint& point : widened) point.width *= width;
        return widened;
    }
};

// Crosses itself again and again, with points close to each other.
Shape MakeLoops() {
    Shape loops{"loops", {}};
    for (int i = 0; i <= 200; ++i) {
        float const t = static_cast<float>(i) / 200;
        loops.points.push_back({28 + 64 * t + 20 * std::cos(t * 31), 50 + 28 * std::sin(t * 31), 1});
    }
    return loops;
}

std::vector<Shape> MakeShapes() {
    Shape wave{"wave", {}}, scribble{"scribble", {}};
    for (int i = 0; i <= 80; ++i) {
        float const t = static_cast<float>(i) / 80;
        wave.points.push_back({8 + 104 * t, 50 + 35 * std::sin(t * 9), 0.6f + 0.4f * std::cos(t * 7)});
    }
    std::mt19937 random(7);
    std::uniform_real_distribution<float> x(8, 112), y(8, 92);
    for (int i = 0; i < 30; ++i) scribble.points.push_back({x(random), y(random), 1});
    return {{"straight", {{14.3f, 20.7f, 1}, {100.2f, 76.1f, 1}}},
            {"sharp", {{12, 45, 1}, {105, 38, 1}, {15, 50, 1}, {100, 88, 1}, {99, 12, 1}}},
            {"taper", {{20, 20, 0}, {60, 78, 1}, {108, 26, 0.25f}}},
            {"dot", {{60.5f, 46.25f, 1}, {60.5f, 46.25f, 1}}},
            MakeLoops(),
            wave,
            scribble};
}

class StrokeTest : public CanvasDrawing {
protected:
    void ExpectStroke(Points const& points, Matrix3f const& matrix, std::string const& what) {
        Picture const expected = DrawReferenceStroke(points, matrix);
        Picture const actual = Draw(OneStroke(points, matrix));
        int far = 0;
        int worst = 0;
        for (int y = 0; y < kHeight; ++y) {
            for (int x = 0; x < kWidth; ++x) {
                int const error = std::abs(int{expected.GetColor(x, y)[3]} - int{actual.GetColor(x, y)[3]});
                worst = std::max(worst, error);
                if (error > kClose) ++far;
            }
        }
        RecordProperty(what, worst);
        if (far > kWidth * kHeight / 2000 || worst > kFar) {
            Slack const slack(kWidth, kHeight, kClose);
            ExpectSame(expected, actual, what, &slack);
        }
    }
};

TEST_F(StrokeTest, CoverageIsTheMaximumOfTheSegments) {
    for (Shape const& shape : MakeShapes()) {
        for (float const width : {0.2f, 1.0f, 3.0f, 12.0f, 60.0f, 200.0f}) {
            ExpectStroke(shape.Widened(width), Matrix3f(),
                         shape.name + std::string(" ") + std::to_string(width));
        }
    }
}

TEST_F(StrokeTest, EdgesAreOneDevicePixelUnderAnyMatrix) {
    Matrix3f turned;
    turned.setRotate(33, 60, 50);
    Matrix3f const matrices[] = {
        turned,
        Matrix3f(0.1f, 0, 0, 0, 0.1f, 0, 54, 45, 1),
        Matrix3f(0.37f, 0, 0, 0, 0.37f, 0, 30.3f, 20.7f, 1),
        Matrix3f(8, 0, 0, 0, 8, 0, -440, -350, 1),
        Matrix3f(1.4f, 0.3f, 0, -0.6f, 0.8f, 0, 20, -4, 1),
        Matrix3f(3, 0, 0, 0, 0.25f, 0, -110, 40, 1),
        Matrix3f(1.1f, 0.1f, 0.002f, -0.2f, 0.9f, 0.001f, 8, 4, 1),
    };
    int number = 0;
    for (Matrix3f const& matrix : matrices) {
        for (Shape const& shape : MakeShapes()) {
            // Each shape and each matrix with each width.
            constexpr float kWidths[] = {0.5f, 4, 40};
            float const width = kWidths[number++ % 3];
            ExpectStroke(shape.Widened(width), matrix,
                         shape.name + std::string(" under matrix ") + std::to_string(&matrix - matrices));
        }
    }
}

TEST_F(StrokeTest, StripsCutWithoutATraceAndStencilsNotAtAll) {
    auto const draw = [](bool isStenciled) {
        return [isStenciled](IMKCanvas& canvas, Scenes::SceneStage& stage) {
            MKPaint paint;
            paint.SetColor(0.2f, 0.4f, 0.9f, 0.5f);
            if (isStenciled) {
                canvas.PreRotate(20, 60, 50);
                canvas.SetClipRect(20, 15, 70, 60, IMKCanvasBase::Intersect);
                canvas.SetMatrix(Matrix3f());
            }
            canvas.PreScale(0.37f, 1.1f);
            canvas.Draw(MakeStroke(stage, MakeLoops().Widened(12)).Get(), &paint);
        };
    };
    Picture const start = MakeBackdrop(40, 110);
    Picture const plain = Draw({start, draw(false)});
    ExpectSame(plain, Draw({start, draw(true)}), "stroke under a rotated clip");
    UseLargestSide(40); // three strips
    Slack const slack(40, 110, 1);
    ExpectSame(plain, Draw({start, draw(false)}), "stroke in strips", &slack);
}

TEST_F(StrokeTest, AppendingPieceByPieceDrawsTheSameStroke) {
    MKPaint half; // so that what is drawn twice shows
    half.SetAlpha(0.5f);
    for (Shape const& shape : MakeShapes()) {
        Points const points = shape.Widened(14);
        Picture const whole = Draw(OneStroke(points, Matrix3f(), half));
        Picture const pieces =
            Draw({Picture(kWidth, kHeight), [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                      auto const stroke = MakeStroke(stage, {{1, 1, 30}});
                      canvas.Draw(stroke.Get(), &half);
                      stroke->Clear();
                      int left = static_cast<int>(points.size());
                      for (MKStrokePoint const& point : points) {
                          stroke->Append(&point, 1);
                          if (--left % 7 != 0) continue;
                          // At two scales in turn, so that both meshes grow.
                          canvas.ClearAll(0);
                          canvas.PreScale(0.3f, 0.3f);
                          canvas.Draw(stroke.Get(), &half);
                          canvas.SetMatrix(Matrix3f());
                          canvas.ClearAll(0);
                          canvas.Draw(stroke.Get(), &half);
                      }
                  }});
        Slack const slack(kWidth, kHeight, 1);
        ExpectSame(whole, pieces, std::string("piecewise ") + shape.name, &slack);
    }
}

TEST_F(StrokeTest, BadPointsAreLeftOutWithOneLine) {
    float const nan = std::nanf("");
    float const infinite = HUGE_VALF;
    Points const good{{20, 30, 6}, {90, 70, 6}};
    Picture const expected = Draw(OneStroke(good, Matrix3f()));
    Points const bad{good[0], {nan, 1, 6}, {1, infinite, 6}, {50, 1e9f, 6}, {50, 5, nan}, good[1]};
    ExpectSame(expected, Draw(OneStroke(bad, Matrix3f())), "bad points");
    EXPECT_EQ(log.GetTexts(ANDROID_LOG_WARN).size(), 1u);
    Picture const empty(kWidth, kHeight);
    ExpectSame(empty, Draw(OneStroke({}, Matrix3f())), "no point");
    ExpectSame(empty, Draw(OneStroke({{20, 20, -5}, {90, 70, 0}}, Matrix3f())), "negative width");
    ExpectSame(empty, Draw(OneStroke(good, Matrix3f(0.0f))), "no inverse");
    Picture const full = Draw(OneStroke({{60, 50, 3e38f}, {61, 50, 3e38f}}, Matrix3f()));
    EXPECT_EQ(full.GetColor(3, 97)[3], 255);
    auto const stroke = StrokePtr::Adopt(new MKStrokeDrawable(&GetRenderThread()));
    EXPECT_TRUE(stroke->GetBounds().IsEmpty());
    stroke->Append(bad.data(), static_cast<int>(bad.size()));
    stroke->Append(nullptr, 3);
    stroke->Append(good.data(), -1);
    EXPECT_EQ(stroke->GetBounds(), RectF(17, 27, 93, 73));
    stroke->Clear();
    EXPECT_TRUE(stroke->GetBounds().IsEmpty());
    MKStrokeDrawable* const orphan = new MKStrokeDrawable(nullptr);
    orphan->Append(good.data(), 2);
    orphan->Clear();
    orphan->Unref();
}

TEST_F(StrokeTest, ManyPointsAreOneStroke) {
    Points points;
    for (int i = 0; i < 100'000; ++i) {
        float const t = static_cast<float>(i) * 0.01f;
        points.push_back({60 + 50 * std::sin(t), 50 + 40 * std::sin(t * 1.37f), 0.5f});
    }
    Picture const picture = Draw(OneStroke(points, Matrix3f()));
    EXPECT_EQ(picture.GetColor(2, 50)[3], 0);
    EXPECT_GT(picture.GetColor(60, 50)[3], 90);
}

} // namespace
} // namespace Moka::Testing
