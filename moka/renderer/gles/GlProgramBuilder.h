// GlProgramBuilder.h: compiles and links GL programs.
// Thread: render thread.
#pragma once

#include "moka/renderer/gles/GlFunctions.h"

#include <string>

namespace Moka::detail {

// Attributes get their locations in the order of their declaration. If the sources do not compile or link,
// this logs the driver's text, sets *draws to false and returns a placeholder that draws nothing. It returns
// 0 only if the driver cannot create any program.
GLuint BuildGlProgram(char const* vertexSource, char const* fragmentSource, char const* label, bool* draws);

// Like BuildGlProgram, but on failure it sets *failure, logs nothing and returns 0. The attributes get their
// locations in the order in which attributeSource declares them.
GLuint LinkGlProgram(char const* vertexSource, char const* fragmentSource, char const* attributeSource,
                     std::string* failure);

} // namespace Moka::detail
