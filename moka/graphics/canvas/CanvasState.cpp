#include "moka/graphics/canvas/CanvasState.h"

#include <cstring>
#include <new>

namespace Moka::detail {

int CanvasState::Save(IMKCanvasBase::SaveFlag flag) {
    bool const all = flag == IMKCanvasBase::SaveAll;
    Level level = mLevels.empty() ? Level() : mLevels.back();
    if (all || flag == IMKCanvasBase::SaveMatrix) level.matrix = matrix;
    if (all || flag == IMKCanvasBase::SaveClip) level.clipCount = clipCount;
    int const index = static_cast<int>(mLevels.size());
    try {
        mLevels.push_back(level);
    } catch (std::bad_alloc const&) {
        // No memory, no level: restoring to this index does nothing, as to any other that does not exist.
    }
    return index;
}

bool CanvasState::Restore(int level) {
    std::size_t const index = level < 0 ? mLevels.size() - 1 : static_cast<std::size_t>(level);
    if (index >= mLevels.size()) return false; // also the last one of none
    matrix = mLevels[index].matrix;
    clipCount = mLevels[index].clipCount;
    mLevels.resize(index);
    return true;
}

void CanvasState::SetTag(char const* text) {
    if (!text) return;
    std::memmove(mTag, text, strnlen(text, kMaxTagLength)); // a tag may be set to itself
    mTag[kMaxTagLength] = '\0';
}

} // namespace Moka::detail
