#include "moka/host/EglContext.h"

#include "moka/host/EglError.h"

#include <EGL/eglext.h>

#include <vector>

namespace Moka::detail {

std::unique_ptr<EglContext> EglContext::Open(EglRequest const& request, std::string* error) {
    std::string tried;
    for (EglPlatform const& platform : ListEglPlatforms()) {
        std::unique_ptr<EglContext> context(new EglContext(platform));
        if (context->Build(request)) return context;
        tried += (tried.empty() ? "" : "; ") + platform.name + " (" + context->mFailure + ")";
    }
    *error = "no OpenGL ES 3.0 driver with RGBA8888 and an 8-bit stencil could be opened. Tried: " + tried +
             ". Install libegl1 and libgl1-mesa-dri (Debian's names), or your GPU's own driver.";
    return nullptr;
}

EglContext::EglContext(EglPlatform const& platform)
    : mDisplay(platform.display), mPath("EGL " + platform.name), mFailure(platform.failure) {}

EglContext::~EglContext() {
    if (mContext != EGL_NO_CONTEXT) {
        eglMakeCurrent(mDisplay, EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
        if (mSurface != EGL_NO_SURFACE) eglDestroySurface(mDisplay, mSurface);
        eglDestroyContext(mDisplay, mContext);
    }
    if (mInitialized) eglTerminate(mDisplay);
    eglReleaseThread();
}

bool EglContext::Fail(char const* function) {
    mFailure = DescribeEglFailure(function);
    return false;
}

bool EglContext::Build(EglRequest const& request) {
    if (mDisplay == EGL_NO_DISPLAY || !Initialize()) return false;
    bool const wantsSurface = request.surfaceWidth > 1 || request.surfaceHeight > 1;
    char const* const extensions = eglQueryString(mDisplay, EGL_EXTENSIONS);
    mNeedsSurface = wantsSurface || !HasEglExtension(extensions, "EGL_KHR_surfaceless_context");
    if (!ChooseConfig() || !CreateContext(request.debug)) return false;
    if (mNeedsSurface && !CreateSurface(request)) return false;
    mPath += mNeedsSurface ? ", pbuffer " + std::to_string(request.surfaceWidth) + " x " +
                                 std::to_string(request.surfaceHeight)
                           : ", no surface";
    return eglMakeCurrent(mDisplay, mSurface, mSurface, mContext) || Fail("eglMakeCurrent");
}

bool EglContext::Initialize() {
    // EGL does not count: a display that somebody in this process has initialised already must outlive us.
    bool const foreign = eglQueryString(mDisplay, EGL_VERSION) != nullptr;
    if (!eglInitialize(mDisplay, &mMajor, &mMinor)) return Fail("eglInitialize");
    mInitialized = !foreign;
    char const* const version = eglQueryString(mDisplay, EGL_VERSION);
    mVersion = version ? version : "";
    return true;
}

bool EglContext::ChooseConfig() {
    // clang-format off
    EGLint const wanted[] = {
        EGL_SURFACE_TYPE, mNeedsSurface ? EGL_PBUFFER_BIT : 0,
        EGL_RENDERABLE_TYPE, EGL_OPENGL_ES3_BIT,
        EGL_RED_SIZE, 8,
        EGL_GREEN_SIZE, 8,
        EGL_BLUE_SIZE, 8,
        EGL_ALPHA_SIZE, 8,
        EGL_STENCIL_SIZE, 8,
        EGL_NONE};
    // clang-format on
    EGLint count = 0;
    if (!eglChooseConfig(mDisplay, wanted, nullptr, 0, &count)) return Fail("eglChooseConfig");
    std::vector<EGLConfig> configs(static_cast<std::size_t>(count));
    if (!eglChooseConfig(mDisplay, wanted, configs.data(), count, &count)) return Fail("eglChooseConfig");
    configs.resize(static_cast<std::size_t>(count));
    // The sizes asked for are the least, and more bits come first.
    auto const has8Bits = [this](EGLConfig config) {
        for (EGLint const channel : {EGL_RED_SIZE, EGL_GREEN_SIZE, EGL_BLUE_SIZE, EGL_ALPHA_SIZE}) {
            EGLint bits = 0;
            if (!eglGetConfigAttrib(mDisplay, config, channel, &bits) || bits != 8) return false;
        }
        return true;
    };
    for (EGLConfig const config : configs) {
        if (!has8Bits(config)) continue;
        mConfig = config;
        return true;
    }
    mFailure = "no configuration with OpenGL ES 3, RGBA8888 and an 8-bit stencil";
    return false;
}

EGLContext EglContext::TryContext(EGLint debugAttribute, EGLint debugValue) {
    EGLint const attributes[] = {EGL_CONTEXT_CLIENT_VERSION, 3, debugAttribute, debugValue, EGL_NONE};
    return eglCreateContext(mDisplay, mConfig, EGL_NO_CONTEXT, attributes);
}

bool EglContext::CreateContext(bool debug) {
    if (!eglBindAPI(EGL_OPENGL_ES_API)) return Fail("eglBindAPI");
    if (debug && IsAtLeast15()) {
        mContext = TryContext(EGL_CONTEXT_OPENGL_DEBUG, EGL_TRUE);
    } else if (debug && HasEglExtension(eglQueryString(mDisplay, EGL_EXTENSIONS), "EGL_KHR_create_context")) {
        mContext = TryContext(EGL_CONTEXT_FLAGS_KHR, EGL_CONTEXT_OPENGL_DEBUG_BIT_KHR);
    }
    // A driver without debug contexts still draws.
    if (mContext == EGL_NO_CONTEXT) mContext = TryContext(EGL_NONE, EGL_NONE);
    return mContext != EGL_NO_CONTEXT || Fail("eglCreateContext");
}

bool EglContext::CreateSurface(EglRequest const& request) {
    EGLint const attributes[] = {EGL_WIDTH, request.surfaceWidth, EGL_HEIGHT, request.surfaceHeight,
                                 EGL_NONE};
    mSurface = eglCreatePbufferSurface(mDisplay, mConfig, attributes);
    return mSurface != EGL_NO_SURFACE || Fail("eglCreatePbufferSurface");
}

} // namespace Moka::detail
