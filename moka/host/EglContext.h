// EglContext: an OpenGL ES 3 context that is current on the thread that opened it.
// Owner:   that thread, which also destroys it. The destructor makes the context not current and frees all
//          EGL objects.
// Fails:   Open returns null. The error names the attempts with EGL's error names, and the packages to
//          install.
#pragma once

#include "moka/host/EglPlatform.h"
#include "moka/host/XWindowWatch.h"

#include <EGL/egl.h>

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace Moka::detail {

struct EglRequest {
    bool debug = false;
    int surfaceWidth = 1; // pixels; a side above 1 requests a default frame buffer of that size
    int surfaceHeight = 1;
    // A native window, whose frame buffer becomes the default one; 0 for none.
    std::uintptr_t window = 0;
    void* windowDisplay = nullptr;
    int swapInterval = 1; // of the window
};

class EglContext {
public:
    static std::unique_ptr<EglContext> Open(EglRequest const& request, std::string* error);
    ~EglContext();
    EglContext(EglContext const&) = delete;
    EglContext& operator=(EglContext const&) = delete;

    // The platform and the surface: "EGL surfaceless platform, pbuffer 640 x 480".
    std::string const& GetPath() const { return mPath; }
    std::string const& GetVersion() const { return mVersion; }

    // Shows the window's frame buffer. If the window no longer exists or EGL fails, logs an error and returns
    // false.
    bool SwapBuffers();

private:
    explicit EglContext(EglPlatform const& platform);
    // If there is no such window, returns null and sets *error.
    static std::unique_ptr<EglContext> OpenInWindow(EglRequest const& request, std::string* error);
    static std::unique_ptr<EglContext> OpenOneOf(std::vector<EglPlatform> const& platforms,
                                                 EglRequest const& request, std::string* error);

    // On failure each of these sets mFailure and returns false.
    bool Build(EglRequest const& request);
    bool Initialize();
    bool ChooseConfig(EGLint surfaceType);
    bool CreateContext(bool debug);
    bool CreatePbuffer(EglRequest const& request);
    bool CreateWindowSurface(std::uintptr_t window);
    bool MakeCurrent();
    bool BuildOffscreen(EglRequest const& request);
    bool BuildInWindow(EglRequest const& request);
    bool Fail(char const* function);

    EGLContext TryContext(EGLint debugAttribute, EGLint debugValue);
    EGLint GetBits(EGLConfig config, EGLint channel) const;
    bool IsAtLeast15() const { return mMajor > 1 || (mMajor == 1 && mMinor >= 5); }

    std::unique_ptr<XWindowWatch> mWatch; // null if the state of the window is unknown
    EGLDisplay mDisplay;
    bool mInitialized = false; // this object initialised the display and must terminate it
    EGLint mMajor = 0;
    EGLint mMinor = 0;
    std::vector<EGLConfig> mCandidates;
    EGLConfig mConfig = nullptr;
    EGLContext mContext = EGL_NO_CONTEXT;
    EGLSurface mSurface = EGL_NO_SURFACE;
    std::string mPath;
    std::string mVersion;
    std::string mFailure;
};

} // namespace Moka::detail
