#include "moka/renderer/gles/GlDebug.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/renderer/device/Counters.h"

#include <algorithm>
#include <cstring>

namespace Moka::detail {
namespace {

// The attached device's GlDebug, for CheckGlCall(). Used on the render thread only.
GlDebug* theDebug = nullptr;

bool HasExtension(char const* name) {
    GLint count = 0;
    Gl::GetIntegerv(GL_NUM_EXTENSIONS, &count);
    for (GLint i = 0; i < count; ++i) {
        auto const* const text =
            reinterpret_cast<char const*>(Gl::GetStringi(GL_EXTENSIONS, static_cast<GLuint>(i)));
        if (text && std::strcmp(text, name) == 0) return true;
    }
    return false;
}

// One driver reports performance hints, such as "stall due to ReadPixels", with high severity.
bool IsError(GLenum type, GLenum severity) {
    return type == GL_DEBUG_TYPE_ERROR_KHR ||
           (severity == GL_DEBUG_SEVERITY_HIGH_KHR && type != GL_DEBUG_TYPE_PERFORMANCE_KHR);
}

void GL_APIENTRY OnMessage(GLenum source, GLenum type, GLuint, GLenum severity, GLsizei,
                           GLchar const* message, void const* counters) {
    // GlProgramBuilder logs compiler messages itself, with the program's name.
    if (source == GL_DEBUG_SOURCE_SHADER_COMPILER_KHR || !IsError(type, severity)) return;
    ++static_cast<Counters*>(const_cast<void*>(counters))->errors;
    __android_log_print(ANDROID_LOG_ERROR, "mok_log", "GL driver: %s", message);
}

char const* NameOf(GLenum error) {
    switch (error) {
    case GL_INVALID_ENUM:
        return "invalid enum";
    case GL_INVALID_VALUE:
        return "invalid value";
    case GL_INVALID_OPERATION:
        return "invalid operation";
    case GL_INVALID_FRAMEBUFFER_OPERATION:
        return "invalid frame buffer operation";
    case GL_OUT_OF_MEMORY:
        return "out of memory";
    default:
        return "unknown";
    }
}

} // namespace

void GlDebug::Attach(RendererProcLoader loader) {
    theDebug = this;
    if (!loader || !HasExtension("GL_KHR_debug")) return;
    mObjectLabel = reinterpret_cast<PFNGLOBJECTLABELKHRPROC>(loader("glObjectLabelKHR"));
    Gl::GetIntegerv(GL_MAX_LABEL_LENGTH_KHR, &mMaxLabelLength);
    // Debug output is initially on in debug contexts and off in others. It stays off there, because producing
    // messages may cost a driver time.
    if (!Gl::IsEnabled(GL_DEBUG_OUTPUT_KHR)) return;
    LoadGroups(loader);
    InstallCallback(loader);
}

void GlDebug::LoadGroups(RendererProcLoader loader) {
    auto const push = reinterpret_cast<PFNGLPUSHDEBUGGROUPKHRPROC>(loader("glPushDebugGroupKHR"));
    auto const pop = reinterpret_cast<PFNGLPOPDEBUGGROUPKHRPROC>(loader("glPopDebugGroupKHR"));
    if (!push || !pop) return;
    mPushGroup = push;
    mPopGroup = pop;
}

void GlDebug::InstallCallback(RendererProcLoader loader) {
    auto const getPointer = reinterpret_cast<PFNGLGETPOINTERVKHRPROC>(loader("glGetPointervKHR"));
    auto const setCallback =
        reinterpret_cast<PFNGLDEBUGMESSAGECALLBACKKHRPROC>(loader("glDebugMessageCallbackKHR"));
    if (!getPointer || !setCallback) return;
    void* installed = nullptr;
    getPointer(GL_DEBUG_CALLBACK_FUNCTION_KHR, &installed);
    if (installed) return;
    mSetCallback = setCallback;
    mSetCallback(OnMessage, &mCounters);
    // Without it a driver may call back on its own threads, and later than the faulty call.
    Gl::Enable(GL_DEBUG_OUTPUT_SYNCHRONOUS_KHR);
}

void GlDebug::Detach() {
    theDebug = nullptr;
    if (mSetCallback) mSetCallback(nullptr, nullptr);
    mSetCallback = nullptr;
    mObjectLabel = nullptr;
    mPushGroup = nullptr;
    mPopGroup = nullptr;
}

void GlDebug::Label(GLenum identifier, GLuint name, char const* text) const {
    if (!mObjectLabel) return;
    // The limit includes the terminating zero.
    std::size_t const length =
        std::min<std::size_t>(std::strlen(text), static_cast<std::size_t>(std::max(mMaxLabelLength - 1, 0)));
    mObjectLabel(identifier, name, static_cast<GLsizei>(length), text);
}

bool GlDebug::TakeErrors(char const* doing) {
    bool clean = true;
    for (GLenum error = glGetError(); error != GL_NO_ERROR; error = glGetError()) {
        // A lost context reports this error on every call.
        constexpr GLenum kContextLost = 0x0507;
        clean = false;
        if (!mSetCallback) {
            ++mCounters.errors;
            __android_log_print(ANDROID_LOG_ERROR, "mok_log", "GL error 0x%04x (%s) %s", error, NameOf(error),
                                doing);
        }
        if (error == kContextLost) break;
    }
    return clean;
}

bool GlDebug::Check(char const* doing) {
    bool const isClean = TakeErrors(doing) && !mCallFailed;
    mCallFailed = false;
    return isClean;
}

void GlDebug::CheckCall(char const* call) {
    if (!TakeErrors(call)) mCallFailed = true;
}

#if defined(MOKA_CHECKS) && MOKA_CHECKS
void CheckGlCall(char const* call) {
    if (theDebug) theDebug->CheckCall(call);
}
#endif

} // namespace Moka::detail
