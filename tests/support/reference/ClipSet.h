// ClipSet: the area that a canvas's clip rectangles leave, as the set of its pixels.
// Two ways lead to it. Clips that only cut straight are one rectangle of whole pixels, with its edges cut off
// towards zero. All others are sets of points: a pixel belongs when its centre does.
#pragma once

#include "moka/graphics/canvas/IMKCanvasBase.h"
#include "tests/support/reference/Plane.h"

#include <vector>

namespace Moka::Testing {

struct ClipEntry {
    int x, y, width, height;
    IMKCanvasBase::ClipOp op;
    Matrix3f matrix;
};

class ClipSet {
public:
    ClipSet() = default; // everything
    ClipSet(std::vector<ClipEntry> const& entries, int targetHeight);

    bool IsPointSet() const { return !mRegions.empty(); }
    // The pixel for straight clips, the point in target pixels for the others.
    bool Contains(int pixelX, int pixelY, PointD const& point) const;

private:
    struct Region {
        IMKCanvasBase::ClipOp op;
        RectD rect;
        Transform transform;
    };

    std::optional<Rect> mPixels; // of straight clips
    bool mStartsFull = true;
    std::vector<Region> mRegions;
};

} // namespace Moka::Testing
