#include "bench/canvas/BareShapes.h"

#include <cmath>

namespace Moka::Bench {
namespace {

constexpr char kPlainVertex[] = R"(#version 300 es
layout(location = 0) in vec2 position;
void main() { gl_Position = vec4(position / 512.0 - 1.0, 0.0, 1.0); }
)";
constexpr char kPlainFragment[] = R"(#version 300 es
precision mediump float;
uniform vec4 color;
out vec4 result;
void main() { result = color; }
)";

constexpr char kColoredVertex[] = R"(#version 300 es
layout(location = 0) in vec2 position;
layout(location = 1) in vec4 color;
out vec4 vertexColor;
void main() {
    vertexColor = color;
    gl_Position = vec4(position / 512.0 - 1.0, 0.0, 1.0);
}
)";
constexpr char kColoredFragment[] = R"(#version 300 es
precision mediump float;
in vec4 vertexColor;
out vec4 result;
void main() { result = vertexColor; }
)";

// The following programs have the same features as the library's: a coverage in each vertex, a colour, a
// tint.
constexpr char kTexturedVertex[] = R"(#version 300 es
layout(location = 0) in vec3 vertex;
layout(location = 1) in vec2 texturePosition;
uniform mat4 projection;
out float coverage;
out vec2 uv;
void main() {
    coverage = vertex.z;
    uv = texturePosition;
    gl_Position = projection * vec4(vertex.xy, 0.0, 1.0);
}
)";
constexpr char kTexturedFragment[] = R"(#version 300 es
precision mediump float;
uniform sampler2D source;
uniform vec4 color;
uniform vec4 tint;
uniform int hasTint;
in highp float coverage;
in highp vec2 uv;
out vec4 result;
void main() {
    vec4 texel = texture(source, uv);
    float alpha = coverage * color.a;
    if (hasTint == 1) {
        alpha *= tint.a * texel.a;
        result = vec4(tint.rgb * alpha, alpha);
    } else {
        result = texel * alpha;
    }
}
)";

constexpr char kCoverageVertex[] = R"(#version 300 es
layout(location = 0) in vec3 vertex;
uniform mat4 projection;
out float coverage;
void main() {
    coverage = vertex.z;
    gl_Position = projection * vec4(vertex.xy, 0.0, 1.0);
}
)";
constexpr char kCoverageFragment[] = R"(#version 300 es
precision mediump float;
uniform vec4 color;
uniform vec4 tint;
uniform int hasTint;
in highp float coverage;
out vec4 result;
void main() {
    float alpha = coverage * color.a;
    vec3 rgb = color.rgb;
    if (hasTint == 1) {
        alpha *= tint.a;
        rgb = tint.rgb;
    }
    result = vec4(rgb * alpha, alpha);
}
)";

// The vertex stage of a batch. Each vertex has its position in the shape, the shape's sizes, and a colour.
constexpr char kBatchVertex[] = R"(#version 300 es
layout(location = 0) in vec2 position;
layout(location = 1) in vec4 place;
layout(location = 2) in vec4 color;
out highp vec2 local;
flat out highp vec2 size;
flat out mediump vec4 flatColor;
void main() {
    local = place.xy;
    size = place.zw;
    flatColor = color;
    gl_Position = vec4(position / 512.0 - 1.0, 0.0, 1.0);
}
)";
constexpr char kBatchRectFragment[] = R"(#version 300 es
precision mediump float;
flat in vec4 flatColor;
out vec4 result;
void main() { result = flatColor; }
)";
constexpr char kBatchCoverageVertex[] = R"(#version 300 es
layout(location = 0) in vec2 position;
layout(location = 1) in vec4 place; // u, v, coverage
layout(location = 2) in vec4 color;
out highp float coverage;
out highp vec2 uv;
flat out mediump vec4 flatColor;
void main() {
    coverage = place.z;
    uv = place.xy;
    flatColor = color;
    gl_Position = vec4(position / 512.0 - 1.0, 0.0, 1.0);
}
)";
constexpr char kBatchCoveredRectFragment[] = R"(#version 300 es
precision mediump float;
in highp float coverage;
flat in vec4 flatColor;
out vec4 result;
void main() { result = flatColor * coverage; }
)";
constexpr char kBatchBitmapFragment[] = R"(#version 300 es
precision mediump float;
uniform sampler2D source;
in highp float coverage;
in highp vec2 uv;
flat in vec4 flatColor;
out vec4 result;
void main() { result = texture(source, uv) * (flatColor.a * coverage); }
)";
constexpr char kBatchCircleFragment[] = R"(#version 300 es
precision mediump float;
in highp vec2 local;
flat in highp vec2 size;
flat in vec4 flatColor;
out vec4 result;
void main() { result = flatColor * clamp(size.x + 0.5 - length(local), 0.0, 1.0); }
)";
constexpr char kBatchLineFragment[] = R"(#version 300 es
precision mediump float;
in highp vec2 local;
flat in highp vec2 size;
flat in vec4 flatColor;
out vec4 result;
void main() {
    highp float along = min(local.x, size.y - local.x) + 0.5;
    highp float across = size.x + 0.5 - abs(local.y);
    result = flatColor * clamp(min(along, across), 0.0, 1.0);
}
)";

constexpr char kBlurVertex[] = R"(#version 300 es
layout(location = 0) in vec2 position;
out vec2 uv;
void main() {
    uv = position * 0.5 + 0.5;
    gl_Position = vec4(position, 0.0, 1.0);
}
)";
constexpr char kBlurFragment[] = R"(#version 300 es
precision highp float;
uniform sampler2D source;
uniform vec2 stride;
uniform vec4 tint;
uniform int hasTint;
in vec2 uv;
out vec4 result;
const float weights[5] = float[](0.227027, 0.1945946, 0.1216216, 0.054054, 0.016216);
void main() {
    result = texture(source, uv) * weights[0];
    for (int i = 1; i < 5; ++i) {
        vec2 offset = float(i) * stride;
        result += (texture(source, uv + offset) + texture(source, uv - offset)) * weights[i];
    }
    if (hasTint == 1) {
        float alpha = result.a * tint.a;
        result = vec4(tint.rgb * alpha, alpha);
    }
}
)";

constexpr int kCorners = 6; // of a rectangle: two triangles

Vector4<float> Premultiply(Vector4<float> const& c) { return {c.x * c.w, c.y * c.w, c.z * c.w, c.w}; }

// Calls write(x, y, u, v) for each corner.
template <class Write>
void ForEachCorner(RectF const& r, Write const& write) {
    write(r.left, r.top, 0.0f, 0.0f);
    write(r.right, r.top, 1.0f, 0.0f);
    write(r.left, r.bottom, 0.0f, 1.0f);
    write(r.left, r.bottom, 0.0f, 1.0f);
    write(r.right, r.top, 1.0f, 0.0f);
    write(r.right, r.bottom, 1.0f, 1.0f);
}

// Writes the vertices of a frame to the memory of earlier frames.
class Writer {
public:
    Writer(std::vector<float>& floats, std::size_t count) {
        floats.resize(count);
        mAt = floats.data();
    }
    template <class... Values>
    void Write(Values... values) {
        ((*mAt++ = values), ...);
    }

private:
    float* mAt;
};

void SetUniforms(BareProgram const& program, Vector4<float> const& color) {
    constexpr float kScale = 2.0f / kSide;
    constexpr GLfloat kProjection[16] = {kScale, 0, 0, 0, 0, kScale, 0, 0, 0, 0, 1, 0, -1, -1, 0, 1};
    glUniformMatrix4fv(program.Find("projection"), 1, GL_FALSE, kProjection);
    glUniform4f(program.Find("color"), color.x, color.y, color.z, color.w);
    glUniform1i(program.Find("hasTint"), 0);
}

char const* GetBatchVertex(BareBatch::Shape shape) {
    bool const isCovered = shape == BareBatch::Shape::CoveredRect || shape == BareBatch::Shape::Bitmap;
    return isCovered ? kBatchCoverageVertex : kBatchVertex;
}

char const* GetBatchFragment(BareBatch::Shape shape) {
    switch (shape) {
    case BareBatch::Shape::Rect:
        return kBatchRectFragment;
    case BareBatch::Shape::CoveredRect:
        return kBatchCoveredRectFragment;
    case BareBatch::Shape::Bitmap:
        return kBatchBitmapFragment;
    case BareBatch::Shape::Circle:
        return kBatchCircleFragment;
    case BareBatch::Shape::Line:
        break;
    }
    return kBatchLineFragment;
}

std::size_t CountFloats(std::size_t shapes, int floatsEach) {
    return shapes * kCorners * static_cast<std::size_t>(floatsEach);
}

} // namespace

BareRects::BareRects()
    : mEachProgram(kPlainVertex, kPlainFragment),
      mTogetherProgram(kColoredVertex, kColoredFragment),
      mColor(mEachProgram.Find("color")) {}

void BareRects::DrawEach(int count, int size) {
    Writer writer(mFloats, CountFloats(static_cast<std::size_t>(count), 2));
    for (int i = 0; i < count; ++i)
        ForEachCorner(BoxOf(i, size), [&](float x, float y, float, float) { writer.Write(x, y); });
    mTarget.DrawInto();
    SetBareState();
    mEachProgram.Use();
    mPlain.Upload(mFloats);
    for (int i = 0; i < count; ++i) {
        Vector4<float> const c = Premultiply(ColorOf(i, Colors::Distinct));
        glUniform4f(mColor, c.x, c.y, c.z, c.w);
        glDrawArrays(GL_TRIANGLES, kCorners * i, kCorners);
    }
}

void BareRects::DrawTogether(int count, int size) {
    Writer writer(mFloats, CountFloats(static_cast<std::size_t>(count), 6));
    for (int i = 0; i < count; ++i) {
        Vector4<float> const c = Premultiply(ColorOf(i, Colors::Distinct));
        ForEachCorner(BoxOf(i, size),
                      [&](float x, float y, float, float) { writer.Write(x, y, c.x, c.y, c.z, c.w); });
    }
    mTarget.DrawInto();
    SetBareState();
    mTogetherProgram.Use();
    mColored.Upload(mFloats);
    glDrawArrays(GL_TRIANGLES, 0, mColored.Count(mFloats));
}

BareQuads::BareQuads(int size) : mSource(size, size), mProgram(kTexturedVertex, kTexturedFragment) {}

void BareQuads::Draw(std::vector<RectF> const& dsts) {
    Writer writer(mFloats, CountFloats(dsts.size(), 5));
    for (RectF const& dst : dsts)
        ForEachCorner(dst, [&](float x, float y, float u, float v) { writer.Write(x, y, 1.0f, u, v); });
    mTarget.DrawInto();
    SetBareState();
    mProgram.Use();
    SetUniforms(mProgram, {1, 1, 1, 1});
    mSource.Sample();
    mVertices.Upload(mFloats);
    glDrawArrays(GL_TRIANGLES, 0, mVertices.Count(mFloats));
}

BareBatch::BareBatch(Shape shape, int size)
    : mShape(shape), mSource(size, size), mProgram(GetBatchVertex(shape), GetBatchFragment(shape)) {}

void BareBatch::Draw(int count, int size) {
    constexpr float kLineWidth = 4;
    auto const side = static_cast<float>(size);
    Writer writer(mFloats, CountFloats(static_cast<std::size_t>(count), 10));
    for (int i = 0; i < count; ++i) {
        RectF const box = BoxOf(i, size);
        Vector4<float> const c = Premultiply(ColorOf(i, Colors::Distinct));
        auto const write = [&](float x, float y, float localX, float localY, float width, float length) {
            writer.Write(x, y, localX, localY, width, length, c.x, c.y, c.z, c.w);
        };
        if (mShape == Shape::Rect) {
            ForEachCorner(box, [&](float x, float y, float, float) { write(x, y, 0, 0, 0, 0); });
        } else if (mShape == Shape::CoveredRect || mShape == Shape::Bitmap) {
            ForEachCorner(box, [&](float x, float y, float u, float v) { write(x, y, u, v, 1, 0); });
        } else if (mShape == Shape::Circle) {
            float const half = side / 2;
            PointF const center(box.left + half, box.top + half);
            RectF const hull(box.left - 0.5f, box.top - 0.5f, box.right + 0.5f, box.bottom + 0.5f);
            ForEachCorner(hull, [&](float x, float y, float, float) {
                write(x, y, x - center.x, y - center.y, half, 0);
            });
        } else {
            // The diagonal of the box.
            float const length = std::hypot(side, side);
            float const reach = kLineWidth / 2 + 0.5f;
            float const direction = side / length;
            RectF const local(-reach, -reach, length + reach, reach);
            ForEachCorner(local, [&](float along, float across, float, float) {
                write(box.left + (along - across) * direction, box.top + (along + across) * direction, along,
                      across, kLineWidth / 2, length);
            });
        }
    }
    mTarget.DrawInto();
    SetBareState();
    mProgram.Use();
    mSource.Sample();
    mVertices.Upload(mFloats);
    glDrawArrays(GL_TRIANGLES, 0, mVertices.Count(mFloats));
}

BareLines::BareLines() : mProgram(kCoverageVertex, kCoverageFragment) {}

void BareLines::Draw(std::vector<PointF> const& points, float width, bool antiAliased) {
    std::size_t const segments = points.size() / 2;
    Writer writer(mFloats, CountFloats(segments, 3) * (antiAliased ? 3 : 1));
    for (std::size_t i = 0; i < segments; ++i) {
        PointF const& p = points[2 * i];
        PointF const& q = points[2 * i + 1];
        float const length = std::hypot(q.x - p.x, q.y - p.y);
        float const nx = (q.y - p.y) / length;
        float const ny = (p.x - q.x) / length;
        auto const writeBand = [&](float a, float aCoverage, float b, float bCoverage) {
            writer.Write(p.x + a * nx, p.y + a * ny, aCoverage, p.x + b * nx, p.y + b * ny, bCoverage);
            writer.Write(q.x + a * nx, q.y + a * ny, aCoverage, q.x + a * nx, q.y + a * ny, aCoverage);
            writer.Write(p.x + b * nx, p.y + b * ny, bCoverage, q.x + b * nx, q.y + b * ny, bCoverage);
        };
        float const inner = antiAliased ? width / 2 - 0.5f : width / 2;
        writeBand(-inner, 1, inner, 1);
        if (!antiAliased) continue;
        writeBand(-inner - 1, 0, -inner, 1);
        writeBand(inner, 1, inner + 1, 0);
    }
    mTarget.DrawInto();
    SetBareState();
    mProgram.Use();
    SetUniforms(mProgram, ColorOf(0, Colors::Same));
    mVertices.Upload(mFloats);
    glDrawArrays(GL_TRIANGLES, 0, mVertices.Count(mFloats));
}

BareBlur::BareBlur() : mProgram(kBlurVertex, kBlurFragment), mStep(mProgram.Find("stride")) {}

void BareBlur::Draw() {
    SetBareState();
    glDisable(GL_BLEND);
    mProgram.Use();
    mVertices.Upload({-1, -1, 1, -1, -1, 1, 1, 1});
    mBetween.DrawInto();
    mSource.Sample();
    glUniform2f(mStep, 1.0f / kSide, 0);
    glDrawArrays(GL_TRIANGLE_STRIP, 0, 4);
    mTarget.DrawInto();
    mBetween.Sample();
    glUniform2f(mStep, 0, 1.0f / kSide);
    glDrawArrays(GL_TRIANGLE_STRIP, 0, 4);
}

} // namespace Moka::Bench
