// StrokeRT: the render thread's half of a stroke: its points, and the meshes made of them.
// Thread: render thread; made and destroyed on any.
// Fails:  bad_alloc from Find, which the next call recovers from.
#pragma once

#include "moka/base/Rect.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/graphics/drawable/StrokeMesh.h"

#include <array>
#include <memory>
#include <vector>

namespace Moka::detail {

// Grows to the point's disc. The first point of a box is not enclosed yet.
void EncloseStrokePoint(RectF& box, bool isFirst, MKStrokePoint const& point);

class StrokeRT {
public:
    // bad_alloc leaves the stroke as it was.
    void Append(std::vector<MKStrokePoint> const& points);
    void Clear(); // keeps the memory, so that ink drawn anew in each frame allocates nothing
    std::vector<MKStrokePoint> const& GetPoints() const { return mPoints; }

    bool IsEmpty() const { return mPoints.empty(); }
    // Of a stroke that is not empty.
    RectF const& GetBounds() const { return mBounds; }
    double GetExtent() const;

    // The cells of all points at this scale.
    std::vector<StrokeCell> const& Find(StrokeScale const& scale);

private:
    std::vector<MKStrokePoint> mPoints;
    RectF mBounds;
    std::array<std::unique_ptr<StrokeMesh>, 2> mMeshes; // the last one used first
};

} // namespace Moka::detail
