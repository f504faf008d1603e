/// RenderThread: the render thread of a process without Android: one thread, one EGL context, and the queue
/// that the graphics library posts to.
/// Owner:   the caller of Start. Destruction stops it. One at a time in a process, since the renderer has one
///          context; the next may start when the one before has been stopped.
/// Thread:  Start, Stop and destruction on one thread; the rest from any.
/// Fails:   Start returns null and a text that names the attempts and the packages to install.
/// Driver:  linked with moka_host_null in the place of moka_host, there is none, and no GL: images are real,
///          draws are counted and draw nothing.
/// GL:      headless, it reaches a driver through the device platform, without a surface, or with a pbuffer,
///          whichever answers first with OpenGL ES 3.0, RGBA8888 and a stencil; or in a window handed in.
#pragma once

#include "moka/base/Export.h"
#include "moka/host/TaskQueue.h"
#include "moka/renderer/RendererFactory.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

namespace Moka {

/// How a render thread is started. The defaults are headless.
struct RenderThreadOptions {
    /// Lower limits than the device's.
    RendererLimits limits;
    bool debugContext = false; ///< driver messages of error severity reach the log
    /// Pixels, at least 1, of the default frame buffer. While both are 1 there need not be one.
    int surfaceWidth = 1;
    int surfaceHeight = 1;
    /// A window, whose frame buffer replaces the surface: the type that the platform's EGL
    /// takes, an X11 Window, a wl_egl_window* or an ANativeWindow*, and the connection it belongs to (null
    /// for the default one). Both outlive the thread. Of an X11 connection only the server's name is used,
    /// where EGL takes a connection of ours; elsewhere two threads use it: XInitThreads. docs/windows.md
    /// tells more.
    std::uintptr_t nativeWindow = 0;
    void* nativeDisplay = nullptr;
    /// Presents that may wait to be shown, at least 1; the next one waits for the oldest. 1 is for ink: less
    /// waits between the pen and the screen, and drawing and showing take turns.
    int framesInFlight = 2;
    /// Refreshes of the screen for each present, at least 0: 0 shows at once. The driver may clamp it.
    int swapInterval = 1;
    /// A trace (moka/base/Trace.h) of the process, from the start of the thread until it has stopped. A file
    /// that cannot be written is one warning. Empty: what the environment variable MOKA_TRACE names, if it is
    /// set, from the first start in the process until the process ends.
    std::string tracePath{};
};

/// The context, and the way to it.
struct RenderContextInfo {
    std::string path; ///< for instance "EGL surfaceless platform, no surface"
    /// As the driver says.
    std::string vendor;
    std::string renderer;
    std::string version;
    std::string eglVersion;
    int maxTextureSize = 0; ///< as lowered by the limits
};

class MOKA_API RenderThread final : public TaskQueue {
public:
    /// Returns when the context is current on the new thread. error may be null; it is written on failure.
    static std::unique_ptr<RenderThread> Start(RenderThreadOptions const& options, std::string* error);
    ~RenderThread() override;

    /// Runs the accepted tasks, then refuses; returns when the thread has ended. Calling it again does
    /// nothing.
    void Stop();

    /// The context that Start reached.
    RenderContextInfo const& GetContextInfo() const;

    /// Runs function on the render thread, in order with the posted tasks, and waits for it. False when the
    /// queue refused it or it threw, which logs an error. On the render thread itself it runs at once.
    bool Call(std::function<void()> const& function);

    /// Any thread: shows all draws posted before in the window. Posted itself; it waits while framesInFlight
    /// presents are on their way, but never on the render thread. False when there
    /// is no window, when it is gone, and after Stop(); the first time it logs an error.
    bool Present();

private:
    RenderThread();
    struct Impl;
    std::unique_ptr<Impl> mImpl;
};

} // namespace Moka
