// RenderThread: the render thread of a process without Android: one thread, one EGL context, and the queue
// that the graphics library posts to.
// Owner:   whoever started it. Destruction stops it. One at a time in a process, since the renderer has one
//          context; the next may start when the one before has been stopped.
// Thread:  Start, Stop and destruction on one thread; the rest from any.
// Fails:   Start returns null and says what was tried and what to install.
// Driver:  linked with moka_host_null in the place of moka_host, there is none, and no GL: images are real, draws
//          are counted and draw nothing.
// GL:      headless, it reaches a driver through the device platform, without a surface, or with a pbuffer,
//          whichever answers first with OpenGL ES 3.0, RGBA8888 and a stencil; or in a window handed in.
#pragma once

#include "moka/base/Export.h"
#include "moka/host/TaskQueue.h"
#include "moka/renderer/RendererFactory.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

namespace Moka {

struct RenderThreadOptions {
    RendererLimits limits;
    bool debugContext = false; // driver messages of error severity reach the log
    // Pixels, at least 1, of the default frame buffer. While both are 1 there need not be one.
    int surfaceWidth = 1;
    int surfaceHeight = 1;
    // A window whose frame buffer is the default one, in the place of the surface: what the platform's EGL
    // takes, an X11 Window, a wl_egl_window* or an ANativeWindow*, and the connection it belongs to (null for
    // the default one). Both outlive the thread. An X11 connection is then used by two threads: XInitThreads.
    std::uintptr_t nativeWindow = 0;
    void* nativeDisplay = nullptr;
};

// What was reached, and how.
struct RenderContextInfo {
    std::string path; // for instance "EGL surfaceless platform, no surface"
    std::string vendor;
    std::string renderer;
    std::string version;
    std::string eglVersion;
    int maxTextureSize = 0; // as lowered by the limits
};

class MOKA_API RenderThread final : public TaskQueue {
public:
    // Returns when the context is current on the new thread. error may be null; it is written on failure.
    static std::unique_ptr<RenderThread> Start(RenderThreadOptions const& options, std::string* error);
    ~RenderThread() override;

    // Runs what was accepted, then refuses; returns when the thread has ended. Calling it again does nothing.
    void Stop();

    RenderContextInfo const& GetContextInfo() const;

    // Runs function on the render thread, in order with the posted tasks, and waits for it. False when the
    // queue refused it or it threw (one error line). On the render thread itself it runs at once.
    bool Call(std::function<void()> const& function);

    // Any thread: shows in the window what was posted before; posted itself, so it returns at once. False
    // when the queue refused it, or when there is no window.
    bool Present();

private:
    RenderThread();
    struct Impl;
    std::unique_ptr<Impl> mImpl;
};

} // namespace Moka
