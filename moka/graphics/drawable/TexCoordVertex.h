// TexCoordVertex: a vertex of a bitmap, with a position and a texture coordinate, without a coverage.
#pragma once

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/drawable/FringeGeometry.h"

namespace Moka::detail {

struct TexCoordVertex {
    float x;
    float y;
    float u;
    float v;
};

constexpr int kStripVertices = 4;
static_assert(sizeof(Corners<TexCoordVertex>) == kStripVertices * sizeof(TexCoordVertex));

// The corners of the bitmap in its own size, with the upper left one at (x, y).
inline Corners<TexCoordVertex> TexCoordCorners(IMKBitmap const& bitmap, float x, float y, RectF const& uv) {
    float const right = x + static_cast<float>(bitmap.GetWidth());
    float const bottom = y + static_cast<float>(bitmap.GetHeight());
    return {{x, y, uv.left, uv.top},
            {x, bottom, uv.left, uv.bottom},
            {right, y, uv.right, uv.top},
            {right, bottom, uv.right, uv.bottom}};
}

} // namespace Moka::detail
