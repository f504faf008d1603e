// EglContext: an OpenGL ES 3 context that is current on the thread that opened it.
// Owner:   that thread, which also destroys it: the context stops being current and everything is given back.
// Fails:   Open returns null and says what was tried, with EGL's own error names, and what to install.
#pragma once

#include "moka/host/EglPlatform.h"

#include <EGL/egl.h>

#include <memory>
#include <string>

namespace Moka::detail {

struct EglRequest {
    bool debug = false;
    int surfaceWidth = 1; // pixels; a side above 1 asks for a default frame buffer of that size
    int surfaceHeight = 1;
};

class EglContext {
public:
    static std::unique_ptr<EglContext> Open(EglRequest const& request, std::string* error);
    ~EglContext();
    EglContext(EglContext const&) = delete;
    EglContext& operator=(EglContext const&) = delete;

    // How it was reached: "EGL surfaceless platform, pbuffer 640 x 480".
    std::string const& GetPath() const { return mPath; }
    std::string const& GetVersion() const { return mVersion; }

private:
    explicit EglContext(EglPlatform const& platform);

    // Each false with mFailure set.
    bool Build(EglRequest const& request);
    bool Initialize();
    bool ChooseConfig();
    bool CreateContext(bool debug);
    bool CreateSurface(EglRequest const& request);
    bool Fail(char const* function);

    EGLContext TryContext(EGLint debugAttribute, EGLint debugValue);
    bool IsAtLeast15() const { return mMajor > 1 || (mMajor == 1 && mMinor >= 5); }

    EGLDisplay mDisplay;
    bool mInitialized = false; // by us, so terminated by us
    bool mNeedsSurface = true;
    EGLint mMajor = 0;
    EGLint mMinor = 0;
    EGLConfig mConfig = nullptr;
    EGLContext mContext = EGL_NO_CONTEXT;
    EGLSurface mSurface = EGL_NO_SURFACE;
    std::string mPath;
    std::string mVersion;
    std::string mFailure;
};

} // namespace Moka::detail
