// ClipInfo: one clip rectangle, as it was set.
// Units:  those of the matrix's source, the canvas's matrix at that moment.
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
