/// IMKCustomDrawable: something that draws itself onto a canvas: IMKCanvas::Draw() hands it over.
/// Owner:  reference counted; each request holds one reference until it has been drawn.
/// Thread: DrawRT on the render thread, the references from any.
/// The vtable order is ABI.
#pragma once

#include "moka/graphics/math/Matrix4.h"

namespace Moka {

class MKPaint;

class IMKCustomDrawable {
public:
    /// Called once for each frame buffer of the target. It is active and its clip is set. projection
    /// maps the canvas's pixels to clip space.
    virtual void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) = 0;
    virtual int Ref() = 0;
    virtual int Unref() = 0;

protected:
    ~IMKCustomDrawable() = default;
};

} // namespace Moka
