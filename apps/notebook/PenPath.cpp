#include "apps/notebook/PenPath.h"

#include <algorithm>
#include <cmath>

namespace Moka::Notebook {
namespace {

constexpr float kStep = 2.5f;
constexpr float kNearest = 0.25f; // closer positions do not determine a direction
constexpr float kWidthGain = 0.3f;
constexpr float kSpeedGain = 0.6f;
constexpr std::uint32_t kRest = 60; // milliseconds without a position after which nothing is predicted

InkPoint MakePoint(float x, float y, float width) {
    return {RoundForFile(x), RoundForFile(y), RoundForFile(width)};
}

} // namespace

float PenPath::GetWidth(float distance, std::uint32_t milliseconds, float pressure) const {
    if (mIsPlain) return mBase;
    float const speed = distance / static_cast<float>(std::max(milliseconds, 1u));
    float const factor =
        pressure >= 0 ? 0.35f + 1.1f * pressure : std::clamp(1.2f - 0.3f * speed, 0.55f, 1.2f);
    float const before = mCount > 0 ? mLast[2].width : mBase * factor;
    return before + (mBase * factor - before) * kWidthGain;
}

void PenPath::Add(float x, float y, std::uint32_t time, float pressure) {
    if (mCount == 0) {
        mLast[0] = mLast[1] = mLast[2] = {x, y, GetWidth(0, 1, pressure), time};
        mSettled.push_back(MakePoint(x, y, mLast[2].width));
        mCount = 1;
        return;
    }
    float const dx = x - mLast[2].x;
    float const dy = y - mLast[2].y;
    float const distance = std::hypot(dx, dy);
    if (distance < kNearest) return;
    std::uint32_t const passed = time - mLast[2].time;
    auto const ms = static_cast<float>(std::max(passed, 1u));
    float const gain = passed > kRest ? 1 : kSpeedGain;
    mSpeedX += (dx / ms - mSpeedX) * gain;
    mSpeedY += (dy / ms - mSpeedY) * gain;
    Position const next{x, y, GetWidth(distance, passed, pressure), time};
    if (mCount > 1) AddCurve({mLast[0], mLast[1], mLast[2], next}, mSettled);
    mLast[0] = mCount > 1 ? mLast[1] : mLast[2];
    mLast[1] = mLast[2];
    mLast[2] = next;
    ++mCount;
}

// Barry and Goldman's algorithm with the square roots of the distances as knots. The first and the last segment use
// their end point twice.
void PenPath::AddCurve(Position const (&p)[4], InkPoints& to) {
    float knots[4] = {0, 0, 0, 0};
    for (int i = 1; i < 4; ++i)
        knots[i] =
            knots[i - 1] + std::max(std::sqrt(std::hypot(p[i].x - p[i - 1].x, p[i].y - p[i - 1].y)), 1e-3f);
    float const length = std::hypot(p[2].x - p[1].x, p[2].y - p[1].y);
    int const steps = std::clamp(static_cast<int>(std::ceil(length / kStep)), 1, 400);
    for (int i = 1; i <= steps; ++i) {
        float const part = static_cast<float>(i) / static_cast<float>(steps);
        float const t = knots[1] + (knots[2] - knots[1]) * part;
        float x[4] = {p[0].x, p[1].x, p[2].x, p[3].x};
        float y[4] = {p[0].y, p[1].y, p[2].y, p[3].y};
        for (int level = 1; level < 4; ++level) {
            for (int k = 0; k + level < 4; ++k) {
                // The last level interpolates between the middle knots.
                int const low = level == 3 ? 1 : k;
                int const high = level == 3 ? 2 : k + level;
                float const mix = (t - knots[low]) / (knots[high] - knots[low]);
                x[k] += (x[k + 1] - x[k]) * mix;
                y[k] += (y[k + 1] - y[k]) * mix;
            }
        }
        to.push_back(MakePoint(x[0], y[0], p[1].width + (p[2].width - p[1].width) * part));
    }
}

InkPoints PenPath::GetTail(float ahead) const {
    InkPoints tail;
    if (mCount == 0) return tail;
    tail.push_back(mSettled.back());
    if (mCount > 1) AddCurve({mLast[0], mLast[1], mLast[2], mLast[2]}, tail);
    Position const& end = mLast[2];
    if (ahead > 0 && mCount > 2)
        tail.push_back(MakePoint(end.x + mSpeedX * ahead, end.y + mSpeedY * ahead, end.width));
    return tail;
}

InkPoints PenPath::Finish() const {
    InkPoints points = mSettled;
    if (mCount > 1) AddCurve({mLast[0], mLast[1], mLast[2], mLast[2]}, points);
    return points;
}

} // namespace Moka::Notebook
