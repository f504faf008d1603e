// XWindowWatch: a window of an X server, seen through a connection of its own: whether it exists, and whether it
// has gone. EGL gets this connection where it takes one (EGL_EXT_platform_xcb): what X says about a window that
// the application has destroyed then reaches nobody's error handler. The default one ends the process.
// libxcb is looked up when it is needed; the EGL drivers for X use it themselves.
// Owner:  the render thread's context, which closes EGL's display first.
// Thread: render thread.
#pragma once

#include <cstdint>
#include <memory>
#include <string>

namespace Moka::detail {

class XWindowWatch {
public:
    // display is an Xlib Display*, or null for the server that DISPLAY names. Null and an empty error: the
    // window belongs to another window system, or libxcb is missing, so nothing is known. Null with an error:
    // there is no such server or no such window.
    static std::unique_ptr<XWindowWatch> Open(void* display, std::uintptr_t window, std::string* error);
    ~XWindowWatch();
    XWindowWatch(XWindowWatch const&) = delete;
    XWindowWatch& operator=(XWindowWatch const&) = delete;

    // An xcb_connection_t*.
    void* GetConnection() const;
    // Reads what the server has sent, without waiting. The window, or the server, has gone once it is true.
    bool IsGone();

private:
    struct Impl;
    explicit XWindowWatch(std::unique_ptr<Impl> impl);
    std::unique_ptr<Impl> const mImpl;
};

} // namespace Moka::detail
