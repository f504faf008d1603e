#include "moka/graphics/drawable/ShaderExceptions.h"
#include "tests/support/Awaited.h"
#include "tests/unit/drawable/ShaderFixture.h"

#include <atomic>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <thread>

namespace Moka::Testing {

// The program says int, the table says float; what follows is never bound.
#define WRONG_UNIFORMS(U)                                                                                    \
    U(Matrix4, first)                                                                                        \
    U(Vector2, absent)                                                                                       \
    U(Float, wrong)                                                                                          \
    U(Int, after)
MOKA_SHADER_CLASS(WrongShader, WRONG_UNIFORMS)
MOKA_SHADER_DEFINITION(WrongShader, WRONG_UNIFORMS, "uniform mat4 first; uniform int wrong;",
                       "uniform int after;")

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

int CountPrograms() { return RendererFactory::GetStatistics().programs; }

template <class T>
std::string NewLine() {
    return std::string("ShaderManager::GetShader, New ") + typeid(T).name() + " is added";
}

template <class T>
std::string ErrorLine(char const* reason) {
    return std::string("ReleaseShader. Shader (") + typeid(T).name() + ") not in shader manager (" + reason +
           ").";
}

class ShaderManagerTest : public ShaderFixture {};

TEST_F(ShaderManagerTest, OneProgramIsSharedUntilItsLastUserGivesItBack) {
    auto* const first = manager.GetShader<MKRectShader>();
    EXPECT_THAT(log.GetTexts(), ElementsAre(NewLine<MKRectShader>()));
    EXPECT_EQ(log.Find(NewLine<MKRectShader>()).tag, "mok_log");
    EXPECT_EQ(log.Find(NewLine<MKRectShader>()).priority, ANDROID_LOG_DEBUG);
    log.Clear();
    EXPECT_EQ(manager.GetShader<MKRectShader>(), first);
    EXPECT_THAT(log.GetTexts(), IsEmpty());
    EXPECT_EQ(CountPrograms(), 1);

    auto* const other = manager.GetShader<MKRoundRectShader>(); // the same texts, another class
    EXPECT_EQ(CountPrograms(), 2);
    manager.ReleaseShader(other);
    EXPECT_EQ(CountPrograms(), 1);

    manager.ReleaseShader(first);
    EXPECT_EQ(CountPrograms(), 1);
    first->uHasTintColor = 1;
    manager.ReleaseShader(first);
    EXPECT_EQ(CountPrograms(), 0);
    log.Clear();
    manager.ReleaseShader(manager.GetShader<MKRectShader>());
    EXPECT_THAT(log.GetTexts(), ElementsAre(NewLine<MKRectShader>()));
}

TEST_F(ShaderManagerTest, GivingBackWhatIsNotTheManagersChangesNothing) {
    manager.ReleaseShader<MKRectShader>(nullptr);
    EXPECT_THAT(log.GetTexts(), IsEmpty());
    {
        MKRectShader stranger;
        manager.ReleaseShader(&stranger);
        EXPECT_THAT(log.GetTexts(), ElementsAre(ErrorLine<MKRectShader>("not found")));
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 1);

        auto* const shader = manager.GetShader<MKRectShader>();
        log.Clear();
        manager.ReleaseShader(&stranger);
        EXPECT_THAT(log.GetTexts(), ElementsAre(ErrorLine<MKRectShader>("pointer mismatch")));
        EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 1);
        EXPECT_EQ(CountPrograms(), 2);
        manager.ReleaseShader(shader); // the only user still
        EXPECT_EQ(CountPrograms(), 1);
    }
    EXPECT_EQ(CountPrograms(), 0);
}

TEST_F(ShaderManagerTest, AWrongTypeStopsTheConstructionAndLeavesNoEntry) {
    auto* const bystander = manager.GetShader<MKCircleShader>();
    for (int attempt = 0; attempt < 2; ++attempt) {
        log.Clear();
        RendererTrace::TakeCalls();
        try {
            manager.GetShader<WrongShader>();
            ADD_FAILURE() << "nothing thrown";
        } catch (InvalidArgumentException const& e) {
            EXPECT_STREQ(e.what(), "ParameterBinding<>::bind - invalid parameter type!");
        }
        EXPECT_THAT(log.GetTexts(), ElementsAre(NewLine<WrongShader>(), "wrong: Found 7 but given 6",
                                                "ParameterBinding<>::bind - invalid parameter type!"));
        EXPECT_EQ(log.Count(ANDROID_LOG_INFO), 1);
        EXPECT_EQ(log.Find("ParameterBinding<>::bind - invalid parameter type!").format, "%s");
        // The program is not released, the bindings are, backwards.
        std::string const program = "program " + std::to_string(attempt + 2) + " ";
        EXPECT_THAT(RendererTrace::TakeCalls(),
                    ElementsAre(program + "Create WrongShader", program + "GetParameter first 2",
                                program + "GetParameter absent 0", program + "GetParameter wrong 7",
                                program + "ReleaseParameter wrong", program + "ReleaseParameter absent",
                                program + "ReleaseParameter first"));
    }
    EXPECT_EQ(CountPrograms(), 3);
    manager.ReleaseShader(bystander);
    EXPECT_EQ(CountPrograms(), 2);
    expectedAlive += 2;
}

TEST_F(ShaderManagerTest, AssignedValuesReachTheProgramAndMissingUniformsSwallowThem) {
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
    std::vector<std::string> const calls = RendererTrace::TakeCalls(); // backwards
    EXPECT_EQ(calls.front(), "program 1 Release");
    EXPECT_EQ(calls.back(), "program 1 ReleaseParameter flag");
    EXPECT_THAT(log.GetTexts(), IsEmpty());
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

struct SlowShader {
    SlowShader() {
        ++made;
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
        ++alive;
    }
    ~SlowShader() { --alive; }
    static inline std::atomic<int> made{0};
    static inline std::atomic<int> alive{0};
};

TEST(ShaderManagerThreadsTest, UsersOnManyThreadsNeverMeetTwoOfAClass) {
    LogCapture const log;
    ShaderManager& manager = *ShaderManager::GetInstance();
    for (int round = 0; round < 5; ++round) {
        int const before = SlowShader::made;
        Awaited<int> users;
        std::vector<std::thread> threads;
        for (int i = 0; i < 4; ++i) {
            threads.emplace_back([&] {
                SlowShader* const mine = manager.GetShader<SlowShader>();
                ++users;
                users.AwaitAtLeast(4);
                for (int j = 0; j < 50; ++j) {
                    EXPECT_EQ(manager.GetShader<SlowShader>(), mine);
                    EXPECT_EQ(SlowShader::alive, 1);
                    manager.ReleaseShader(mine);
                }
                manager.ReleaseShader(mine);
            });
        }
        for (std::thread& thread : threads) thread.join();
        EXPECT_EQ(SlowShader::made, before + 1);
        EXPECT_EQ(SlowShader::alive, 0);
    }
    EXPECT_EQ(log.Count(ANDROID_LOG_ERROR), 0);
}

} // namespace
} // namespace Moka::Testing
