#include "tests/pixel/pen/ForeignInk.h"

#include <gtest/gtest.h>

namespace Moka::Testing {
namespace {

constexpr char kVertexShader[] = R"(#version 300 es
uniform mat4 uMatrix;
layout(location = 0) in vec2 aPosition;
void main() { gl_Position = uMatrix * vec4(aPosition, 0.0, 1.0); }
)";

constexpr char kFragmentShader[] = R"(#version 300 es
precision highp float;
out vec4 oColor;
void main() { oColor = vec4(0.0, 1.0, 0.0, 1.0); }
)";

void Compile(GLuint program, GLenum stage, char const* source) {
    GLuint const shader = glCreateShader(stage);
    glShaderSource(shader, 1, &source, nullptr);
    glCompileShader(shader);
    glAttachShader(program, shader);
    glDeleteShader(shader);
}

} // namespace

ForeignInk::ForeignInk() : mProgram(glCreateProgram()) {
    Compile(mProgram, GL_VERTEX_SHADER, kVertexShader);
    Compile(mProgram, GL_FRAGMENT_SHADER, kFragmentShader);
    glLinkProgram(mProgram);
    glGenVertexArrays(1, &mVertexArray);
    glGenBuffers(1, &mBuffer);
    glGenTextures(1, &mTexture);
    glGenSamplers(1, &mSampler);
}

ForeignInk::~ForeignInk() {
    glDeleteSamplers(1, &mSampler);
    glDeleteTextures(1, &mTexture);
    glDeleteBuffers(1, &mBuffer);
    glDeleteVertexArrays(1, &mVertexArray);
    glDeleteProgram(mProgram);
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

void ForeignInk::Fill(RectF const& rect, Matrix4<float> const& matrix) const {
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
    GLfloat const corners[] = {rect.left, rect.top, rect.left,  rect.bottom, rect.right, rect.bottom,
                               rect.left, rect.top, rect.right, rect.bottom, rect.right, rect.top};
    glUseProgram(mProgram);
    glUniformMatrix4fv(glGetUniformLocation(mProgram, "uMatrix"), 1, GL_FALSE, matrix.data());
    glBindVertexArray(mVertexArray);
    glBindBuffer(GL_ARRAY_BUFFER, mBuffer);
    glBufferData(GL_ARRAY_BUFFER, sizeof(corners), corners, GL_STREAM_DRAW);
    glEnableVertexAttribArray(0);
    glVertexAttribPointer(0, 2, GL_FLOAT, GL_FALSE, 0, nullptr);
    glDisable(GL_BLEND);
    glDrawArrays(GL_TRIANGLES, 0, 6);
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

void ForeignInk::LeaveAMess() const {
    glEnable(GL_BLEND);
    glBlendEquation(GL_FUNC_REVERSE_SUBTRACT);
    glBlendFunc(GL_ZERO, GL_ZERO);
    glColorMask(GL_FALSE, GL_TRUE, GL_FALSE, GL_FALSE);
    glEnable(GL_SCISSOR_TEST);
    glScissor(1, 1, 2, 2);
    glViewport(3, 3, 5, 4);
    glEnable(GL_STENCIL_TEST);
    glStencilFunc(GL_NEVER, 0, 255);
    glStencilMask(0);
    glEnable(GL_DEPTH_TEST);
    glDepthFunc(GL_NEVER);
    glEnable(GL_CULL_FACE);
    glCullFace(GL_FRONT_AND_BACK);
    for (GLenum unit = 0; unit < 3; ++unit) {
        glActiveTexture(GL_TEXTURE0 + unit);
        glBindTexture(GL_TEXTURE_2D, mTexture); // has no image
        glBindSampler(unit, mSampler);
    }
    glPixelStorei(GL_UNPACK_ALIGNMENT, 8);
    glPixelStorei(GL_UNPACK_SKIP_ROWS, 2);
    glPixelStorei(GL_PACK_ROW_LENGTH, 3);
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
    glClearColor(1, 0, 1, 1);
    glUseProgram(mProgram);
    glBindVertexArray(mVertexArray);
    EXPECT_EQ(glGetError(), static_cast<GLenum>(GL_NO_ERROR));
}

} // namespace Moka::Testing
