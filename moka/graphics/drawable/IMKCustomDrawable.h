/// IMKCustomDrawable: an object that draws itself. IMKCanvas::Draw() requests the draw.
/// Owner:  reference counted; each request holds one reference until it has been drawn.
/// Thread: DrawRT runs on the render thread. Ref and Unref may be called on any thread.
/// The vtable order is ABI.
#pragma once

#include "moka/graphics/math/Matrix4.h"

namespace Moka {

class MKPaint;

class IMKCustomDrawable {
public:
    /// Draws. The canvas calls it once for each frame buffer of the target, with that frame buffer active and
    /// the clip set. projection maps coordinates of the canvas to clip space.
    virtual void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) = 0;
    /// Take or drop a reference.
    virtual int Ref() = 0;
    virtual int Unref() = 0;

protected:
    ~IMKCustomDrawable() = default;
};

} // namespace Moka
