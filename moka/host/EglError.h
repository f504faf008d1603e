// EglError: EGL errors as text for messages.
#pragma once

#include <EGL/egl.h>

#include <string>

namespace Moka::detail {

// Returns the name of the error code, or the number if it has no name.
std::string NameOfEglError(EGLint error);

// Returns "eglInitialize: EGL_NOT_INITIALIZED", for example, with the last error of this thread. Resets that
// error.
std::string DescribeEglFailure(char const* function);

} // namespace Moka::detail
