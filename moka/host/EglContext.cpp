#include "moka/host/EglContext.h"

#include "moka/host/EglError.h"

#include "moka/base/log/AndroidLog.h"

#include <EGL/eglext.h>

#include <algorithm>
#include <utility>

namespace Moka::detail {

std::unique_ptr<EglContext> EglContext::Open(EglRequest const& request, std::string* error) {
    if (request.window != 0) return OpenInWindow(request, error);
    return OpenOneOf(ListEglPlatforms(), request, error);
}

std::unique_ptr<EglContext> EglContext::OpenInWindow(EglRequest const& request, std::string* error) {
    std::string missing;
    auto watch = XWindowWatch::Open(request.windowDisplay, request.window, &missing);
    if (!missing.empty()) {
        error->swap(missing);
        return nullptr;
    }
    void* const connection = watch ? watch->GetConnection() : nullptr;
    auto context = OpenOneOf(ListWindowPlatforms(connection, request.windowDisplay), request, error);
    if (context) context->mWatch = std::move(watch);
    return context;
}

std::unique_ptr<EglContext> EglContext::OpenOneOf(std::vector<EglPlatform> const& platforms,
                                                  EglRequest const& request, std::string* error) {
    std::string tried;
    for (EglPlatform const& platform : platforms) {
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
        eglDestroyContext(mDisplay, mContext);
    }
    if (mSurface != EGL_NO_SURFACE) eglDestroySurface(mDisplay, mSurface);
    if (mInitialized) eglTerminate(mDisplay);
    eglReleaseThread();
}

bool EglContext::Fail(char const* function) {
    mFailure = DescribeEglFailure(function);
    return false;
}

bool EglContext::Build(EglRequest const& request) {
    if (mDisplay == EGL_NO_DISPLAY || !Initialize()) return false;
    return request.window != 0 ? BuildInWindow(request) : BuildOffscreen(request);
}

bool EglContext::BuildOffscreen(EglRequest const& request) {
    char const* const extensions = eglQueryString(mDisplay, EGL_EXTENSIONS);
    bool const needsSurface = request.surfaceWidth > 1 || request.surfaceHeight > 1 ||
                              !HasEglExtension(extensions, "EGL_KHR_surfaceless_context");
    if (!ChooseConfig(needsSurface ? EGL_PBUFFER_BIT : 0)) return false;
    mConfig = mCandidates.front();
    if (!CreateContext(request.debug) || (needsSurface && !CreatePbuffer(request))) return false;
    mPath += needsSurface ? ", pbuffer " + std::to_string(request.surfaceWidth) + " x " +
                                std::to_string(request.surfaceHeight)
                          : ", no surface";
    return MakeCurrent();
}

// Tries each configuration, because EGL does not report which one fits the window.
bool EglContext::BuildInWindow(EglRequest const& request) {
    if (!ChooseConfig(EGL_WINDOW_BIT) || !CreateWindowSurface(request.window)) return false;
    mPath += ", window";
    if (!CreateContext(request.debug) || !MakeCurrent()) return false;
    return eglSwapInterval(mDisplay, request.swapInterval) || Fail("eglSwapInterval");
}

bool EglContext::MakeCurrent() {
    return eglMakeCurrent(mDisplay, mSurface, mSurface, mContext) || Fail("eglMakeCurrent");
}

bool EglContext::SwapBuffers() {
    bool const isGone = mWatch && mWatch->IsGone();
    if (!isGone && eglSwapBuffers(mDisplay, mSurface)) return true;
    std::string const reason =
        isGone ? "it was destroyed, or its X server has ended" : DescribeEglFailure("eglSwapBuffers");
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "the window cannot be shown any more: %s",
                        reason.c_str());
    return false;
}

bool EglContext::Initialize() {
    // EGL does not count initialisations. So a display that other code has initialised must not be terminated
    // here.
    bool const foreign = eglQueryString(mDisplay, EGL_VERSION) != nullptr;
    if (!eglInitialize(mDisplay, &mMajor, &mMinor)) return Fail("eglInitialize");
    mInitialized = !foreign;
    char const* const version = eglQueryString(mDisplay, EGL_VERSION);
    mVersion = version ? version : "";
    return true;
}

bool EglContext::ChooseConfig(EGLint surfaceType) {
    // A window needs no alpha.
    bool const isWindow = surfaceType == EGL_WINDOW_BIT;
    // clang-format off
    EGLint const wanted[] = {
        EGL_SURFACE_TYPE, surfaceType,
        EGL_RENDERABLE_TYPE, EGL_OPENGL_ES3_BIT,
        EGL_RED_SIZE, 8,
        EGL_GREEN_SIZE, 8,
        EGL_BLUE_SIZE, 8,
        EGL_ALPHA_SIZE, isWindow ? 0 : 8,
        EGL_STENCIL_SIZE, 8,
        EGL_NONE};
    // clang-format on
    EGLint count = 0;
    if (!eglChooseConfig(mDisplay, wanted, nullptr, 0, &count)) return Fail("eglChooseConfig");
    mCandidates.resize(static_cast<std::size_t>(count));
    if (!eglChooseConfig(mDisplay, wanted, mCandidates.data(), count, &count)) return Fail("eglChooseConfig");
    mCandidates.resize(static_cast<std::size_t>(count));
    // eglChooseConfig treats sizes as minima and returns larger ones first.
    auto const isUnfit = [this, isWindow](EGLConfig config) {
        for (EGLint const channel : {EGL_RED_SIZE, EGL_GREEN_SIZE, EGL_BLUE_SIZE}) {
            if (GetBits(config, channel) != 8) return true;
        }
        EGLint const alpha = GetBits(config, EGL_ALPHA_SIZE);
        return alpha != 8 && !(isWindow && alpha == 0);
    };
    mCandidates.erase(std::remove_if(mCandidates.begin(), mCandidates.end(), isUnfit), mCandidates.end());
    if (!mCandidates.empty()) return true;
    mFailure = "no configuration with OpenGL ES 3, RGBA8888 and an 8-bit stencil";
    return false;
}

EGLint EglContext::GetBits(EGLConfig config, EGLint channel) const {
    EGLint bits = 0;
    return eglGetConfigAttrib(mDisplay, config, channel, &bits) ? bits : -1;
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
    // A driver may lack debug contexts; fall back to a plain one.
    if (mContext == EGL_NO_CONTEXT) mContext = TryContext(EGL_NONE, EGL_NONE);
    return mContext != EGL_NO_CONTEXT || Fail("eglCreateContext");
}

bool EglContext::CreatePbuffer(EglRequest const& request) {
    EGLint const attributes[] = {EGL_WIDTH, request.surfaceWidth, EGL_HEIGHT, request.surfaceHeight,
                                 EGL_NONE};
    mSurface = eglCreatePbufferSurface(mDisplay, mConfig, attributes);
    return mSurface != EGL_NO_SURFACE || Fail("eglCreatePbufferSurface");
}

bool EglContext::CreateWindowSurface(std::uintptr_t window) {
    for (EGLConfig const candidate : mCandidates) {
        mConfig = candidate;
        // The type is a pointer or a number, depending on the window system. Only a C-style cast converts to
        // both.
        mSurface = eglCreateWindowSurface(mDisplay, mConfig, (EGLNativeWindowType)window, nullptr);
        if (mSurface != EGL_NO_SURFACE) return true;
    }
    return Fail("eglCreateWindowSurface");
}

} // namespace Moka::detail
