// EglError: what EGL says went wrong, as text for a message.
#pragma once

#include <EGL/egl.h>

#include <string>

namespace Moka::detail {

// The name in the headers, or the number when it has none.
std::string NameOfEglError(EGLint error);

// "eglInitialize: EGL_NOT_INITIALIZED", with this thread's last error, which is thereby forgotten.
std::string DescribeEglFailure(char const* function);

} // namespace Moka::detail
