// ForeignPrograms.h: programs with odd declarations. Places are "corner" or the first attribute, in normalized device
// coordinates; uniforms are named color, other, pair, number, count, flag, matrix, texel and mask.
#pragma once

namespace Moka::Testing {

#define MOKA_VERTEX "attribute vec2 corner; attribute vec2 uv; "
#define MOKA_PLAIN MOKA_VERTEX "void main() { gl_Position = vec4(corner, 0.0, 1.0); }"

struct Texts {
    char const* subject;
    char const* vertex;
    char const* fragment;
    bool isMerged = true; // otherwise each draw is a call
};

inline constexpr Texts kPlain{
    "plain", MOKA_PLAIN, "precision highp float; uniform vec4 color; void main() { gl_FragColor = color; }"};
// Records of 96 bytes.
inline constexpr Texts kWide{
    "wide",
    "attribute vec2 corner; uniform mat4 matrix; uniform highp float number;"
    "void main() { gl_Position = matrix * vec4(corner, number, 1.0); }",
    "precision highp float; uniform vec4 color; void main() { gl_FragColor = color; }"};

inline constexpr Texts kPrograms[] = {
    {"precision statements", MOKA_PLAIN,
     "precision lowp float; precision mediump int; precision highp float;"
     "uniform vec4 color; uniform lowp vec2 pair; uniform mediump float number;"
     "void main() { gl_FragColor = color * vec4(pair, number, 1.0); }"},
    {"comments", MOKA_PLAIN,
     "precision highp float;\nuniform /* ; */ highp // , }\n vec4 /**/ color /* { */ ; //uniform float "
     "gone;\n"
     "void main(/* none */ void) { gl_FragColor = color; }"},
    {"macros", MOKA_PLAIN,
     "#define HALF 0.5\n#define SCALE(x) ((x) * HALF)\n#ifdef HALF\n#define ALPHA 1.0\n#else\n#define ALPHA "
     "0.0\n"
     "#endif\nprecision highp float; uniform vec4 color; uniform float number;\n"
     "void main() { gl_FragColor = vec4(SCALE(color.rgb) + number * HALF, ALPHA); }"},
    {"shared names",
     MOKA_VERTEX "uniform highp vec4 color; uniform highp float number; varying highp vec2 at;"
                 "void main() { at = uv * number; gl_Position = vec4(corner, color.x * 0.1, 1.0); }",
     "precision highp float; uniform vec4 color; uniform float number; varying vec2 at;"
     "void main() { gl_FragColor = vec4(at, number, color.y); }"},
    {"names in a row", MOKA_PLAIN,
     "uniform highp vec4 color,other /* two */, unused;\nuniform highp float number; void main()"
     "{ gl_FragColor = color + other * number; }"},
    {"hidden by a local variable", MOKA_PLAIN,
     "precision highp float; uniform vec4 color; uniform float number;"
     "float hide() { float number = 0.25; { vec2 color = vec2(number); number = color.x; } return number; }"
     "void main() { gl_FragColor = color * hide() + number * 0.5; }"},
    {"hidden by a parameter", MOKA_PLAIN,
     "precision highp float; uniform vec4 color, other;"
     "vec4 turn(vec4 other, inout vec4 color) { color = color * 0.5; return other.bgra; }"
     "void main() { vec4 c = color; vec4 d = turn(color, c); gl_FragColor = c + d * 0.5 + other * 0.1; }"},
    {"integers",
     MOKA_VERTEX "uniform highp int count; uniform bool flag; void main() {"
                 "gl_Position = vec4(flag ? corner : corner * 0.9, float(count) * 0.1, 1.0); }",
     "precision highp float; uniform bool flag; uniform highp int count; uniform vec4 color;"
     "void main() { vec4 c = flag ? color : color.bgra;"
     "for (int i = 0; i < 3; ++i) { if (i < count) c *= 0.75; } gl_FragColor = c; }"},
    {"early exits", MOKA_PLAIN,
     "precision mediump float; uniform vec4 color; uniform vec2 pair;"
     "void main() { if (pair.x < 0.3) discard; gl_FragColor = color; if (pair.y < 0.5) return;"
     "gl_FragColor.rgb *= gl_FragColor.a; }"},
    {"samplers",
     MOKA_VERTEX "varying highp vec2 at; void main() { at = uv; gl_Position = vec4(corner, 0.0, 1.0); }",
     "precision highp float; uniform sampler2D texel; uniform lowp sampler2D mask; uniform vec4 color;"
     "varying vec2 at;"
     "void main() { gl_FragColor = texture2D(texel, at) * color + texture2D(mask, at, 0.0) * 0.5; }"},
    {"GLSL ES 3.00",
     "#version 300 es\nlayout(location = 0) in vec2 corner; layout(location = 1) in highp vec2 uv;\n"
     "uniform mat4 matrix; out highp vec2 at; flat out highp int number_;\n"
     "void main() { number_ = 1; at = uv; gl_Position = matrix * vec4(corner, 0, 1); }",
     "#version 300 es\nprecision highp float; uniform vec4 color; uniform int count; uniform bool flag;\n"
     "in vec2 at; flat in int number_; layout(location = 0) out vec4 result;\n"
     "void main() { result = flag ? color * float(number_) : vec4(at, 0, 1); result.g = float(count) * 0.5; "
     "}"},
    {"attributes in another order than their names'",
     "attribute vec2 zulu; attribute vec2 alpha; varying mediump vec2 at[2];"
     "void main() { at[0] = alpha; at[1] = alpha.yx; gl_Position = vec4(zulu, 0.0, 1.0); }",
     "precision mediump float; uniform float number; varying vec2 at[2];"
     "void main() { gl_FragColor = vec4(at[0] * number, at[1].x, 1.0); }"},
    {"gl_VertexID",
     "#version 300 es\nin vec2 corner; void main() { gl_Position = vec4(corner, float(gl_VertexID) * 0.0, "
     "1); }",
     "#version 300 es\nuniform highp vec4 color; out highp vec4 c; void main() { c = color; }", false},
    {"a name that GLSL ES 3.00 reserves", MOKA_PLAIN,
     "precision highp float; uniform vec4 color; void main() { vec4 centroid = color; gl_FragColor = "
     "centroid; }",
     false},
    {"a macro that declares", MOKA_PLAIN,
     "#define INPUT uniform\nprecision highp float; INPUT vec4 color; void main() { gl_FragColor = color; }",
     false},
};

} // namespace Moka::Testing
