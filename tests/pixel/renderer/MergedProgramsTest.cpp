// Foreign programs whose draws are merged, or are not because their text is not understood: the picture is the one
// that the same draws give one by one.
#include "tests/pixel/renderer/DrawFixture.h"

#include "moka/base/log/AndroidLog.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/LogCapture.h"

namespace Moka::Testing {
namespace {

// Programs with odd declarations. Places are "corner" or the first attribute, in normalized device coordinates; uniforms
// are named color, other, pair, number, count, flag, matrix, texel and mask.
#define MOKA_VERTEX "attribute vec2 corner; attribute vec2 uv; "
#define MOKA_PLAIN MOKA_VERTEX "void main() { gl_Position = vec4(corner, 0.0, 1.0); }"

struct Texts {
    char const* subject;
    char const* vertex;
    char const* fragment;
    bool isMerged = true; // otherwise each draw is a call
};

constexpr Texts kPlain{"plain", MOKA_PLAIN,
                       "precision highp float; uniform vec4 color; void main() { gl_FragColor = color; }"};
// Records of 96 bytes.
constexpr Texts kWide{"wide",
                      "attribute vec2 corner; uniform mat4 matrix; uniform highp float number;"
                      "void main() { gl_Position = matrix * vec4(corner, number, 1.0); }",
                      "precision highp float; uniform vec4 color; void main() { gl_FragColor = color; }"};

constexpr Texts kPrograms[] = {
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
    {"precision statements, names in a row, and one hidden by a local variable", MOKA_PLAIN,
     "precision lowp float; precision mediump int; precision highp float;"
     "uniform lowp vec4 color,other /* two */, unused; uniform mediump float number;"
     "float hide() { float number = 0.25; { vec2 color = vec2(number); number = color.x; } return number; }"
     "void main() { gl_FragColor = color * hide() + other * number * 0.5; }"},
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
    {"a name that GLSL ES 3.00 reserves", MOKA_PLAIN,
     "precision highp float; uniform vec4 color; void main() { vec4 centroid = color; gl_FragColor = "
     "centroid; }",
     false},
    {"a macro that declares", MOKA_PLAIN,
     "#define INPUT uniform\nprecision highp float; INPUT vec4 color; void main() { gl_FragColor = color; }",
     false},
};

constexpr int kColumns = 21;
constexpr int kCell = 3; // pixels
constexpr int kTargetSize = kColumns * kCell;

class MergedProgramsTest : public RendererFixture {
protected:
    void Begin(bool merges) {
        RendererFactory::DetachContext();
        RendererLimits limits;
        limits.mergesDraws = merges;
        ASSERT_TRUE(Attach(limits));
        RendererFactory::SetDeferred(true);
        image = MakeOffscreen(MakeImage(kTargetSize, kTargetSize, kClear));
        texel = MakeTexture(MakeImage(2, 2, {200, 100, 50, 255}));
        mask = MakeTexture(MakeImage(2, 2, {0, 80, 160, 255}));
        quad = MakeGraphics(2);
    }
    void MakeProgram(Texts const& texts) {
        program.reset(RendererFactory::CreateShaderProgram(texts.vertex, texts.fragment, "foreign"));
    }

    template <class T>
    void Set(char const* name, BindingType type, T const& value) const {
        ParameterPtr const parameter(program->GetParameter(name));
        if (parameter->GetType() == type) parameter->Set(&value);
    }

    // What every uniform is for the draw.
    void SetValues(int number) const {
        auto const share = [number](int step) { return static_cast<float>(number * step % 16) / 15; };
        Set("color", BindingTypeVector4, std::array<float, 4>{share(3), share(5), share(7), 0.5f});
        Set("other", BindingTypeVector4, std::array<float, 4>{share(1), share(7), share(11), 0.5f});
        Set("pair", BindingTypeVector2, std::array<float, 2>{share(5), share(9)});
        Set("number", BindingTypeFloat, share(13));
        Set("count", BindingTypeInt, number % 3);
        Set("flag", BindingTypeBool, number % 2 == 0);
        std::array<float, 16> matrix{};
        for (std::size_t i = 0; i < 16; i += 5) matrix[i] = 1;
        matrix[12] = share(3) / 64;
        Set("matrix", BindingTypeMatrix4, matrix);
        Set("texel", BindingTypeTextureUnit, 2);
        Set("mask", BindingTypeTextureUnit, 3);
    }
    // The number of its cell, from the lower left.
    void DrawCell(int number) const {
        auto const toPlace = [](int cell) { return static_cast<float>(2 * cell) / kColumns - 1; };
        float const l = toPlace(number % kColumns);
        float const b = toPlace(number / kColumns % kColumns);
        float const s = 2.0f / kColumns;
        float const corners[] = {l, b,     0, 0, l + s, b, 1, 0, l,     b + s, 0, 1,
                                 l, b + s, 0, 1, l + s, b, 1, 0, l + s, b + s, 1, 1};
        quad->SetVertices(0, corners, 6);
        EXPECT_TRUE(quad->Draw(0, -1, 1));
    }
    void DrawCells(int count) const {
        texel->Bind(2);
        mask->Bind(3);
        image.target->Activate();
        program->MakeCurrent();
        for (int i = 0; i < count; ++i) {
            SetValues(i);
            DrawCell(i);
        }
    }
    // The draw calls that it takes.
    int Flush() const {
        std::uint64_t const before = Count().draws;
        RendererFactory::Flush();
        return static_cast<int>(Count().draws - before);
    }
    Picture ReadTarget() const { return RendererFixture::Read(*image.target, kTargetSize, kTargetSize); }

    Picture DrawOneByOne(Texts const& texts, int count) {
        Begin(false);
        MakeProgram(texts);
        DrawCells(count);
        EXPECT_GE(Flush(), count / 2) << texts.subject;
        Picture const picture = ReadTarget();
        EXPECT_FALSE(picture == MakeImage(kTargetSize, kTargetSize, kClear)) << texts.subject;
        return picture;
    }

    static int CountGlPrograms() {
        int count = 0;
        for (GLuint name = 1; name < 200; ++name) count += glIsProgram(name) ? 1 : 0;
        return count;
    }

    OffscreenImage image;
    TexturePtr texel;
    TexturePtr mask;
    GraphicsPtr quad;
    ProgramPtr program;
};

TEST_F(MergedProgramsTest, ThoseThatAreUnderstoodDrawWithOneCallAndOthersOneByOneAndSayWhyOnce) {
    for (Texts const& texts : kPrograms) {
        SCOPED_TRACE(texts.subject);
        Picture const expected = DrawOneByOne(texts, 40);
        Begin(true);
        LogCapture const log;
        MakeProgram(texts);
        for (int i = 0; i < 2; ++i) {
            DrawCells(40);
            EXPECT_EQ(Flush(), texts.isMerged ? 1 : 40);
        }
        EXPECT_EQ(log.Count(ANDROID_LOG_INFO, "foreign: draws with different values are not merged: "),
                  texts.isMerged ? 0 : 1);
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 0);
        EXPECT_LE(CompareImages(ReadTarget(), expected).largest, texts.isMerged ? 1 : 0);
        EXPECT_EQ(Count().errors, 0u);
        EXPECT_EQ(Count().variants, texts.isMerged ? 1 : 0);
    }
}

TEST_F(MergedProgramsTest, AFullBlockIsOneCallAndWhatIsLeftAnother) {
    constexpr int kBlock = 16384 / 96;
    struct {
        int draws;
        int calls;
    } const cases[] = {{kBlock, 1}, {kBlock + 1, 2}, {2 * kBlock, 2}, {2 * kBlock + 1, 3}};
    for (auto const& [draws, calls] : cases) {
        Picture const expected = DrawOneByOne(kWide, draws);
        Begin(true);
        MakeProgram(kWide);
        DrawCells(draws);
        EXPECT_EQ(Flush(), calls) << draws;
        EXPECT_EQ(CompareImages(ReadTarget(), expected).largest, 0) << draws;
        EXPECT_EQ(Count().runEnds[static_cast<std::size_t>(RunEnd::Full)],
                  static_cast<std::uint64_t>(calls - 1));
    }
}

TEST_F(MergedProgramsTest, AShortRunIsMergedAtItsSecondSightAndAtMostFourProgramsInAFlush) {
    Begin(true);
    MakeProgram(kPlain);
    for (int const calls : {3, 1, 1}) {
        DrawCells(3);
        EXPECT_EQ(Flush(), calls);
    }
    std::vector<ProgramPtr> programs;
    for (int i = 0; i < 6; ++i) {
        programs.emplace_back(RendererFactory::CreateShaderProgram(kPlain.vertex, kPlain.fragment, "one"));
    }
    for (int const calls : {4 + 2 * 40, 6}) {
        for (ProgramPtr& one : programs) {
            std::swap(program, one);
            DrawCells(40);
            std::swap(program, one);
        }
        EXPECT_EQ(Flush(), calls);
    }
}

TEST_F(MergedProgramsTest, AProgramHasSixteenVariantsAtMostAndTakesThemWithIt) {
    constexpr Texts kCounted{"counted", MOKA_PLAIN,
                             "precision highp float; uniform vec4 color; uniform highp int number;"
                             "void main() { gl_FragColor = vec4(color.rgb, float(number) / 255.0); }"};
    Begin(true);
    int const before = CountGlPrograms();
    MakeProgram(kCounted);
    for (int number = 0; number < 20; ++number) {
        Set("number", BindingTypeInt, number);
        DrawCells(32);
        EXPECT_EQ(Flush(), 1) << number;
        EXPECT_EQ(ReadTarget().GetColor(1, 1)[3], number);
        EXPECT_EQ(Count().variants, std::min(number + 1, 16));
    }
    EXPECT_EQ(CountGlPrograms(), before + 17);
    program.reset();
    EXPECT_EQ(CountGlPrograms(), before);
    EXPECT_EQ(Count().variants, 0);
}

} // namespace
} // namespace Moka::Testing
