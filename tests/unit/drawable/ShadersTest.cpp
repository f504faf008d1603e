// The twelve classes: what they ask the renderer for, in which order, and what reaches it.
#include "moka/graphics/drawable/ShaderExceptions.h"
#include "tests/unit/drawable/ShaderFixture.h"

#include <algorithm>

namespace Moka::Testing {

#define EVERY_KIND_UNIFORMS(U)                                                                               \
    U(Bool, flag)                                                                                            \
    U(Matrix4, matrix)                                                                                       \
    U(Vector2, pair)                                                                                         \
    U(Vector4, color)                                                                                        \
    U(Float, number)                                                                                         \
    U(Int, count)                                                                                            \
    U(TextureUnit, texture)                                                                                  \
    U(Vector4, missing)
MOKA_SHADER_CLASS(EveryKindShader, EVERY_KIND_UNIFORMS)
MOKA_SHADER_DEFINITION(EveryKindShader, EVERY_KIND_UNIFORMS, "uniform mat4 matrix; attribute vec4 missing;",
                       "uniform bool flag; uniform vec2 pair; uniform vec4 color; uniform float number;"
                       "uniform int count; uniform sampler2D texture;")

namespace {

using ::testing::ElementsAre;
using ::testing::ElementsAreArray;
using ::testing::IsEmpty;
using ::testing::StartsWith;

class ShadersTest : public ShaderFixture {
protected:
    // uniforms: name and type, as the renderer is asked.
    template <class T>
    static void Expect(char const* name, std::vector<std::string> const& uniforms) {
        RecordingRenderer::Reset();
        RendererFactory::AttachContext();
        std::vector<std::string> made = {"program 1 Create " + std::string(name)};
        std::vector<std::string> released;
        for (std::string const& uniform : uniforms) {
            made.push_back("program 1 GetParameter " + uniform);
            released.push_back("program 1 ReleaseParameter " + uniform.substr(0, uniform.find(' ')));
        }
        released.push_back("program 1 Release");
        std::reverse(released.begin(), released.end());
        auto* const shader = ShaderManager::GetInstance()->GetShader<T>();
        EXPECT_THAT(RecordingRenderer::TakeCalls(), ElementsAreArray(made)) << name;
        ShaderManager::GetInstance()->ReleaseShader(shader);
        EXPECT_THAT(RecordingRenderer::TakeCalls(), ElementsAreArray(released)) << name;
        EXPECT_THAT(RecordingRenderer::GetViolations(), IsEmpty());
    }
};

TEST_F(ShadersTest, EachClassCompilesUnderItsNameAndBindsItsUniformsInOrder) {
    std::vector<std::string> const color = {"uProjectionMatrix 2", "uColor 5", "uTintColor 5",
                                            "uHasTintColor 7"};
    auto const colorAnd = [&](std::vector<std::string> const& more) {
        std::vector<std::string> all = color;
        all.insert(all.end(), more.begin(), more.end());
        return all;
    };
    std::vector<std::string> const bitmap = {"uProjectionMatrix 2", "uSrcTexture 8", "uColor 5",
                                             "uTintColor 5", "uHasTintColor 7"};
    Expect<MKRectShader>("MKRectShader", color);
    Expect<MKRoundRectShader>("MKRoundRectShader", color);
    Expect<MKRoundRectRoundShader>("MKRoundRectRoundShader",
                                   colorAnd({"uIsFill 7", "uStrokeWidth 6", "uRxry 3"}));
    Expect<MKCircleShader>("MKCircleShader",
                           colorAnd({"uIsFill 7", "uStrokeWidth 6", "uCenter 3", "uRadius 6"}));
    Expect<MKLineShader>("MKLineShader", colorAnd({"uLineInfo 3", "uIsDashedLine 7", "uDashedLinePattern 5",
                                                   "uDashedLinePatternLength 6", "uLineCapType 7"}));
    Expect<MKBitmapShader>("MKBitmapShader", bitmap);
    Expect<MKBitmapShaderColorClamp>("MKBitmapShaderColorClamp", bitmap);
    Expect<MKBitmapAdvancedBlendingShader>("MKBitmapAdvancedBlendingShader",
                                           {"uProjectionMatrix 2", "uSrcTexture 8", "uDstTexture 8",
                                            "uColor 5", "uTintColor 5", "uDstTextureSize 3",
                                            "uHasTintColor 7", "uBlendingMode 7"});
    Expect<MKBlenderBitmapsShader>("MKBlenderBitmapsShader",
                                   {"uProjectionMatrix 2", "uSrcTexture1 8", "uSrcTexture2 8", "uFactor 6",
                                    "uColor 5", "uTintColor 5", "uHasTintColor 7"});
    Expect<MKTextMaskBitmapShader>("MKTextMaskBitmapShader",
                                   {"uProjectionMatrix 2", "uSrcTexture 8", "uMaskColor 5"});
    Expect<MKNonPremultipliedColorShader>("MKNonPremultipliedColorShader",
                                          {"projectionMatrix 2", "srcTexture 8", "dstTexture 8"});
    Expect<MKGaussianBlurShader>("MKGaussianBlurShader",
                                 {"projectionMatrix 2", "srcTexture 8", "uTintColor 5", "uHasTintColor 7",
                                  "isHorizontal 1", "blurAmount 6"});
}

TEST_F(ShadersTest, AssignedValuesReachTheProgramAndMissingUniformsSwallowThem) {
    {
        EveryKindShader shader;
        EXPECT_THAT(log.GetTexts(), IsEmpty());
        RecordingRenderer::TakeCalls();
        shader.program->MakeCurrent();
        shader.flag = true;
        shader.matrix = Matrix4<float>(1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16);
        shader.pair = Vector2<float>(0.5f, -1);
        shader.color = Vector4<float>(1, 0.25f, 0, 1);
        shader.number = 2.5f;
        shader.count = -3;
        (shader.texture = 1) = 2; // the assignment gives the binding back
        shader.missing = Vector4<float>();
        EXPECT_EQ(RecordingRenderer::GetCurrentProgram(), "program 1");
        auto const value = [&](char const* name) {
            return RecordingRenderer::GetParameter(shader.program, name);
        };
        EXPECT_EQ(value("flag"), "1");
        EXPECT_EQ(value("matrix"), "1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16");
        EXPECT_EQ(value("pair"), "0.5 -1");
        EXPECT_EQ(value("color"), "1 0.25 0 1");
        EXPECT_EQ(value("number"), "2.5");
        EXPECT_EQ(value("count"), "-3");
        EXPECT_EQ(value("texture"), "2");
        EXPECT_EQ(RecordingRenderer::CountCalls("SetParameter"), 9);
    }
    EXPECT_EQ(RecordingRenderer::GetCurrentProgram(), "none");
    EXPECT_THAT(log.GetTexts(), IsEmpty());
}

TEST_F(ShadersTest, AssigningToWhatWasNeverBoundOrFailedToBindThrows) {
    EveryKindShader shader;
    ParameterBinding<BindingTypeFloat> binding;
    for (bool failed : {false, true}) {
        if (failed) {
            binding.bind(shader.program, "number");
            // Rebinding gives the handle up, and fails.
            EXPECT_THROW(binding.bind(shader.program, "count"), InvalidArgumentException);
        }
        log.Clear();
        try {
            binding = 1.0f;
            ADD_FAILURE() << "nothing thrown";
        } catch (std::exception const& e) {
            EXPECT_NE(dynamic_cast<NotSupportedException const*>(&e), nullptr);
            EXPECT_STREQ(e.what(), "ParameterBinding: internal interface is not initialized!");
        }
        EXPECT_THAT(log.GetTexts(ANDROID_LOG_ERROR),
                    ElementsAre("ParameterBinding: internal interface is not initialized!"));
    }
    EXPECT_EQ(RecordingRenderer::CountCalls("SetParameter"), 0);
    EXPECT_EQ(RecordingRenderer::CountCalls("ReleaseParameter"), 2);
}

} // namespace
} // namespace Moka::Testing
