// GlFunctions.h: the table of all GL functions that the renderer calls, as Gl::Name. In debug builds Gl::Name
// also checks for errors after the call and logs its name. In other builds it is the function itself.
// Thread: render thread.
#pragma once

#include <GLES3/gl3.h>

// clang-format off
#define MOKA_GL_FUNCTIONS(X) \
    X(ActiveTexture) X(AttachShader) X(BindAttribLocation) X(BindBuffer) X(BindBufferRange) X(BindFramebuffer) \
    X(BindRenderbuffer) X(BindSampler) X(BindTexture) X(BindVertexArray) X(BlendEquation) \
    X(BlendFuncSeparate) X(BlitFramebuffer) X(BufferData) X(CheckFramebufferStatus) X(ClearBufferfi) \
    X(ClearBufferfv) X(ClearBufferiv) X(ColorMask) X(CompileShader) X(CopyTexSubImage2D) \
    X(CreateProgram) X(CreateShader) X(DeleteBuffers) X(DeleteFramebuffers) X(DeleteProgram) \
    X(DeleteRenderbuffers) X(DeleteSamplers) X(DeleteShader) X(DeleteTextures) X(DeleteVertexArrays) \
    X(DepthFunc) X(DepthMask) X(DetachShader) X(Disable) X(DrawArrays) X(Enable) \
    X(EnableVertexAttribArray) X(Finish) X(FramebufferRenderbuffer) X(FramebufferTexture2D) \
    X(GenBuffers) X(GenFramebuffers) X(GenRenderbuffers) X(GenSamplers) X(GenTextures) \
    X(GenVertexArrays) X(GenerateMipmap) X(GetActiveUniform) X(GetBooleanv) X(GetIntegerv) X(GetProgramInfoLog) \
    X(GetProgramiv) X(GetShaderInfoLog) X(GetShaderiv) X(GetString) X(GetStringi) X(GetUniformBlockIndex) X(GetUniformLocation) \
    X(InvalidateFramebuffer) X(IsEnabled) X(LinkProgram) X(PixelStorei) X(ReadPixels) \
    X(RenderbufferStorage) X(SamplerParameteri) X(Scissor) X(ShaderSource) X(StencilFunc) X(StencilMask) \
    X(StencilMaskSeparate) X(StencilOp) X(TexImage2D) X(TexParameteri) X(TexSubImage2D) X(Uniform1fv) X(UniformBlockBinding) \
    X(Uniform1iv) X(Uniform2fv) X(Uniform4fv) X(UniformMatrix4fv) X(UseProgram) X(VertexAttribIPointer) X(VertexAttribPointer) \
    X(Viewport)
// clang-format on

namespace Moka::detail {

#if defined(MOKA_CHECKS) && MOKA_CHECKS

// Passes the call's name to GlDebug::CheckCall of the attached device.
void CheckGlCall(char const* call);

template <class Function>
class GlFunction;

template <class Result, class... Arguments>
class GlFunction<Result(GL_APIENTRY*)(Arguments...)> {
public:
    using Pointer = Result(GL_APIENTRY*)(Arguments...);

    constexpr GlFunction(Pointer function, char const* name) : mFunction(function), mName(name) {}

    Result operator()(Arguments... arguments) const {
        struct Check {
            char const* const name;
            ~Check() { CheckGlCall(name); }
        } const check{mName};
        return mFunction(arguments...);
    }

private:
    Pointer const mFunction;
    char const* const mName;
};

// C++ does not allow parentheses around a member's name. NOLINTBEGIN(bugprone-macro-parentheses)
#define MOKA_GL_FUNCTION(Name)                                                                               \
    static constexpr GlFunction<decltype(&::gl##Name)> Name{&::gl##Name, "gl" #Name};
// NOLINTEND(bugprone-macro-parentheses)

#else

#define MOKA_GL_FUNCTION(Name) static constexpr auto Name = &::gl##Name;

#endif

struct Gl {
    MOKA_GL_FUNCTIONS(MOKA_GL_FUNCTION)
};

#undef MOKA_GL_FUNCTION

} // namespace Moka::detail
