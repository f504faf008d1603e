// StrokeRT: the render-thread part of a stroke: its points and their meshes.
// Thread: render thread. It may be created and deleted on any thread.
// Fails:  Find throws bad_alloc; the next call tries again.
#pragma once

#include "moka/base/Rect.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/graphics/drawable/StrokeMesh.h"

#include <array>
#include <memory>
#include <vector>

namespace Moka::detail {

// Grows box to enclose the point's disc. For the first point, box is set to the disc.
void EncloseStrokePoint(RectF& box, bool isFirst, MKStrokePoint const& point);

class StrokeRT {
public:
    // Throws bad_alloc; the stroke is then unchanged.
    void Append(std::vector<MKStrokePoint> const& points);
    void Clear(); // keeps the memory, so that ink drawn anew in each frame allocates nothing
    std::vector<MKStrokePoint> const& GetPoints() const { return mPoints; }

    bool IsEmpty() const { return mPoints.empty(); }
    // The stroke must not be empty.
    RectF const& GetBounds() const { return mBounds; }
    double GetExtent() const;

    // The cells of all points at this scale.
    std::vector<StrokeCell> const& Find(StrokeScale const& scale);

private:
    std::vector<MKStrokePoint> mPoints;
    RectF mBounds;
    std::array<std::unique_ptr<StrokeMesh>, 2> mMeshes; // the most recently used first
};

} // namespace Moka::detail
