// GlFill: fills a target with one colour by drawing, for clears that must obey the stencil test, which GL's
// own clear ignores.
// Owner:  the context; the program is made when first needed and goes with the context.
// Thread: render thread.
#pragma once

#include "moka/renderer/gles/GlDrawState.h"

#include <array>
#include <memory>

namespace Moka::detail {

class GlContext;

class GlFill {
public:
    // Within an operation: adds the draw to the context's list.
    void Add(std::shared_ptr<GlContext> const& context, GlTargetUse const& target,
             std::array<GLfloat, 4> const& color);

    void Clear();

private:
    void Make(std::shared_ptr<GlContext> const& context);

    std::shared_ptr<GlUniforms> mProgram;
    GLuint mName = 0;
    int mColor = -1;
    int mFormat = 0;
};

} // namespace Moka::detail
