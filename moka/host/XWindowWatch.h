// XWindowWatch: checks on its own connection to an X server whether a window exists. EGL uses this connection
// if it can (EGL_EXT_platform_xcb). So X errors about a window that the application has destroyed do not
// reach Xlib's error handler, which by default ends the process.
// libxcb is loaded at run time; the EGL drivers for X use it as well.
// Owner:  the render thread's context, which closes EGL's display first.
// Thread: render thread.
#pragma once

#include <cstdint>
#include <memory>
#include <string>

namespace Moka::detail {

class XWindowWatch {
public:
    // display is an Xlib Display*, or null for the server that DISPLAY names. Returns null and leaves *error
    // empty if the window belongs to another window system or libxcb is missing. Returns null and sets *error
    // if there is no such server or window.
    static std::unique_ptr<XWindowWatch> Open(void* display, std::uintptr_t window, std::string* error);
    ~XWindowWatch();
    XWindowWatch(XWindowWatch const&) = delete;
    XWindowWatch& operator=(XWindowWatch const&) = delete;

    // The connection, an xcb_connection_t*.
    void* GetConnection() const;
    // Reads the server's messages without waiting. Returns true if the window was destroyed or the server has
    // ended.
    bool IsGone();

private:
    struct Impl;
    explicit XWindowWatch(std::unique_ptr<Impl> impl);
    std::unique_ptr<Impl> const mImpl;
};

} // namespace Moka::detail
