// RunBounds: where the draws of one run lie on their target, so that a later draw can tell whether it touches any
// of them. A box that is not known touches everything.
// Units: normalized device coordinates.
// Cost:  boxes are grouped by eight, so that most of a run is passed over. A run of many draws answers that it
//        is touched. The memory is kept for the next list.
#pragma once

#include "moka/renderer/DrawBounds.h"

#include <algorithm>
#include <vector>

namespace Moka::detail {

// Unknown if one of them is.
inline DrawBounds Enclose(DrawBounds const& a, DrawBounds const& b) {
    if (!a.IsKnown() || !b.IsKnown()) return {};
    return {std::min(a.left, b.left), std::min(a.bottom, b.bottom), std::max(a.right, b.right),
            std::max(a.top, b.top)};
}

class RunBounds {
public:
    void Clear();
    // Without memory nothing is known any more.
    void Add(DrawBounds const& box) noexcept;
    bool MayTouch(DrawBounds const& box) const;

private:
    void AddKnown(DrawBounds const& box);

    static constexpr std::size_t kGroup = 8;
    static constexpr std::size_t kMostBoxes = 1024;

    DrawBounds mAll;
    bool mIsKnown = true; // each box is known, and there are not too many
    std::vector<DrawBounds> mBoxes;
    std::vector<DrawBounds> mGroups;
};

} // namespace Moka::detail
