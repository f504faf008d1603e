#include "moka/graphics/drawable/StrokeRT.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace Moka::detail {

void EncloseStrokePoint(RectF& box, bool isFirst, MKStrokePoint const& point) {
    float const radius = point.width * 0.5f;
    if (isFirst) box = {point.x, point.y, point.x, point.y};
    box.MakeRect(point.x - radius, point.y - radius);
    box.MakeRect(point.x + radius, point.y + radius);
}

void StrokeRT::Append(std::vector<MKStrokePoint> const& points) {
    bool const isFirst = mPoints.empty();
    mPoints.insert(mPoints.end(), points.begin(), points.end());
    for (MKStrokePoint const& point : points) {
        EncloseStrokePoint(mBounds, isFirst && &point == points.data(), point);
    }
}

void StrokeRT::Clear() {
    mPoints.clear();
    for (auto const& mesh : mMeshes)
        if (mesh) mesh->Clear();
}

double StrokeRT::GetExtent() const {
    return std::max({std::fabs(mBounds.left), std::fabs(mBounds.top), std::fabs(mBounds.right),
                     std::fabs(mBounds.bottom)});
}

std::vector<StrokeCell> const& StrokeRT::Find(StrokeScale const& scale) {
    auto& [last, other] = mMeshes;
    if (!last || !(last->GetScale() == scale)) std::swap(last, other);
    if (!last || !(last->GetScale() == scale)) last = std::make_unique<StrokeMesh>(scale);
    try {
        return last->Update(mPoints);
    } catch (std::bad_alloc const&) {
        last.reset();
        throw;
    }
}

} // namespace Moka::detail
