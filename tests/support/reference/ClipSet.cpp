#include "tests/support/reference/ClipSet.h"

#include "tests/support/reference/Coverage.h"

#include <algorithm>

namespace Moka::Testing {
namespace {

bool IsReplace(ClipEntry const& e) { return e.op == IMKCanvasBase::Replace; }
bool CutsStraight(ClipEntry const& e) { return e.matrix[3] == 0.0f; }

bool ArePixelsEnough(std::vector<ClipEntry> const& entries) {
    if (entries.size() == 1 && CutsStraight(entries[0])) return true;
    if (IsReplace(entries.back()) && CutsStraight(entries.back())) return true;
    return std::all_of(entries.begin(), entries.end(), [](ClipEntry const& e) {
        return CutsStraight(e) && (e.op == IMKCanvasBase::Intersect || IsReplace(e));
    });
}

int Truncated(float v) { return static_cast<int>(v); }

// The bottom edge is cut off from below, where the last row of the target is 0.
Rect ToPixels(ClipEntry const& e, int targetHeight) {
    Matrix3f const& m = e.matrix;
    int const left = Truncated(m[0] * static_cast<float>(e.x) + m[6]);
    int const width = Truncated(m[0] * static_cast<float>(e.width));
    int const height = Truncated(m[4] * static_cast<float>(e.height));
    int const above = Truncated(static_cast<float>(targetHeight) -
                                (m[4] * static_cast<float>(e.y) + m[7] + static_cast<float>(height)));
    int const bottom = targetHeight - above;
    return {left, bottom - height, left + width, bottom};
}

bool Combine(IMKCanvasBase::ClipOp op, bool area, bool rect) {
    switch (op) {
    case IMKCanvasBase::Intersect:
        return area && rect;
    case IMKCanvasBase::Replace:
        return rect;
    case IMKCanvasBase::Union:
        return area || rect;
    case IMKCanvasBase::Xor:
        return area != rect;
    case IMKCanvasBase::Difference:
        return area && !rect;
    case IMKCanvasBase::ReverseDifference:
        return rect && !area;
    }
    return area;
}

} // namespace

ClipSet::ClipSet(std::vector<ClipEntry> const& entries, int targetHeight) {
    if (entries.empty()) return;
    auto const last = std::find_if(entries.rbegin(), entries.rend(), IsReplace);
    mStartsFull = last == entries.rend();
    bool const areStraight = ArePixelsEnough(entries);
    for (auto e = mStartsFull ? entries.begin() : last.base() - 1; e != entries.end(); ++e) {
        if (areStraight) {
            Rect const r = ToPixels(*e, targetHeight);
            Rect const& all = mPixels.value_or(r);
            mPixels = Rect(std::max(all.left, r.left), std::max(all.top, r.top), std::min(all.right, r.right),
                           std::min(all.bottom, r.bottom));
        } else {
            auto const x = static_cast<float>(e->x);
            auto const y = static_cast<float>(e->y);
            RectF const box(x, y, x + static_cast<float>(e->width), y + static_cast<float>(e->height));
            mRegions.push_back({e->op, RectD(Sorted(box)), Transform(e->matrix)});
        }
    }
}

bool ClipSet::Contains(int pixelX, int pixelY, PointD const& point) const {
    if (mPixels) return mPixels->Contains(Point(pixelX, pixelY));
    bool area = mStartsFull;
    for (Region const& region : mRegions) {
        auto const local = region.transform.Unmap(point);
        area = Combine(region.op, area, local && region.rect.Holds(*local));
    }
    return area;
}

} // namespace Moka::Testing
