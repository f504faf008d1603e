// RunBounds: the bounding boxes of a run's draws on their target, to test whether a later draw overlaps any
// of them. An unknown box overlaps everything.
// Units: normalized device coordinates.
// Cost:  boxes are grouped by eight, so that a test skips most of them. A run of more than kMostBoxes draws
//        counts as overlapped. The memory is reused for the next list.
#pragma once

#include "moka/renderer/DrawBounds.h"

#include <algorithm>
#include <vector>

namespace Moka::detail {

// Returns the box that encloses both. It is unknown if one of them is.
inline DrawBounds Enclose(DrawBounds const& a, DrawBounds const& b) {
    if (!a.IsKnown() || !b.IsKnown()) return {};
    return {std::min(a.left, b.left), std::min(a.bottom, b.bottom), std::max(a.right, b.right),
            std::max(a.top, b.top)};
}

class RunBounds {
public:
    void Clear();
    // If memory runs out, the run counts as overlapped from then on.
    void Add(DrawBounds const& box) noexcept;
    bool MayTouch(DrawBounds const& box) const;

private:
    void AddKnown(DrawBounds const& box);

    static constexpr std::size_t kGroup = 8;
    static constexpr std::size_t kMostBoxes = 1024;

    DrawBounds mAll;
    bool mIsKnown = true; // all boxes are known, at most kMostBoxes of them
    std::vector<DrawBounds> mBoxes;
    std::vector<DrawBounds> mGroups;
};

} // namespace Moka::detail
