#include "moka/graphics/drawable/ShaderExceptions.h"
#include "tests/support/Awaited.h"
#include "tests/unit/drawable/DrawableFixture.h"

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

struct NoMemoryShader {
    NoMemoryShader() { ADD_FAILURE() << "constructed in no memory"; }
    static void* operator new(std::size_t, std::nothrow_t const&) noexcept { return nullptr; }
    static void operator delete(void* memory) { ::operator delete(memory); }
};

TEST_F(ShaderManagerTest, WithoutMemoryTheEntryIsThereAndTheShaderIsNull) {
    EXPECT_EQ(manager.GetShader<NoMemoryShader>(), nullptr);
    log.Clear();
    EXPECT_EQ(manager.GetShader<NoMemoryShader>(), nullptr);
    EXPECT_THAT(log.GetTexts(), IsEmpty());
    manager.RemoveShader(ShaderManager::Key(typeid(NoMemoryShader).name()));
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
