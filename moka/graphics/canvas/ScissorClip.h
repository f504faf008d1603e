// ScissorClip.h: converts a list of clips to one rectangle of the scissor test, if that is possible.
// Numbers: nothing overflows for any rectangles and matrices. NaN counts as 0.
#pragma once

#include "moka/graphics/canvas/ClipInfo.h"
#include "moka/renderer/IRasterizerState.h"

#include <cstddef>
#include <vector>

namespace Moka::detail {

using ClipList = std::vector<ClipInfo>;

bool HasReplace(ClipList const& clips);
// Returns the index of the last Replace, which makes all clips before it irrelevant; 0 without one.
std::size_t FirstRelevant(ClipList const& clips);

// True if the scissor test alone can apply the list, which must not be empty. A matrix counts as rotated if
// its element 3 is not zero. The operation of a single clip is ignored.
bool IsScissorEnough(ClipList const& clips);

// Returns the allowed part of a target with this top and height, relative to its bottom left corner. If
// nothing is allowed, all members are zero, which hides everything.
ScissorRect GetScissorRect(ClipList const& clips, int targetY, int targetHeight);

// Converts such a rectangle to the frame buffer of a strip whose first row, at the bottom of the frame
// buffer, is row frameTop of the target.
ScissorRect ToStrip(ScissorRect const& rect, int targetHeight, int frameLeft, int frameTop);

} // namespace Moka::detail
