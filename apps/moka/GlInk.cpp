#include "apps/moka/GlInk.h"

#include <GLES3/gl3.h>

#include <array>
#include <cstdint>
#include <stdexcept>
#include <string>

namespace Moka::Tool {
namespace {

constexpr char kVertexShader[] = R"(#version 300 es
uniform mat4 uMatrix;
layout(location = 0) in vec2 aPosition;
layout(location = 1) in vec2 aAcross; // the distance from the middle, and the ink's radius there
out highp vec2 vAcross;
void main() {
    vAcross = aAcross;
    gl_Position = uMatrix * vec4(aPosition, 0.0, 1.0);
}
)";

constexpr char kFragmentShader[] = R"(#version 300 es
precision highp float;
uniform vec4 uColor;
in highp vec2 vAcross;
out vec4 oColor;
void main() {
    oColor = uColor * clamp(vAcross.y + 0.5 - abs(vAcross.x), 0.0, 1.0);
}
)";

void Compile(GLuint program, GLenum stage, char const* source) {
    GLuint const shader = glCreateShader(stage);
    glShaderSource(shader, 1, &source, nullptr);
    glCompileShader(shader);
    glAttachShader(program, shader);
    glDeleteShader(shader); // GL keeps it while it is attached
}

void Link(GLuint program) {
    Compile(program, GL_VERTEX_SHADER, kVertexShader);
    Compile(program, GL_FRAGMENT_SHADER, kFragmentShader);
    glLinkProgram(program);
    GLint isLinked = 0;
    glGetProgramiv(program, GL_LINK_STATUS, &isLinked);
    if (isLinked) return;
    std::array<char, 512> text{};
    glGetProgramInfoLog(program, static_cast<GLsizei>(text.size()), nullptr, text.data());
    throw std::runtime_error(std::string("the driver refuses the ink's program: ") + text.data());
}

} // namespace

GlInk::GlInk() : mProgram(glCreateProgram()) {
    glGenVertexArrays(1, &mVertexArray);
    glGenBuffers(1, &mBuffer);
}

std::unique_ptr<GlInk> GlInk::Create() {
    std::unique_ptr<GlInk> ink(new GlInk);
    Link(ink->mProgram);
    return ink;
}

GlInk::~GlInk() {
    glDeleteBuffers(1, &mBuffer);
    glDeleteVertexArrays(1, &mVertexArray);
    glDeleteProgram(mProgram);
}

void GlInk::Bind() const {
    glUseProgram(mProgram);
    glBindVertexArray(mVertexArray);
}

void GlInk::Draw(Matrix4<float> const& matrix, std::vector<InkVertex> const& strip,
                 Vector4<float> const& color) const {
    Bind();
    glUniformMatrix4fv(glGetUniformLocation(mProgram, "uMatrix"), 1, GL_FALSE, matrix.data());
    glUniform4f(glGetUniformLocation(mProgram, "uColor"), color.x, color.y, color.z, color.w);
    glBindBuffer(GL_ARRAY_BUFFER, mBuffer);
    glBufferData(GL_ARRAY_BUFFER, static_cast<GLsizeiptr>(strip.size() * sizeof(InkVertex)), strip.data(),
                 GL_STREAM_DRAW);
    for (GLuint i = 0; i < 2; ++i) {
        std::uintptr_t const offset = std::uintptr_t{i} * 2 * sizeof(float);
        glEnableVertexAttribArray(i);
        glVertexAttribPointer(i, 2, GL_FLOAT, GL_FALSE, sizeof(InkVertex),
                              reinterpret_cast<void const*>(offset));
    }
    glEnable(GL_BLEND);
    glBlendEquation(GL_FUNC_ADD);
    glBlendFunc(GL_ONE, GL_ONE_MINUS_SRC_ALPHA);
    glDrawArrays(GL_TRIANGLE_STRIP, 0, static_cast<GLsizei>(strip.size()));
}

} // namespace Moka::Tool
