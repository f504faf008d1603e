// ClipInfo: one clip rectangle, with its operation and the canvas's matrix when it was set.
// Units:  pixels before the matrix.
#pragma once

#include "moka/graphics/canvas/IMKCanvasBase.h"

namespace Moka {

struct ClipInfo {
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
    IMKCanvasBase::ClipOp op = IMKCanvasBase::Intersect;
    Matrix3<float> matrix;
};

} // namespace Moka
