// EglPlatform: the ways to an EGL display: of a window system's connection, or those that need none, best
// first.
#pragma once

#include <EGL/egl.h>

#include <string>
#include <vector>

namespace Moka::detail {

struct EglPlatform {
    std::string name;    // for a message: "device platform, device 1 of 2"
    EGLDisplay display;  // not initialised by us; EGL_NO_DISPLAY when it could not be had
    std::string failure; // why it could not be had
};

// Only what the EGL at hand offers. Never empty: the default display stands last.
std::vector<EglPlatform> ListEglPlatforms();

// The displays on which a window may be: the one of an xcb_connection_t, where EGL takes it and it is not null,
// and the one of a window system's connection, for which null is the default one.
std::vector<EglPlatform> ListWindowPlatforms(void* xcbConnection, void* nativeDisplay);

// Whether a list as eglQueryString gives it, which may be null, has a name.
bool HasEglExtension(char const* extensions, char const* name);

} // namespace Moka::detail
