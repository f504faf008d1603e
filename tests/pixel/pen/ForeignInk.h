// ForeignInk: GL code that shares nothing with the renderer and cleans up nothing behind itself.
// Thread: render thread.
#pragma once

#include "moka/base/Rect.h"
#include "moka/graphics/math/Matrix4.h"

#include <GLES3/gl3.h>

namespace Moka::Testing {

class ForeignInk {
public:
    ForeignInk();
    ~ForeignInk(); // deletes its names, whatever is bound
    ForeignInk(ForeignInk const&) = delete;
    ForeignInk& operator=(ForeignInk const&) = delete;

    // Fills the rectangle with green, blending off, into what is bound, within the clip, viewport and masks
    // in force.
    void Fill(RectF const& rect, Matrix4<float> const& matrix) const;

    // Leaves everything that a draw depends on so that nothing could be drawn with it, or the wrong thing.
    void LeaveAMess() const;

private:
    GLuint mProgram = 0;
    GLuint mVertexArray = 0;
    GLuint mBuffer = 0;
    GLuint mTexture = 0;
    GLuint mSampler = 0;
};

} // namespace Moka::Testing
