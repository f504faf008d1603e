// StrokeMesh: a stroke's cells at one scale. Points that lie on the way between others, to a fraction of a
// device pixel, are left out; the way from the last point kept to the last point is provisional, as the next
// points may continue it.
// Thread: render thread.
// Fails:  bad_alloc; the mesh is useless then.
// Cost:   constant for each new point.
#pragma once

#include "moka/graphics/drawable/StrokeCells.h"

#include <array>
#include <vector>

namespace Moka {
struct MKStrokePoint;
}

namespace Moka::detail {

class StrokeMesh {
public:
    explicit StrokeMesh(StrokeScale const& scale) : mScale(scale), mCells(scale) {}

    StrokeScale const& GetScale() const { return mScale; }

    // Takes the points that it does not have yet; those before have not changed. There is at least one.
    std::vector<StrokeCell> const& Update(std::vector<MKStrokePoint> const& points);

    // As at the start; keeps the memory.
    void Clear();

private:
    // Of points that are left out one after the other.
    static constexpr std::size_t kMostSkipped = 32;

    void Take(StrokeNode const& point);
    bool ReachesStraight(StrokeNode const& point) const;

    StrokeScale const mScale;
    StrokeCells mCells;
    std::size_t mTaken = 0;
    StrokeNode mKept{};
    // Behind the one kept; the last one is the end of the stroke.
    std::array<StrokeNode, kMostSkipped> mOpen{};
    std::size_t mOpenCount = 0;
};

} // namespace Moka::detail
