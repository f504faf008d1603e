#include "moka/graphics/drawable/StrokeView.h"

#include <algorithm>
#include <cmath>

namespace Moka::detail {
namespace {

using Row = std::array<double, 3>;

Row Cross(Row const& a, Row const& b) {
    return {a[1] * b[2] - a[2] * b[1], a[2] * b[0] - a[0] * b[2], a[0] * b[1] - a[1] * b[0]};
}

// Scales of two directions whose ratio is below this count as equal.
constexpr double kEven = 1.02;
// The scale is at least 2^-19 of the largest coordinate, because floats cannot distinguish the corners of
// smaller cells.
constexpr int kPlaceBits = 19;
constexpr int kGreatest = 40;

} // namespace

StrokeView::StrokeView(Matrix4<float> const& m, int width, int height) : mWidth(width), mHeight(height) {
    Row const w{m[3], m[7], m[15]};
    Row x{m[0], m[4], m[12]};
    Row y{m[1], m[5], m[13]};
    for (std::size_t i = 0; i < 3; ++i) {
        x[i] = (x[i] + w[i]) * 0.5 * width;
        y[i] = (y[i] + w[i]) * 0.5 * height;
    }
    // The columns of the inverse.
    Row const first = Cross(y, w);
    Row const second = Cross(w, x);
    Row const third = Cross(x, y);
    double const determinant = x[0] * first[0] + x[1] * first[1] + x[2] * first[2];
    for (std::size_t i = 0; i < 3; ++i) {
        mToCanvas[i] = {first[i] / determinant, second[i] / determinant, third[i] / determinant};
    }
    mIsAffine = w[0] == 0 && w[1] == 0;
    auto const isFinite = [](Row const& row) {
        return std::all_of(row.begin(), row.end(), [](double value) { return std::isfinite(value); });
    };
    mIsValid = std::all_of(mToCanvas.begin(), mToCanvas.end(), isFinite) && GetScale(0).coarse > 0;
}

Vector4<float> StrokeView::GetRow(int row) const {
    Row const& values = mToCanvas[static_cast<std::size_t>(row)];
    return {static_cast<float>(values[0]), static_cast<float>(values[1]), static_cast<float>(values[2]), 0};
}

// Returns the singular values of the derivative at a pixel.
StrokeView::Range StrokeView::MeasurePixel(double x, double y) const {
    auto const at = [&](std::size_t row) {
        return mToCanvas[row][0] * x + mToCanvas[row][1] * y + mToCanvas[row][2];
    };
    double const w = at(2);
    double const canvasX = at(0) / w;
    double const canvasY = at(1) / w;
    auto const derive = [&](std::size_t row, double canvas, std::size_t column) {
        return (mToCanvas[row][column] - canvas * mToCanvas[2][column]) / w;
    };
    double const a = derive(0, canvasX, 0);
    double const b = derive(0, canvasX, 1);
    double const c = derive(1, canvasY, 0);
    double const d = derive(1, canvasY, 1);
    double const sum = std::hypot(a + d, b - c);
    double const difference = std::hypot(a - d, b + c);
    return {std::fabs(sum - difference) * 0.5, (sum + difference) * 0.5};
}

StrokeScale StrokeView::GetScale(double extent) const {
    Range range = MeasurePixel(mWidth * 0.5, mHeight * 0.5);
    for (int corner = 0; corner < 4 && !mIsAffine; ++corner) {
        Range const there = MeasurePixel(corner & 1 ? mWidth : 0, corner & 2 ? mHeight : 0);
        range = {std::fmin(range.least, there.least), std::fmax(range.most, there.most)};
    }
    int const smallest = extent > 0 ? std::ilogb(extent) - kPlaceBits : -kGreatest;
    auto const power = [&](double value) {
        int const exponent = value > 0 && std::isfinite(value) ? std::ilogb(value)
                             : value > 0                       ? kGreatest
                                                               : -kGreatest;
        return std::clamp(exponent, smallest, kGreatest);
    };
    // If the scale is a power of two, rounding errors must not double it.
    int const coarse = power(range.most * (1 - 1e-6)) + 1;
    int const fine = std::min(power(range.least * (1 + 1e-6)), coarse);
    return {std::ldexp(1.0, std::min(coarse, kGreatest)), std::ldexp(1.0, fine),
            mIsAffine && range.most <= kEven * range.least};
}

} // namespace Moka::detail
