/// RenderThread: the render thread of a process without Android: one thread, one EGL context, and the queue
/// that the graphics library posts to.
/// Owner:   the caller of Start. The destructor calls Stop. A process can have one at a time, because the
///          renderer supports one context. After Stop another one may start.
/// Thread:  Start, Stop and destruction on one thread; the other functions on any thread.
/// Fails:   Start returns null and sets *error to a text that names the attempts and the packages to install.
/// Driver:  if the program links moka_host_null instead of moka_host, there is no driver and no GL: images
/// are in
///          memory, and draws are counted but draw nothing.
/// GL:      without a window it tries the EGL device platform, a context without a surface, and a pbuffer. It
/// uses the
///          first one with OpenGL ES 3.0, RGBA8888 and a stencil buffer. Or it draws in a window that you
///          pass.
#pragma once

#include "moka/base/Export.h"
#include "moka/host/TaskQueue.h"
#include "moka/renderer/RendererFactory.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

namespace Moka {

/// The options of a render thread. By default there is no window.
struct RenderThreadOptions {
    /// Limits below those of the device.
    RendererLimits limits;
    bool debugContext = false; ///< creates a debug context and logs the driver's error messages
    /// The size of the default frame buffer in pixels, at least 1. If both are 1, there may be none.
    int surfaceWidth = 1;
    int surfaceHeight = 1;
    /// A native window to draw in, of the type that the platform's EGL takes: an X11 Window, a wl_egl_window*
    /// or an ANativeWindow*; and its connection to the window system (null for the default one). Both must
    /// outlive the thread. For X11, usually only the server's name is taken from the connection. If EGL
    /// cannot use another connection, two threads use yours: call XInitThreads first. See docs/windows.md.
    std::uintptr_t nativeWindow = 0;
    void* nativeDisplay = nullptr;
    /// The number of presents that may be in flight, at least 1. A further Present() waits for the oldest.
    /// With 1 the delay from pen to screen is shortest, but drawing and showing do not overlap.
    int framesInFlight = 2;
    /// The least number of screen refreshes between two presents. With 0 frames are shown at once. The driver
    /// may clamp it.
    int swapInterval = 1;
    /// The file for a trace (moka/base/Trace.h) of the process, from the start of the thread until Stop. If
    /// the file cannot be written, a warning is logged. If it is empty, the environment variable MOKA_TRACE
    /// names the file; that trace lasts from the first start in the process until the process ends.
    std::string tracePath{};
};

/// The properties of the context.
struct RenderContextInfo {
    std::string path; ///< for instance "EGL surfaceless platform, no surface"
    /// The strings of the driver.
    std::string vendor;
    std::string renderer;
    std::string version;
    std::string eglVersion;
    int maxTextureSize = 0; ///< in texels, at most that of the limits
};

class MOKA_API RenderThread final : public TaskQueue {
public:
    /// Starts a thread and opens its context. Returns when the context is current. On failure returns null
    /// and sets *error, unless error is null.
    static std::unique_ptr<RenderThread> Start(RenderThreadOptions const& options, std::string* error);
    ~RenderThread() override;

    /// Runs all accepted tasks, then refuses new ones and ends the thread. Returns when the thread has ended.
    /// Further calls do nothing. Must not be called on the render thread.
    void Stop();

    /// The properties of the context.
    RenderContextInfo const& GetContextInfo() const;

    /// Runs function on the render thread, in order with the posted tasks, and waits for it. On the render
    /// thread it runs at once. Returns false if the queue refuses, or if function throws, which logs an
    /// error.
    bool Call(std::function<void()> const& function);

    /// Posts a task that shows all draws so far in the window. Waits first if framesInFlight presents are in
    /// flight, except on the render thread. Returns false if there is no window, if it was destroyed, and
    /// after Stop(). The first failure logs an error.
    bool Present();

private:
    RenderThread();
    struct Impl;
    std::unique_ptr<Impl> mImpl;
};

} // namespace Moka
