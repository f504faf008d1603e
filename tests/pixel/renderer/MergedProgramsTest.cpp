// Foreign programs whose draws are merged, or are not because their text is not understood: the picture is the one
// that the same draws give one by one.
#include "tests/pixel/renderer/DrawFixture.h"
#include "tests/pixel/renderer/ForeignPrograms.h"

#include "moka/base/log/AndroidLog.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/LogCapture.h"

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
        EXPECT_EQ(RendererFactory::GetStatistics().errors, 0u);
        EXPECT_EQ(RendererFactory::GetStatistics().variants, texts.isMerged ? 1 : 0);
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

} // namespace
} // namespace Moka::Testing
