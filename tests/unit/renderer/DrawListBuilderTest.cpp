// Which draws become one run, in which order, with which values.
#include "moka/renderer/record/DrawListBuilder.h"

#include "moka/renderer/device/Counters.h"
#include "moka/renderer/record/ProgramState.h"
#include "moka/renderer/record/Recorder.h"
#include "tests/support/RendererTrace.h"

#include <gtest/gtest.h>

#include <functional>

namespace Moka::Testing {
namespace {

using namespace detail;
using ListedRun = detail::Run; // tests have a Run() of their own

constexpr char kProgram[] = "uniform vec4 color; uniform int first; uniform bool second;";

// A box for each digit, side by side; none for anything else.
DrawBounds MakeBox(char cell) {
    if (cell < '0' || cell > '9') return {};
    float const left = static_cast<float>(cell - '0') * 0.1f;
    return {left, 0, static_cast<float>(cell - '0' + 1) * 0.1f, 1};
}

class DrawListBuilderTest : public ::testing::Test {
protected:
    DrawListBuilderTest() {
        RendererTrace::Reset();
        RendererFactory::AttachContext();
        program = std::make_unique<ProgramState>(GetRecorder(), "", kProgram, "program");
        color = program->AddHandle("color");
        first = program->AddHandle("first");
        second = program->AddHandle("second");
    }
    ~DrawListBuilderTest() override {
        program->Release();
        program.reset();
        RendererTrace::Reset();
    }

    void SetColor(float red) const {
        float const value[] = {red, 0, 0, 1};
        program->Set(color, value);
    }
    void SetInteger(std::size_t handle, int value) const { program->Set(handle, &value); }

    // count vertices of one float, each the number of the draw.
    void Draw(RunState const& state, DrawBounds const& bounds = {}, int count = 1) {
        std::vector<float> const vertices(static_cast<std::size_t>(count), static_cast<float>(draws++));
        ListVertices placed;
        builder.AddVertices(vertices.data(), count, 1, placed);
        builder.AddDraw(state, false, *program, {placed, 0, count, bounds});
    }

    // A state for each letter; a capital has another target, a strip begins with an 's'. "#" clears the target.
    void DrawScript(std::string const& script) {
        for (std::size_t i = 0; i < script.size(); i += 3) {
            char const letter = script[i];
            if (letter == '#') {
                builder.Add(ColorClear{});
                continue;
            }
            RunState state;
            state.scissor = {true, {std::tolower(letter), 0, 1, 1}};
            state.target.frameBuffer = std::isupper(letter) != 0 ? 2 : 1;
            if (letter == 's') state.primitive = PrimitiveType::TriangleStrip;
            SetColor(static_cast<float>(draws));
            Draw(state, MakeBox(script[i + 1]));
        }
    }

    // The draws' numbers in the order of the vertices, run by run: "02|1"; a record that is not by itself drawn
    // as one with its neighbours counts alone.
    std::string Finish() {
        DrawList const& list = builder.Finish();
        std::string text;
        for (Command const& command : list.commands) {
            if (!text.empty()) text += '|';
            ListedRun const* const run = std::get_if<ListedRun>(&command);
            if (!run) text += '#';
            for (std::size_t i = 0; run && i < run->recordCount; ++i) {
                Record const& record = list.records[run->firstRecord + i];
                for (int at = record.first; at < record.first + record.count; ++at) {
                    text += static_cast<char>('0' + static_cast<int>(list.vertices.data()[at]));
                }
            }
        }
        return text;
    }
    std::vector<ListedRun> FinishRuns() {
        std::vector<ListedRun> runs;
        for (Command const& command : builder.Finish().commands) runs.push_back(std::get<ListedRun>(command));
        return runs;
    }
    std::uint64_t Count(RunEnd end) const { return counters.runEnds[static_cast<std::size_t>(end)]; }

    Counters counters;
    DrawListBuilder builder{counters};
    std::unique_ptr<ProgramState> program;
    std::size_t color = 0;
    std::size_t first = 0;
    std::size_t second = 0;
    int draws = 0;
};

TEST_F(DrawListBuilderTest, ADrawJoinsAnEarlierRunOnlyPastWhatItDoesNotTouch) {
    struct {
        char const* script;
        char const* order;
    } const cases[] = {
        {"a0 a1 a?", "012"},
        {"a0 b1 a2", "02|1"},
        {"a0 b1 a1", "0|1|2"},
        {"a1 b2 a1 b2", "02|13"},                              // boxes that share a side do not touch
        {"a0 b1 a? b1", "0|1|2|3"},                            // nothing is known of the third
        {"a0 b? a2", "0|1|2"},                                 // nor of what lies between
        {"a0 b1 b? a2", "0|12|3"},                             // or of a part of it
        {"a0 b1 c2 b3 a3", "0|13|2|4"},                        // what joined the run between counts
        {"a0 b1 b2 b3 b4 b5 b6 b7 b8 b9 a9", "0|123456789|:"}, // and the last of many
        {"a0 b1 c2 a3 b4 c5", "03|14|25"},
        {"a0 B1 a2", "0|1|2"}, // the other target may be what is sampled
        {"a0 B1 A2 B3", "0|13|2"},
        {"a0 #  a1 a2", "0|#|12"},
        {"s0 s1", "0|1"},
        {"a0 s1 a2", "02|1"},
        {"a0 b1 c1 d1 e1 f1 g1 h1 i1 j1 k1 l1 m1 n1 o1 p1 a2", "0@|1|2|3|4|5|6|7|8|9|:|;|<|=|>|?"},
        {"a0 b1 c1 d1 e1 f1 g1 h1 i1 j1 k1 l1 m1 n1 o1 p1 q1 a2", "0|1|2|3|4|5|6|7|8|9|:|;|<|=|>|?|@|A"},
    };
    for (auto const& [script, order] : cases) {
        DrawScript(script);
        EXPECT_EQ(Finish(), order) << script;
        builder.Clear(false);
        draws = 0;
    }
    builder.SetMerging(false);
    DrawScript("a0 b1 a2 a3");
    EXPECT_EQ(Finish(), "0|1|2|3");
}

TEST_F(DrawListBuilderTest, EqualValuesAreOneRecord) {
    RunState a;
    RunState b;
    b.scissor.on = true;
    Draw(a, MakeBox('0'));
    Draw(a, MakeBox('1'));
    Draw(b, MakeBox('2'), 3);
    Draw(a, MakeBox('3'), 2);
    SetColor(1);
    Draw(a, MakeBox('4'));
    EXPECT_EQ(Finish(), "01334|222");
    EXPECT_EQ(builder.GetList().records.size(), 3u);
    EXPECT_EQ(counters.records, 3u);
    EXPECT_EQ(counters.runs, 2u);
    // One record lies where all of its draws do.
    builder.Clear(false);
    draws = 0;
    Draw(a, MakeBox('0'));
    Draw(b, MakeBox('1'));
    Draw(b, MakeBox('2'));
    Draw(a, MakeBox('2'));
    EXPECT_EQ(Finish(), "0|12|3");
}

TEST_F(DrawListBuilderTest, AShortRunVariesItsIntegersAndALongOneKeepsThem) {
    RunState const state;
    struct {
        int before; // draws of equal integers
        std::size_t const& changed;
        std::vector<std::uint32_t> varying; // of the runs
    } const cases[] = {
        {2, color, {0}},   {2, first, {1}},     {31, first, {1}},
        {31, second, {2}}, {32, first, {0, 0}}, {32, color, {0}},
    };
    for (auto const& [before, changed, varying] : cases) {
        SetInteger(first, 0);
        SetInteger(second, 0);
        for (int i = 0; i < before; ++i) {
            SetColor(static_cast<float>(i));
            Draw(state);
        }
        if (changed != color) SetInteger(changed, 1);
        for (int i = 0; i < 2; ++i) {
            SetColor(static_cast<float>(-1 - i));
            Draw(state);
        }
        std::vector<std::uint32_t> found;
        for (ListedRun const& run : FinishRuns()) found.push_back(run.varying);
        EXPECT_EQ(found, varying) << before;
        builder.Clear(false);
    }
    EXPECT_EQ(Count(RunEnd::Values), 1u);
    // One that varies already varies more.
    for (int i = 0; i < 40; ++i) {
        SetInteger(first, i % 2);
        SetInteger(second, i > 35 ? 1 : 0);
        Draw(state);
    }
    ASSERT_EQ(FinishRuns().size(), 1u);
    EXPECT_EQ(std::get<ListedRun>(builder.GetList().commands[0]).varying, 3u);
}

} // namespace
} // namespace Moka::Testing
