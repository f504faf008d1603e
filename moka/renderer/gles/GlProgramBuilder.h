// GlProgramBuilder.h: GLSL texts become a linked GL program.
// Thread: render thread, inside an operation.
#pragma once

#include "moka/renderer/gles/GlFunctions.h"

#include <string>

namespace Moka::detail {

// Attributes get their locations in the order of their declaration. A pair that does not compile or link is
// logged with the driver's text, and a placeholder that draws nothing takes its place (draws is false). 0 only
// when the driver makes no program at all.
GLuint BuildGlProgram(char const* vertexSource, char const* fragmentSource, char const* label, bool* draws);

// The same without a placeholder and without a log line: 0, with failure set. attributeSource declares the
// attributes whose locations are given.
GLuint LinkGlProgram(char const* vertexSource, char const* fragmentSource, char const* attributeSource,
                     std::string* failure);

} // namespace Moka::detail
