#include "bench/canvas/BareGl.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>

namespace Moka::Bench {
namespace {

GLuint Compile(GLenum stage, char const* source) {
    GLuint const shader = glCreateShader(stage);
    glShaderSource(shader, 1, &source, nullptr);
    glCompileShader(shader);
    GLint compiled = GL_FALSE;
    glGetShaderiv(shader, GL_COMPILE_STATUS, &compiled);
    if (compiled) return shader;
    GLchar text[1024] = {};
    glGetShaderInfoLog(shader, sizeof text, nullptr, text);
    std::fprintf(stderr, "a bare GL program does not compile: %s\n", text);
    std::exit(1);
}

} // namespace

BareProgram::BareProgram(char const* vertexSource, char const* fragmentSource) : mName(glCreateProgram()) {
    GLuint const vertexShader = Compile(GL_VERTEX_SHADER, vertexSource);
    GLuint const fragmentShader = Compile(GL_FRAGMENT_SHADER, fragmentSource);
    glAttachShader(mName, vertexShader);
    glAttachShader(mName, fragmentShader);
    glLinkProgram(mName);
    glDeleteShader(vertexShader);
    glDeleteShader(fragmentShader);
}

BareImage::BareImage(int width, int height) : mWidth(width), mHeight(height) {
    glGenTextures(1, &mTexture);
    glActiveTexture(GL_TEXTURE0);
    glBindTexture(GL_TEXTURE_2D, mTexture);
    glTexStorage2D(GL_TEXTURE_2D, 1, GL_RGBA8, width, height);
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MIN_FILTER, GL_LINEAR);
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MAG_FILTER, GL_LINEAR);
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_WRAP_S, GL_CLAMP_TO_EDGE);
    glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_WRAP_T, GL_CLAMP_TO_EDGE);
    glGenFramebuffers(1, &mFrameBuffer);
    glBindFramebuffer(GL_FRAMEBUFFER, mFrameBuffer);
    glFramebufferTexture2D(GL_FRAMEBUFFER, GL_COLOR_ATTACHMENT0, GL_TEXTURE_2D, mTexture, 0);
    GLfloat const nothing[4] = {};
    glClearBufferfv(GL_COLOR, 0, nothing);
    glBindFramebuffer(GL_FRAMEBUFFER, 0);
}

BareImage::~BareImage() {
    glDeleteFramebuffers(1, &mFrameBuffer);
    glDeleteTextures(1, &mTexture);
}

void BareImage::DrawInto() const {
    glBindFramebuffer(GL_FRAMEBUFFER, mFrameBuffer);
    glViewport(0, 0, mWidth, mHeight);
}

void BareImage::Sample() const {
    glActiveTexture(GL_TEXTURE0);
    glBindTexture(GL_TEXTURE_2D, mTexture);
}

BareVertices::BareVertices(std::initializer_list<int> attributes) {
    for (int const floats : attributes) mFloats += floats;
    glGenVertexArrays(1, &mArray);
    glGenBuffers(1, &mBuffer);
    glBindVertexArray(mArray);
    glBindBuffer(GL_ARRAY_BUFFER, mBuffer);
    GLuint location = 0;
    std::uintptr_t offset = 0;
    for (int const floats : attributes) {
        glEnableVertexAttribArray(location);
        glVertexAttribPointer(location++, floats, GL_FLOAT, GL_FALSE,
                              static_cast<GLsizei>(sizeof(float)) * mFloats,
                              reinterpret_cast<void const*>(offset));
        offset += sizeof(float) * static_cast<std::uintptr_t>(floats);
    }
    glBindVertexArray(0);
}

BareVertices::~BareVertices() {
    glDeleteVertexArrays(1, &mArray);
    glDeleteBuffers(1, &mBuffer);
}

void BareVertices::Upload(std::vector<float> const& vertices) const {
    glBindVertexArray(mArray);
    glBindBuffer(GL_ARRAY_BUFFER, mBuffer);
    glBufferData(GL_ARRAY_BUFFER, static_cast<GLsizeiptr>(vertices.size() * sizeof(float)), vertices.data(),
                 GL_STREAM_DRAW);
}

void SetBareState() {
    glDisable(GL_SCISSOR_TEST);
    glDisable(GL_STENCIL_TEST);
    glDisable(GL_DEPTH_TEST);
    glDisable(GL_CULL_FACE);
    glDisable(GL_DITHER);
    glColorMask(GL_TRUE, GL_TRUE, GL_TRUE, GL_TRUE);
    glEnable(GL_BLEND);
    glBlendEquation(GL_FUNC_ADD);
    glBlendFunc(GL_ONE, GL_ONE_MINUS_SRC_ALPHA);
    glBindSampler(0, 0);
}

} // namespace Moka::Bench
