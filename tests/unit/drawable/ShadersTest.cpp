// A class with a uniform of each kind: in which order they are bound, and what reaches the renderer. That the
// thirteen classes fit their programs is tested with a driver.
#include "moka/graphics/drawable/ShaderExceptions.h"
#include "tests/unit/drawable/ShaderFixture.h"

#include <filesystem>
#include <fstream>

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
using ::testing::IsEmpty;

class ShadersTest : public ShaderFixture {};

TEST_F(ShadersTest, AssignedValuesReachTheProgramAndMissingUniformsSwallowThem) {
    {
        RendererTrace::TakeCalls();
        EveryKindShader shader;
        std::string const get = "program 1 GetParameter ";
        EXPECT_THAT(RendererTrace::TakeCalls(),
                    ElementsAre("program 1 Create EveryKindShader", get + "flag 1", get + "matrix 2",
                                get + "pair 3", get + "color 5", get + "number 6", get + "count 7",
                                get + "texture 8", get + "missing 0"));
        shader.program->MakeCurrent();
        shader.flag = true;
        shader.matrix = Matrix4<float>(1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16);
        shader.pair = Vector2<float>(0.5f, -1);
        shader.color = Vector4<float>(1, 0.25f, 0, 1);
        shader.number = 2.5f;
        shader.count = -3;
        (shader.texture = 1) = 2; // the assignment gives the binding back
        shader.missing = Vector4<float>();
        EXPECT_EQ(RendererTrace::GetCurrentProgram(), "program 1");
        auto const value = [&](char const* name) {
            return RendererTrace::GetParameter(shader.program, name);
        };
        EXPECT_EQ(value("flag"), "1");
        EXPECT_EQ(value("matrix"), "1 2 3 4 5 6 7 8 9 10 11 12 13 14 15 16");
        EXPECT_EQ(value("pair"), "0.5 -1");
        EXPECT_EQ(value("color"), "1 0.25 0 1");
        EXPECT_EQ(value("number"), "2.5");
        EXPECT_EQ(value("count"), "-3");
        EXPECT_EQ(value("texture"), "2");
        EXPECT_EQ(RendererTrace::CountCalls("SetParameter"), 9);
        RendererTrace::TakeCalls();
    }
    EXPECT_EQ(RendererTrace::GetCurrentProgram(), "none");
    std::vector<std::string> const calls = RendererTrace::TakeCalls(); // backwards
    EXPECT_EQ(calls.front(), "program 1 Release");
    EXPECT_EQ(calls.back(), "program 1 ReleaseParameter flag");
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
    EXPECT_EQ(RendererTrace::CountCalls("SetParameter"), 0);
    EXPECT_EQ(RendererTrace::CountCalls("ReleaseParameter"), 2);
}

// Where a mediump float has 16 bits a place above 1024 is known to a whole unit, and a wide bitmap skips texels.
TEST(ShaderPrecision, WhatIsInterpolatedIsOfHighPrecisionInEveryFragmentStage) {
    int varyings = 0;
    for (auto const& entry : std::filesystem::directory_iterator(MOKA_SHADER_FOLDER)) {
        if (entry.path().extension() != ".frag") continue;
        std::ifstream file(entry.path());
        bool isDefault = false;
        for (std::string line; std::getline(file, line);) {
            isDefault = isDefault || line == "precision highp float;";
            if (line.rfind("varying ", 0) != 0 && line.rfind("in ", 0) != 0) continue;
            ++varyings;
            EXPECT_TRUE(isDefault || line.find(" highp ") != std::string::npos)
                << entry.path() << ": " << line;
        }
    }
    EXPECT_EQ(varyings, 15);
}

} // namespace
} // namespace Moka::Testing
