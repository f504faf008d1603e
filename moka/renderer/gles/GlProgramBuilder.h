// GlProgramBuilder.h: GLSL texts become a linked GL program.
// Thread: render thread, inside an operation.
#pragma once

#include <GLES3/gl3.h>

namespace Moka::detail {

class GlContext;

struct GlBuiltProgram {
    GLuint name = 0; // 0 only when the driver makes no program at all
    bool isPlaceholder = false;
};

// Attributes get their locations in the order of their declaration. A pair that does not compile or link is
// reported with one error line, and a placeholder that draws nothing takes its place.
GlBuiltProgram BuildGlProgram(GlContext& context, char const* vertexSource, char const* fragmentSource,
                              char const* name);

} // namespace Moka::detail
