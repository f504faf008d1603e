#include "apps/moka/PenStroke.h"

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/host/RenderThread.h"
#include "moka/renderer/RendererFactory.h"

#include <GLES3/gl3.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <stdexcept>
#include <string>

namespace Moka::Tool {
namespace {

using Scenes::InkPoint;

constexpr char kVertexShader[] = R"(#version 300 es
uniform mat4 uMatrix;
layout(location = 0) in vec2 aPosition;
layout(location = 1) in vec2 aAcross; // from the middle, and the ink's radius there
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

// Half of the feather lies outside the ink.
constexpr float kFeather = 0.5f;

struct Vertex {
    float x, y;
    float across, radius;
};

struct Direction {
    float x, y;
};

// Of the line at this point, from the one before to the one after.
Direction DirectionAt(std::vector<InkPoint> const& points, std::size_t i) {
    InkPoint const& from = points[i == 0 ? 0 : i - 1];
    InkPoint const& to = points[std::min(i + 1, points.size() - 1)];
    float const length = std::hypot(to.x - from.x, to.y - from.y);
    if (!(length > 0)) return {1, 0};
    return {(to.x - from.x) / length, (to.y - from.y) / length};
}

std::vector<Vertex> MakeStrip(std::vector<InkPoint> const& points) {
    std::vector<Vertex> strip;
    strip.reserve(points.size() * 2);
    for (std::size_t i = 0; i < points.size(); ++i) {
        auto const [x, y, radius] = points[i];
        Direction const along = DirectionAt(points, i);
        for (float const across : {-radius - kFeather, radius + kFeather})
            strip.push_back({x - along.y * across, y + along.x * across, across, radius});
    }
    return strip;
}

void Compile(GLuint program, GLenum stage, char const* source) {
    GLuint const shader = glCreateShader(stage);
    glShaderSource(shader, 1, &source, nullptr);
    glCompileShader(shader);
    glAttachShader(program, shader);
    glDeleteShader(shader); // the program keeps it
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

struct PenStroke::GlInk {
    GLuint program = glCreateProgram();
    GLuint vertexArray = 0;
    GLuint buffer = 0;

    GlInk() {
        glGenVertexArrays(1, &vertexArray);
        glGenBuffers(1, &buffer);
    }
    ~GlInk() {
        glDeleteBuffers(1, &buffer);
        glDeleteVertexArrays(1, &vertexArray);
        glDeleteProgram(program);
    }
    GlInk(GlInk const&) = delete;
    GlInk& operator=(GlInk const&) = delete;

    // Sets all that it depends on, but target, viewport, clip and masks, and gives nothing back.
    void Draw(Matrix4<float> const& matrix, std::vector<Vertex> const& strip,
              Vector4<float> const& color) const {
        glUseProgram(program);
        glUniformMatrix4fv(glGetUniformLocation(program, "uMatrix"), 1, GL_FALSE, matrix.data());
        glUniform4f(glGetUniformLocation(program, "uColor"), color.x, color.y, color.z, color.w);
        glBindVertexArray(vertexArray);
        glBindBuffer(GL_ARRAY_BUFFER, buffer);
        glBufferData(GL_ARRAY_BUFFER, static_cast<GLsizeiptr>(strip.size() * sizeof(Vertex)), strip.data(),
                     GL_STREAM_DRAW);
        for (GLuint i = 0; i < 2; ++i) {
            std::uintptr_t const offset = std::uintptr_t{i} * 2 * sizeof(float);
            glEnableVertexAttribArray(i);
            glVertexAttribPointer(i, 2, GL_FLOAT, GL_FALSE, sizeof(Vertex),
                                  reinterpret_cast<void const*>(offset));
        }
        glEnable(GL_BLEND);
        glBlendEquation(GL_FUNC_ADD);
        glBlendFunc(GL_ONE, GL_ONE_MINUS_SRC_ALPHA);
        glDrawArrays(GL_TRIANGLE_STRIP, 0, static_cast<GLsizei>(strip.size()));
    }
};

PenStroke::PenStroke(RenderThread& thread) : mThread(thread) {}

PenStroke::~PenStroke() {
    mThread.Call([this] {
        // Deleting takes them out of where they are bound.
        RendererFactory::Flush();
        mInk.reset();
        RendererFactory::InvalidateState();
    });
}

void PenStroke::DrawStroke(IMKPenCanvas& canvas, std::vector<InkPoint> const& points,
                           Vector4<float> const& color) {
    IMKBitmap* const bitmap = canvas.GetBitmap();
    if (!bitmap || points.size() < 2) return;
    std::vector<Vertex> const strip = MakeStrip(points);
    mThread.Call([&] {
        if (!mInk) {
            auto ink = std::make_unique<GlInk>();
            Link(ink->program);
            mInk = std::move(ink);
        }
        canvas.EnableClipRT(0);
        bitmap->GetBitmapWritable()->ActivateFrameBufferRT(false);
        mInk->Draw(canvas.GetCanvasMatrix(), strip, color);
        canvas.DisableClipRT();
        bitmap->GetBitmapWritable()->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
    });
}

} // namespace Moka::Tool
