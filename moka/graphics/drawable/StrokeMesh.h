// StrokeMesh: the cells of a stroke at one scale. It drops points that lie between others to a fraction of a
// device pixel. The segment from the last kept point to the end of the stroke is provisional, because later
// points may extend it.
// Thread: render thread.
// Fails:  throws bad_alloc; the mesh must then be discarded.
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

    // Adds the points that are new since the last call; earlier ones must not change. There must be at least
    // one point.
    std::vector<StrokeCell> const& Update(std::vector<MKStrokePoint> const& points);

    // As at the start; keeps the memory.
    void Clear();

private:
    // The most consecutive points that are dropped.
    static constexpr std::size_t kMostSkipped = 32;

    void Take(StrokeNode const& point);
    bool ReachesStraight(StrokeNode const& point) const;

    StrokeScale const mScale;
    StrokeCells mCells;
    std::size_t mTaken = 0;
    StrokeNode mKept{};
    // The points after mKept. The last one is the end of the stroke.
    std::array<StrokeNode, kMostSkipped> mOpen{};
    std::size_t mOpenCount = 0;
};

} // namespace Moka::detail
