// Foreign programs whose draws are merged, or are not because their text is not understood: the picture is the one
// that the same draws give one by one.
#include "tests/pixel/renderer/DrawFixture.h"
#include "tests/pixel/renderer/ForeignPrograms.h"

#include "moka/base/log/AndroidLog.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/LogCapture.h"

#include <limits>

namespace Moka::Testing {
namespace {

constexpr int kColumns = 21;
constexpr int kCell = 3; // pixels
constexpr int kTargetSize = kColumns * kCell;

class MergedProgramsTest : public RendererFixture {
protected:
    void TearDown() override {
        End();
        RendererFixture::TearDown();
    }

    void Begin(bool merges) {
        End();
        RendererFactory::DetachContext();
        RendererLimits limits;
        limits.mergesDraws = merges;
        ASSERT_TRUE(Attach(limits));
        RendererFactory::SetDeferred(true);
        image = MakeOffscreen(MakeImage(kTargetSize, kTargetSize, kClear));
        texel = MakeTexture(MakeImage(2, 2, {200, 100, 50, 255}));
        mask = MakeTexture(MakeImage(2, 2, {0, 80, 160, 255}));
        VertexDescriptor layout;
        layout.addAttribute(VertexAttributeType::Float, 2, -1, 0);
        layout.addAttribute(VertexAttributeType::Float, 2, -1, 0);
        quad.reset(RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &layout, 0, 0));
    }
    void End() {
        program.reset();
        quad.reset();
        texel.reset();
        mask.reset();
        image = {};
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
        std::uint64_t const before = RendererFactory::GetStatistics().draws;
        RendererFactory::Flush();
        return static_cast<int>(RendererFactory::GetStatistics().draws - before);
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

TEST_F(MergedProgramsTest, OnesThatAreUnderstoodDrawTheSameWithOneCall) {
    for (Texts const& texts : kUnderstood) {
        Picture const expected = DrawOneByOne(texts, 40);
        Begin(true);
        MakeProgram(texts);
        DrawCells(40);
        EXPECT_EQ(Flush(), 1) << texts.subject;
        EXPECT_LE(CompareImages(ReadTarget(), expected).largest, 1) << texts.subject;
        EXPECT_EQ(RendererFactory::GetStatistics().errors, 0u) << texts.subject;
    }
}

TEST_F(MergedProgramsTest, OthersAreDrawnOneByOneAndSayWhyOnce) {
    for (Texts const& texts : kForeign) {
        Picture const expected = DrawOneByOne(texts, 40);
        Begin(true);
        LogCapture const log;
        MakeProgram(texts);
        for (int i = 0; i < 2; ++i) {
            DrawCells(40);
            EXPECT_EQ(Flush(), 40) << texts.subject;
        }
        EXPECT_EQ(log.Count(ANDROID_LOG_INFO, "foreign: draws with different values are not merged: "), 1)
            << texts.subject;
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 0) << texts.subject;
        EXPECT_EQ(ReadTarget(), expected) << texts.subject;
        EXPECT_EQ(RendererFactory::GetStatistics().errors, 0u) << texts.subject;
        EXPECT_EQ(RendererFactory::GetStatistics().variants, 0) << texts.subject;
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
        EXPECT_EQ(RendererFactory::GetStatistics().runEnds[static_cast<std::size_t>(RunEnd::Full)],
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
        EXPECT_EQ(RendererFactory::GetStatistics().variants, std::min(number + 1, 16));
    }
    EXPECT_EQ(CountGlPrograms(), before + 17);
    program.reset();
    EXPECT_EQ(CountGlPrograms(), before);
    EXPECT_EQ(RendererFactory::GetStatistics().variants, 0);
}

TEST_F(MergedProgramsTest, ValuesThatAreNoNumbersDoNotReachOtherDraws) {
    auto const draw = [this](bool merges) {
        Begin(merges);
        MakeProgram(kWide);
        image.target->Activate();
        program->MakeCurrent();
        for (int i = 0; i < 60; ++i) {
            SetValues(i);
            std::array<float, 4> nowhere{};
            nowhere.fill(std::numeric_limits<float>::quiet_NaN());
            if (i % 3 == 1) Set("color", BindingTypeVector4, nowhere);
            if (i % 3 == 2) Set("number", BindingTypeFloat, nowhere[0]);
            DrawCell(i);
        }
        RendererFactory::Flush();
        EXPECT_EQ(RendererFactory::GetStatistics().errors, 0u);
        return ReadTarget();
    };
    Picture const expected = draw(false);
    Picture const merged = draw(true);
    EXPECT_EQ(RendererFactory::GetStatistics().draws, 1u);
    for (int i = 0; i < 60; i += 3) {
        int const x = i % kColumns * kCell + 1;
        int const y = i / kColumns * kCell + 1;
        EXPECT_EQ(merged.GetColor(x, y), expected.GetColor(x, y)) << i;
    }
}

// Edges that pass through the centres of pixels: the last bit of a position decides over each.
TEST_F(MergedProgramsTest, PositionsAgreeToTheBit) {
    constexpr Texts kTurned{
        "turned",
        "attribute vec2 corner; uniform mat4 matrix; uniform vec2 pair; uniform highp float number;"
        "void main() { vec2 p = (corner * pair * 1.5 + number) / number - 1.0;"
        "gl_Position = matrix * vec4(p, 0.0, 1.0); }",
        "precision highp float; uniform vec4 color; void main() { gl_FragColor = color; }"};
    BlendStateDescriptor add(true);
    add.SetColorEquation(BlendingFunction::Add, BlendingFactor::One, BlendingFactor::One);
    add.SetAlphaEquation(BlendingFunction::Add, BlendingFactor::One, BlendingFactor::One);
    auto const draw = [&](bool merges) {
        Begin(merges);
        MakeProgram(kTurned);
        BlendPtr const blend(RendererFactory::CreateBlendStateObject(add));
        blend->Apply();
        image.target->Activate();
        program->MakeCurrent();
        Set("color", BindingTypeVector4, std::array<float, 4>{2 / 255.0f, 0, 0, 0});
        for (int i = 0; i < 100; ++i) {
            // A cell of three pixels that grows by three and turns by an angle whose tangent is a ratio of two odd
            // numbers.
            std::array<float, 16> matrix{};
            matrix[0] = matrix[5] = static_cast<float>(i % 3 * 2 + 1) / 3;
            matrix[1] = static_cast<float>(i % 5 * 2 + 1) / 3;
            matrix[4] = -matrix[1];
            matrix[12] = static_cast<float>(i % 9 - 4) * 2 / kTargetSize;
            matrix[15] = 1;
            float const number = 0.7f + static_cast<float>(i) * 0.013f;
            Set("matrix", BindingTypeMatrix4, matrix);
            Set("pair", BindingTypeVector2, std::array<float, 2>{2 * number, 2 * number});
            Set("number", BindingTypeFloat, number);
            DrawCell(kColumns * kColumns / 2);
        }
        RendererFactory::Flush();
        return ReadTarget();
    };
    Picture const expected = draw(false);
    EXPECT_FALSE(expected == MakeImage(kTargetSize, kTargetSize, kClear));
    EXPECT_EQ(draw(true), expected);
    EXPECT_EQ(RendererFactory::GetStatistics().draws, 1u);
}

} // namespace
} // namespace Moka::Testing
