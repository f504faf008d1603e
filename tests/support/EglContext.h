// EglContext: an off-screen OpenGL ES 3.0 context for tests and benchmarks of the renderer alone, without the
// host's render thread. Reaches Mesa without a display, ANGLE on SwiftShader, or whatever EGL offers.
// Thread:  the one that made it; the context is current there until it is destroyed.
#pragma once

#include <EGL/egl.h>

#include <memory>
#include <string>

namespace Moka::Testing {

class EglContext {
public:
    // Null, with what was tried, when no driver answers.
    static std::unique_ptr<EglContext> Create(bool debug, std::string* error);
    ~EglContext();
    EglContext(EglContext const&) = delete;
    EglContext& operator=(EglContext const&) = delete;

    // The default frame buffer: RGBA8 with depth and stencil, this many pixels; none on a driver without
    // pbuffers.
    bool HasSurface() const { return mSurface != EGL_NO_SURFACE; }
    static constexpr int kSurfaceWidth = 64;
    static constexpr int kSurfaceHeight = 48;

private:
    EglContext() = default;

    EGLDisplay mDisplay = EGL_NO_DISPLAY;
    EGLSurface mSurface = EGL_NO_SURFACE;
    EGLContext mContext = EGL_NO_CONTEXT;
};

} // namespace Moka::Testing
