#include "moka/graphics/drawable/StrokeMesh.h"

#include "moka/graphics/drawable/MKStrokeDrawable.h"

#include <algorithm>
#include <cmath>

namespace Moka::detail {
namespace {

// The largest deviation of a dropped point from the segment that replaces it, in position and radius, in
// device pixels.
constexpr double kStrokeTolerance = 1.0 / 24;

} // namespace

std::vector<StrokeCell> const& StrokeMesh::Update(std::vector<MKStrokePoint> const& points) {
    if (mTaken < points.size()) {
        if (mTaken > 0) mCells.TakeBackLast();
        for (; mTaken < points.size(); ++mTaken) {
            MKStrokePoint const& point = points[mTaken];
            Take({point.x, point.y, point.width * 0.5});
        }
        mCells.Add({mKept, mOpenCount == 0 ? mKept : mOpen[mOpenCount - 1]}, true);
    }
    return mCells.Make();
}

void StrokeMesh::Clear() {
    mCells.Clear();
    mTaken = 0;
    mOpenCount = 0;
}

void StrokeMesh::Take(StrokeNode const& point) {
    if (mTaken == 0) {
        mKept = point;
        return;
    }
    if (mOpenCount == kMostSkipped || !ReachesStraight(point)) {
        StrokeNode const& end = mOpen[mOpenCount - 1];
        mCells.Add({mKept, end}, false);
        mKept = end;
        mOpenCount = 0;
    }
    mOpen[mOpenCount++] = point;
}

bool StrokeMesh::ReachesStraight(StrokeNode const& point) const {
    StrokeSegment const way{mKept, point};
    double const width = 2 * way.GetGreatestRadius() / mScale.fine;
    double const tolerance = kStrokeTolerance * mScale.fine / std::clamp(width, kThinnestStroke, 1.0);
    return std::all_of(mOpen.begin(), mOpen.begin() + static_cast<std::ptrdiff_t>(mOpenCount),
                       [&](StrokeNode const& skipped) {
                           auto const [distance, radius] = way.FindCenter(skipped.x, skipped.y);
                           return distance <= tolerance && std::fabs(skipped.radius - radius) <= tolerance;
                       });
}

} // namespace Moka::detail
