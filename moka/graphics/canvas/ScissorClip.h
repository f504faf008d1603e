// ScissorClip.h: clip rectangles as one rectangle of the renderer's scissor test, where that is possible.
// Numbers: nothing overflows, whatever the rectangles and matrices; NaN counts as 0.
#pragma once

#include "moka/graphics/canvas/ClipInfo.h"
#include "moka/renderer/IRasterizerState.h"

#include <cstddef>
#include <vector>

namespace Moka::detail {

using ClipList = std::vector<ClipInfo>;

bool HasReplace(ClipList const& clips);
// The last Replace, which makes all before it irrelevant; 0 without one.
std::size_t FirstRelevant(ClipList const& clips);

// Of a list that is not empty. A matrix counts as rotated if its element 3 is not zero. The operation of a
// single clip is ignored.
bool IsScissorEnough(ClipList const& clips);

// The visible part of a target of this top and height, counted from its bottom left. If nothing is visible, all
// zero, which hides everything.
ScissorRect GetScissorRect(ClipList const& clips, int targetY, int targetHeight);

// The same in a frame buffer that holds a tiled target's rows from frameTop on, the first one at its bottom.
ScissorRect ToStrip(ScissorRect const& rect, int targetHeight, int frameLeft, int frameTop);

} // namespace Moka::detail
