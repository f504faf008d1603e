// CanvasState: what a canvas keeps on its caller's side: matrix, clip count, saved levels of both, tag.
// A value; not synchronised.
#pragma once

#include "moka/base/Export.h"
#include "moka/graphics/canvas/IMKCanvasBase.h"

#include <cstddef>
#include <vector>

namespace Moka::detail {

class MOKA_API CanvasState {
public:
    Matrix3<float> matrix;
    int clipCount = 0; // clips asked for, whether or not the queue took them

    // The index of the new level. A part that the flag leaves out gets what it had in the level below, or the
    // identity or 0 without one, so that restoring resets it. Relied upon. When memory runs out there is no
    // new level, and the index is that of none.
    int Save(IMKCanvasBase::SaveFlag flag);
    // False, and nothing changes, for a level that does not exist. A negative one is the last.
    bool Restore(int level);

    // Null is ignored. At most 126 bytes count; what a longer earlier tag had behind them stays. Relied upon.
    void SetTag(char const* text);
    char const* GetTag() const { return mTag; }

private:
    struct Level {
        Matrix3<float> matrix;
        int clipCount = 0;
    };

    static constexpr std::size_t kMaxTagLength = 126;

    std::vector<Level> mLevels;
    char mTag[128] = {};
};

} // namespace Moka::detail
