#include "moka/host/EglError.h"

#include <cstdio>

namespace Moka::detail {

std::string NameOfEglError(EGLint error) {
    static constexpr char const* kNames[] = {
        "EGL_SUCCESS",       "EGL_NOT_INITIALIZED", "EGL_BAD_ACCESS",        "EGL_BAD_ALLOC",
        "EGL_BAD_ATTRIBUTE", "EGL_BAD_CONFIG",      "EGL_BAD_CONTEXT",       "EGL_BAD_CURRENT_SURFACE",
        "EGL_BAD_DISPLAY",   "EGL_BAD_MATCH",       "EGL_BAD_NATIVE_PIXMAP", "EGL_BAD_NATIVE_WINDOW",
        "EGL_BAD_PARAMETER", "EGL_BAD_SURFACE",     "EGL_CONTEXT_LOST"};
    static_assert(EGL_CONTEXT_LOST - EGL_SUCCESS + 1 == sizeof kNames / sizeof kNames[0]);
    if (error >= EGL_SUCCESS && error <= EGL_CONTEXT_LOST) return kNames[error - EGL_SUCCESS];
    char text[24];
    std::snprintf(text, sizeof text, "error 0x%04x", static_cast<unsigned>(error));
    return text;
}

std::string DescribeEglFailure(char const* function) {
    return std::string(function) + ": " + NameOfEglError(eglGetError());
}

} // namespace Moka::detail
