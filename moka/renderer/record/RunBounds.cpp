#include "moka/renderer/record/RunBounds.h"

#include <new>

namespace Moka::detail {
namespace {

bool Touch(DrawBounds const& a, DrawBounds const& b) {
    return a.left < b.right && b.left < a.right && a.bottom < b.top && b.bottom < a.top;
}

} // namespace

void RunBounds::Clear() {
    mIsKnown = true;
    mBoxes.clear();
    mGroups.clear();
}

void RunBounds::Add(DrawBounds const& box) noexcept {
    mIsKnown = mIsKnown && box.IsKnown() && mBoxes.size() < kMostBoxes;
    if (!mIsKnown) return;
    try {
        AddKnown(box);
    } catch (std::bad_alloc const&) {
        mIsKnown = false;
    }
}

void RunBounds::AddKnown(DrawBounds const& box) {
    if (mBoxes.empty()) {
        mAll = box;
    } else {
        mAll = Enclose(mAll, box);
    }
    if (mBoxes.size() % kGroup == 0) {
        mGroups.push_back(box);
    } else {
        mGroups.back() = Enclose(mGroups.back(), box);
    }
    mBoxes.push_back(box);
}

bool RunBounds::MayTouch(DrawBounds const& box) const {
    if (!mIsKnown || !box.IsKnown()) return true;
    if (!Touch(mAll, box)) return false;
    for (std::size_t group = 0; group < mGroups.size(); ++group) {
        if (!Touch(mGroups[group], box)) continue;
        std::size_t const end = std::min(mBoxes.size(), (group + 1) * kGroup);
        for (std::size_t i = group * kGroup; i < end; ++i) {
            if (Touch(mBoxes[i], box)) return true;
        }
    }
    return false;
}

} // namespace Moka::detail
