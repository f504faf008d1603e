#include "tests/support/EglContext.h"

#include <EGL/eglext.h>

#include <cstring>
#include <vector>

namespace Moka::Testing {
namespace {

// Of ANGLE's platform extensions; the registry's header does not have them.
constexpr EGLint kPlatformAngle = 0x3202;
constexpr EGLint kAngleType = 0x3203;
constexpr EGLint kAngleTypeVulkan = 0x3450;
constexpr EGLint kAngleDeviceType = 0x3209;
constexpr EGLint kAngleDeviceTypeSwiftShader = 0x3487;

bool HasClientExtension(char const* name) {
    char const* const all = eglQueryString(EGL_NO_DISPLAY, EGL_EXTENSIONS);
    return all && std::strstr(all, name);
}

EGLDisplay OpenPlatform(EGLenum platform, std::vector<EGLint> const& attributes) {
    auto const getDisplay =
        reinterpret_cast<PFNEGLGETPLATFORMDISPLAYEXTPROC>(eglGetProcAddress("eglGetPlatformDisplayEXT"));
    if (!getDisplay) return EGL_NO_DISPLAY;
    EGLDisplay const display = getDisplay(platform, nullptr, attributes.data());
    bool const ready = display != EGL_NO_DISPLAY && eglInitialize(display, nullptr, nullptr);
    return ready ? display : EGL_NO_DISPLAY;
}

EGLDisplay OpenDisplay(std::string* tried) {
    EGLDisplay display = EGL_NO_DISPLAY;
    if (HasClientExtension("EGL_ANGLE_platform_angle")) {
        *tried += " ANGLE on SwiftShader,";
        display = OpenPlatform(kPlatformAngle, {kAngleType, kAngleTypeVulkan, kAngleDeviceType,
                                                kAngleDeviceTypeSwiftShader, EGL_NONE});
    }
    if (display == EGL_NO_DISPLAY && HasClientExtension("EGL_MESA_platform_surfaceless")) {
        *tried += " the surfaceless platform,";
        display = OpenPlatform(EGL_PLATFORM_SURFACELESS_MESA, {EGL_NONE});
    }
    if (display != EGL_NO_DISPLAY) return display;
    *tried += " the default display";
    display = eglGetDisplay(EGL_DEFAULT_DISPLAY);
    return eglInitialize(display, nullptr, nullptr) ? display : EGL_NO_DISPLAY;
}

// Once a process: software drivers take long to start, and none frees everything when it ends.
EGLDisplay GetDisplay(std::string* tried) {
    static std::string attempts;
    static EGLDisplay const display = OpenDisplay(&attempts);
    *tried = attempts;
    return display;
}

EGLConfig ChooseConfig(EGLDisplay display, EGLint surfaceType) {
    EGLint const attributes[] = {EGL_RENDERABLE_TYPE,
                                 EGL_OPENGL_ES3_BIT,
                                 EGL_SURFACE_TYPE,
                                 surfaceType,
                                 EGL_RED_SIZE,
                                 8,
                                 EGL_GREEN_SIZE,
                                 8,
                                 EGL_BLUE_SIZE,
                                 8,
                                 EGL_ALPHA_SIZE,
                                 8,
                                 EGL_DEPTH_SIZE,
                                 24,
                                 EGL_STENCIL_SIZE,
                                 8,
                                 EGL_NONE};
    EGLConfig config = nullptr;
    EGLint count = 0;
    eglChooseConfig(display, attributes, &config, 1, &count);
    return count > 0 ? config : nullptr;
}

} // namespace

std::unique_ptr<EglContext> EglContext::Create(bool debug, std::string* error) {
    std::unique_ptr<EglContext> context(new EglContext);
    std::string tried;
    EGLDisplay const display = context->mDisplay = GetDisplay(&tried);
    if (display == EGL_NO_DISPLAY) {
        *error = "no EGL display; tried" + tried;
        return nullptr;
    }
    eglBindAPI(EGL_OPENGL_ES_API);
    EGLConfig const withSurface = ChooseConfig(display, EGL_PBUFFER_BIT);
    EGLint const surface[] = {EGL_WIDTH, kSurfaceWidth, EGL_HEIGHT, kSurfaceHeight, EGL_NONE};
    if (withSurface) context->mSurface = eglCreatePbufferSurface(display, withSurface, surface);
    EGLint const attributes[] = {
        EGL_CONTEXT_MAJOR_VERSION,    3,       EGL_CONTEXT_MINOR_VERSION, 0, EGL_CONTEXT_OPENGL_DEBUG,
        debug ? EGL_TRUE : EGL_FALSE, EGL_NONE};
    context->mContext = eglCreateContext(display, withSurface ? withSurface : ChooseConfig(display, 0),
                                         EGL_NO_CONTEXT, attributes);
    if (!eglMakeCurrent(display, context->mSurface, context->mSurface, context->mContext)) {
        *error = "no current context of OpenGL ES 3.0; tried" + tried;
        return nullptr;
    }
    return context;
}

EglContext::~EglContext() {
    if (mDisplay == EGL_NO_DISPLAY) return;
    eglMakeCurrent(mDisplay, EGL_NO_SURFACE, EGL_NO_SURFACE, EGL_NO_CONTEXT);
    if (mContext != EGL_NO_CONTEXT) eglDestroyContext(mDisplay, mContext);
    if (mSurface != EGL_NO_SURFACE) eglDestroySurface(mDisplay, mSurface);
}

} // namespace Moka::Testing
