// EglPlatform: lists EGL displays, best first: those of a window system's connection, or those that need no
// window system.
#pragma once

#include <EGL/egl.h>

#include <string>
#include <vector>

namespace Moka::detail {

struct EglPlatform {
    std::string name;    // for a message: "device platform, device 1 of 2"
    EGLDisplay display;  // not initialised; EGL_NO_DISPLAY if it is not available
    std::string failure; // the reason why it is not available
};

// Returns the displays that this EGL supports without a window system. Never empty: the default display is
// the last one.
std::vector<EglPlatform> ListEglPlatforms();

// Returns the displays for a window: that of an xcb_connection_t, if it is not null and EGL supports it, and
// that of a window system's connection. A null nativeDisplay is the default connection.
std::vector<EglPlatform> ListWindowPlatforms(void* xcbConnection, void* nativeDisplay);

// True if a list of extensions from eglQueryString contains name. extensions may be null.
bool HasEglExtension(char const* extensions, char const* name);

} // namespace Moka::detail
