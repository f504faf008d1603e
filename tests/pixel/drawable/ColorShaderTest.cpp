// The programs that draw one colour, pixel by pixel: rectangles, corners, circles, lines; with and without
// tint.
#include "tests/pixel/drawable/ShaderPixels.h"

namespace Moka::Testing {
namespace {

Vector4<float> const kColor(0.9f, 0.5f, 0.2f, 0.8f);
Vector4<float> const kTint(0.1f, 0.7f, 1.0f, 0.6f);

class ColorShaderTest : public ShaderPixels {
protected:
    template <class T>
    void SetColors(SharedShader<T> const& shader, int hasTint) {
        shader->uProjectionMatrix = GetProjection();
        shader->uColor = kColor;
        shader->uTintColor = kTint;
        shader->uHasTintColor = hasTint;
    }

    // The colour under a coverage.
    static Rgba Shade(double coverage, int hasTint) {
        Vector4<float> const& c = hasTint == 1 ? kTint : kColor;
        double const alpha = coverage * double{kColor.w} * (hasTint == 1 ? double{kTint.w} : 1);
        return {double{c.x} * alpha, double{c.y} * alpha, double{c.z} * alpha, alpha};
    }

    template <class T>
    void ExpectCoverageOfTheVertices() {
        SetSize(16, 4);
        SharedShader<T> const shader;
        auto const coverage = [](float x, float y) { return x / 32 + y / 8; };
        RawAttribute const vertices = AtCorners([&](float x, float y) {
            return std::vector<float>{x, y, coverage(x, y)};
        });
        for (int hasTint : {0, 1, 2}) {
            SetColors(shader, hasTint);
            Expect(
                Draw({vertices}), [=](double x, double y) { return Shade(x / 32 + y / 8, hasTint); },
                "tint " + std::to_string(hasTint));
        }
    }
};

TEST_F(ColorShaderTest, RectanglesTakeTheCoverageOfTheirVertices) {
    ExpectCoverageOfTheVertices<MKRectShader>();
    ExpectCoverageOfTheVertices<MKRoundRectShader>();
}

TEST_F(ColorShaderTest, CirclesMeasureTheirCoverageFromTheCentre) {
    SetSize(30, 28);
    SharedShader<MKCircleShader> const shader;
    RawAttribute const vertices = AtCorners([](float x, float y) { return std::vector<float>{x, y}; });
    struct {
        double radius;
        double width; // 0 for the fill
    } const cases[] = {{9.3, 0}, {0.4, 0}, {8.2, 3}, {8.2, 0.5}, {2, 6.2}, {20, 0}};
    for (auto const& [radius, width] : cases) {
        for (int hasTint : {0, 1}) {
            SetColors(shader, hasTint);
            shader->uIsFill = width > 0 ? 0 : 1;
            shader->uStrokeWidth = static_cast<float>(width > 0 ? width : 5);
            shader->uCenter = Vector2<float>(14.23f, 13.07f);
            shader->uRadius = static_cast<float>(radius);
            double const outer = radius + width / 2;
            double const inner = width > 0 ? radius - width / 2 : -10;
            Reference const reference = [=](double x, double y) -> std::optional<Rgba> {
                double const d = std::hypot(x - 14.23, y - 13.07);
                if (d > outer + 0.5 || d < inner - 0.5) return std::nullopt;
                if (d > outer - 0.5) return Shade(outer - d + 0.5, hasTint);
                return Shade(std::min(d - inner + 0.5, 1.0), hasTint);
            };
            Expect(Draw({vertices}), reference,
                   "radius " + std::to_string(radius) + ", width " + std::to_string(width), kMediumPrecision);
        }
    }
}

TEST_F(ColorShaderTest, AFragmentOnACirclesOutermostEdgeIsKeptAndCoversNothing) {
    SetSize(12, 1);
    SharedShader<MKCircleShader> const shader;
    SetColors(shader, 0);
    shader->uIsFill = 1;
    shader->uCenter = Vector2<float>(0.5f, 0.5f);
    shader->uRadius = 5.5f; // the centre of pixel 6 lies 6 away
    Image const drawn = Draw({AtCorners([](float x, float y) { return std::vector<float>{x, y}; })});
    EXPECT_EQ(drawn.At(6, 0), kClear);
    EXPECT_EQ(drawn.At(7, 0), kBackground);
}

TEST_F(ColorShaderTest, CornersMeasureTheirCoverageOnTheEllipse) {
    SetSize(26, 22);
    SharedShader<MKRoundRectRoundShader> const shader;
    float const cx = 13.3f;
    float const cy = 10.2f;
    RawAttribute const vertices = AtCorners([=](float x, float y) {
        return std::vector<float>{x, y, cx, cy};
    });
    struct {
        double rx, ry;
        double width; // 0 for the fill
    } const cases[] = {{8, 8, 0}, {10, 5, 0}, {4.5, 8.5, 0}, {8, 6, 3}, {6, 8, 1}};
    for (auto const& [rx, ry, width] : cases) {
        int const hasTint = rx > ry ? 1 : 0;
        SetColors(shader, hasTint);
        shader->uIsFill = width > 0 ? 0 : 1;
        shader->uStrokeWidth = static_cast<float>(width > 0 ? width : 5);
        shader->uRxry = Vector2<float>(static_cast<float>(rx), static_cast<float>(ry));
        auto const on = [=, x0 = double{cx}, y0 = double{cy}](double x, double y, double grow) {
            return std::pow((x - x0) / (rx + grow), 2) + std::pow((y - y0) / (ry + grow), 2);
        };
        auto const ramp = [=](double grow) { return std::pow((rx + grow + 0.5) / (rx + grow - 0.5), 2) - 1; };
        Reference const reference = [=](double x, double y) -> std::optional<Rgba> {
            double const k = width / 2;
            double coverage = 1;
            if (on(x, y, k + 0.5) > 1) return std::nullopt;
            if (double const s = on(x, y, k - 0.5); s > 1) coverage *= 1 - (s - 1) / ramp(k);
            if (width > 0) {
                double const s = on(x, y, -k - 0.5);
                if (s < 1) return std::nullopt;
                if (on(x, y, -k + 0.5) < 1) coverage *= (s - 1) / ramp(-k);
            }
            return Shade(coverage, hasTint);
        };
        Expect(Draw({vertices}), reference,
               "radii " + std::to_string(rx) + " x " + std::to_string(ry) + ", width " +
                   std::to_string(width));
    }
}

struct Line {
    double half, length;
    int cap;
    std::vector<double> dashes; // dash, gap, dash, gap; empty for a solid line

    double Coverage(double x, double y) const { return std::min(Along(x, y), Across(y)); }

private:
    static double Clamp(double value) { return std::min(std::max(value, 0.0), 1.0); }
    static double Mod(double x, double period) { return x - period * std::floor(x / period); }
    static constexpr double kNowhere = 100000;

    double Along(double x, double y) const {
        double left = 0;
        double right = length;
        double at = x;
        bool inside = x >= 0 && x <= length;
        if (dashes.empty()) {
            if (x < 0) left = -kNowhere, right = 0;
            if (x > length) left = length, right = kNowhere;
        } else {
            inside = Find(x, at, left, right);
        }
        if (inside) {
            if (cap != 0) return 1;
            if (at < left + 0.5) return std::max(0.5 + at - left, 0.0);
            return at > right - 0.5 ? std::max(0.5 + right - at, 0.0) : 1;
        }
        switch (cap) {
        case 0:
            return std::max({0.5 + left - at, 0.5 + at - right, 0.0});
        case 1:
            return std::max(Clamp(0.5 + half - std::hypot(at - left, y)),
                            Clamp(0.5 + half - std::hypot(at - right, y)));
        default:
            return std::max(Clamp(0.5 + left + half - at), Clamp(0.5 + at - right + half));
        }
    }

    bool Find(double x, double& at, double& left, double& right) const {
        double const p1 = dashes[0], p2 = p1 + dashes[1], p3 = p2 + dashes[2], p4 = p3 + dashes[3];
        double const rest = Mod(length, p4);
        if (x >= length) {
            right = kNowhere;
            left = length;
            if (rest <= p1 || (p2 <= rest && rest <= p3)) return false;
            at = Mod(x, p4);
            left = rest < p2 ? p1 : p3;
            return false;
        }
        at = Mod(x, p4);
        bool inside = true;
        if (at < p1) {
            left = 0, right = p1;
        } else if (at < p2) {
            left = p1, right = p2, inside = false;
        } else if (at < p3) {
            left = p2, right = p3;
        } else {
            left = p3, right = p4, inside = false;
        }
        bool const endsInGap = (p1 <= rest && rest <= p2) || (p3 <= rest && rest <= p4);
        if (x >= length - half - 0.5 && !inside && endsInGap) right = kNowhere;
        return inside;
    }

    double Across(double y) const {
        if (y > half - 0.5) return Clamp(0.5 + half - y);
        return y < -half + 0.5 ? Clamp(0.5 + half + y) : 1;
    }
};

TEST_F(ColorShaderTest, LinesHaveCapsAndDashes) {
    SetSize(40, 14);
    SharedShader<MKLineShader> const shader;
    // No pixel's centre lies where a dash begins or ends.
    RawAttribute const vertices = AtCorners([](float x, float y) {
        return std::vector<float>{x, y, x - 6.37f, y - 6.81f};
    });
    std::vector<std::vector<double>> const patterns = {{}, {4, 2, 4, 2}, {5, 3, 1, 6}};
    for (auto const& dashes : patterns) {
        for (int cap : {0, 1, 2, 7}) {
            for (double half : {0.5, 1.5, 3.0}) {
                for (double length : {24.6, 10.0, 11.3, 4.7}) {
                    Line const line{half, length, cap, dashes};
                    SetColors(shader, cap == 7 ? 1 : 0);
                    shader->uLineInfo = Vector2<float>(static_cast<float>(half), static_cast<float>(length));
                    shader->uLineCapType = cap;
                    shader->uIsDashedLine = dashes.empty() ? 0 : 1;
                    if (!dashes.empty()) {
                        float sums[4] = {};
                        float sum = 0;
                        for (std::size_t i = 0; i < 4; ++i) sums[i] = sum += static_cast<float>(dashes[i]);
                        shader->uDashedLinePattern = Vector4<float>(sums[0], sums[1], sums[2], sums[3]);
                        shader->uDashedLinePatternLength = sum;
                    }
                    Expect(
                        Draw({vertices}),
                        [&](double x, double y) {
                            return Shade(line.Coverage(x - 6.37, y - 6.81), cap == 7 ? 1 : 0);
                        },
                        "cap " + std::to_string(cap) + ", half " + std::to_string(half) + ", length " +
                            std::to_string(length) + ", dash " +
                            std::to_string(dashes.empty() ? 0 : dashes[0]),
                        kMediumPrecision);
                }
            }
        }
    }
}

} // namespace
} // namespace Moka::Testing
