// Strokes against the maximum over their segments of the clamped distance, computed in double precision for each
// pixel: turns, crossings, widths and zooms; and in strips, under clips, merged, appended to piece by piece.
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/pixel/canvas/CanvasDrawing.h"

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
constexpr int kFar = 40;

struct Place {
    double x;
    double y;
};

// The canvas's pixels at the target's.
class Inverse {
public:
    explicit Inverse(Matrix3f const& matrix) {
        auto const at = [&](int row, int column) { return double{matrix(row % 3, column % 3)}; };
        for (int i = 0; i < 3; ++i) {
            for (int j = 0; j < 3; ++j) {
                mValues[i][j] = at(j + 1, i + 1) * at(j + 2, i + 2) - at(j + 1, i + 2) * at(j + 2, i + 1);
            }
        }
    }

    Place Find(double x, double y) const {
        auto const at = [&](int row) { return mValues[row][0] * x + mValues[row][1] * y + mValues[row][2]; };
        return {at(0) / at(2), at(1) / at(2)};
    }

private:
    double mValues[3][3]; // times the determinant
};

// A pixel's centre on the canvas, and how long the pixel is there along the target's axes.
struct Pixel {
    Pixel(Inverse const& inverse, double x, double y) : center(inverse.Find(x, y)) {
        constexpr double kStep = 1e-4;
        Place const beside = inverse.Find(x + kStep, y);
        Place const below = inverse.Find(x, y + kStep);
        right = {(beside.x - center.x) / kStep, (beside.y - center.y) / kStep};
        down = {(below.x - center.x) / kStep, (below.y - center.y) / kStep};
    }

    Place center;
    Place right;
    Place down;
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
    Inverse const inverse(matrix);
    for (int y = 0; y < kHeight; ++y) {
        for (int x = 0; x < kWidth; ++x) {
            Pixel const pixel(inverse, x + 0.5, y + 0.5);
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

Points Wave(float width) {
    Points points;
    for (int i = 0; i <= 80; ++i) {
        float const t = static_cast<float>(i) / 80;
        points.push_back({8 + 104 * t, 50 + 35 * std::sin(t * 9), width * (0.6f + 0.4f * std::cos(t * 7))});
    }
    return points;
}

// Crosses itself again and again, with points close to each other.
Points Loops(float width) {
    Points points;
    for (int i = 0; i <= 200; ++i) {
        float const t = static_cast<float>(i) / 200;
        float const turn = t * 31;
        points.push_back({28 + 64 * t + 20 * std::cos(turn), 50 + 28 * std::sin(turn), width});
    }
    return points;
}

Points Scribble(float width) {
    std::mt19937 random(7);
    std::uniform_real_distribution<float> x(8, 112);
    std::uniform_real_distribution<float> y(8, 92);
    Points points;
    for (int i = 0; i < 30; ++i) points.push_back({x(random), y(random), width});
    return points;
}

struct Shape {
    char const* name;
    Points (*make)(float width);
};

constexpr Shape kShapes[] = {
    {"straight",
     [](float width) -> Points {
         return {{14.3f, 20.7f, width}, {100.2f, 76.1f, width}};
     }},
    {"sharp",
     [](float width) -> Points {
         return {{12, 45, width}, {105, 38, width}, {15, 50, width}, {100, 88, width}, {99, 12, width}};
     }},
    {"taper",
     [](float width) -> Points {
         return {{20, 20, 0}, {60, 78, width}, {108, 26, width / 4}};
     }},
    {"dot",
     [](float width) -> Points {
         return {{60.5f, 46.25f, width}, {60.5f, 46.25f, width}};
     }},
    {"wave", Wave},
    {"loops", Loops},
    {"scribble", Scribble},
};

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
        if (getenv("STROKE_DUMP")) printf("%-28s worst %d far %d\n", what.c_str(), worst, far);
        if (far > kWidth * kHeight / 2000 || worst > kFar) {
            Slack const slack(kWidth, kHeight, kClose);
            ExpectSame(expected, actual, what, &slack);
        }
    }
};

TEST_F(StrokeTest, CoverageIsTheMaximumOfTheSegments) {
    for (Shape const& shape : kShapes) {
        for (float const width : {0.2f, 1.0f, 3.0f, 12.0f, 60.0f, 200.0f}) {
            ExpectStroke(shape.make(width), Matrix3f(),
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
        for (Shape const& shape : kShapes) {
            for (float const width : {0.5f, 4.0f, 40.0f}) {
                ExpectStroke(shape.make(width), matrix,
                             "matrix " + std::to_string(number) + " " + shape.name + " " +
                                 std::to_string(width));
            }
        }
        ++number;
    }
}

} // namespace
} // namespace Moka::Testing
