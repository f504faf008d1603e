// Which draws become one run. That the runs draw the same as the draws one by one is for the tests with a driver.
#include "moka/renderer/IRasterizerState.h"
#include "tests/unit/renderer/RecorderFixture.h"

#include <cctype>
#include <sstream>

namespace Moka::Testing {
namespace {

class DrawListBuilderTest : public RecorderFixture {
protected:
    // A scissor for each letter; a capital has another target, a strip begins with an 's'. Boxes of digits lie side by
    // side; of any other cell nothing is known. '#' clears the target.
    void Draw(char letter, char cell) const {
        if (letter == '#') return target->ClearColor(0, 0, 0, 0);
        IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
        rasterizer->SetScissorEnabled(true);
        rasterizer->SetScissorRect({std::tolower(letter), 0, 1, 1});
        (std::isupper(letter) != 0 ? otherTarget : target)->Activate();
        IGraphicsObject& object = letter == 's' ? *strip : *graphics;
        float const left = static_cast<float>(cell - '0') / 10;
        object.SetVertices(0, &left, 1);
        object.SetBounds(std::isdigit(cell) != 0 ? DrawBounds{left, 0, left + 0.1f, 1} : DrawBounds());
        object.Draw(0, -1, 1);
    }
    // Since the flush before.
    std::uint64_t FlushRuns() {
        RendererFactory::Flush();
        return Count().runs - std::exchange(mRuns, Count().runs);
    }

    RendererPtr<IGraphicsObject> strip = MakeGraphics(PrimitiveType::TriangleStrip);
    std::unique_ptr<ITextureObject> otherTexture = MakeTexture();
    RendererPtr<IRenderTarget> otherTarget{RendererFactory::CreateOffscreenRenderTarget(otherTexture.get())};

private:
    std::uint64_t mRuns = 0;
};

TEST_F(DrawListBuilderTest, ADrawJoinsAnEarlierRunOnlyPastWhatItDoesNotTouch) {
    struct {
        char const* script;
        unsigned runs;
    } const cases[] = {
        {"a0 a1 a?", 1},
        {"a0 b1 a2", 2},
        {"a0 b1 a1", 3},
        {"a1 b2 a1 b2", 2},                      // boxes that share a side do not touch
        {"a0 b1 a? b1", 4},                      // nothing is known of the third
        {"a0 b? a2", 3},                         // nor of what lies between
        {"a0 b1 b? a2", 3},                      // or of a part of it
        {"a0 b1 c2 b3 a3", 4},                   // what joined the run between counts
        {"a0 b1 b2 b3 b4 b5 b6 b7 b8 b9 a9", 3}, // and the last of many
        {"a0 b1 c2 a3 b4 c5", 3},
        {"a0 B1 a2", 3}, // the other target may be what is sampled
        {"a0 B1 A2 B3", 3},
        {"a0 #. a1 a2", 2},
        {"s0 s1", 2},
        {"a0 s1 a2", 2},
        {"a0 b1 c1 d1 e1 f1 g1 h1 i1 j1 k1 l1 m1 n1 o1 p1 a2", 16},
        {"a0 b1 c1 d1 e1 f1 g1 h1 i1 j1 k1 l1 m1 n1 o1 p1 q1 a2", 18},
    };
    for (auto const& [script, runs] : cases) {
        std::istringstream draws(script);
        float number = 0;
        for (std::string draw; draws >> draw;) {
            SetWidth(number++);
            Draw(draw[0], draw[1]);
        }
        EXPECT_EQ(FlushRuns(), runs) << script;
    }
}

TEST_F(DrawListBuilderTest, EqualValuesAreOneRecord) {
    std::uint64_t const before = Count().records;
    for (char const* const draw : {"a0", "a1", "b2", "a3"}) Draw(draw[0], draw[1]);
    SetWidth(1);
    Draw('a', '4');
    EXPECT_EQ(FlushRuns(), 2u);
    EXPECT_EQ(Count().records - before, 3u);
    // One record lies where all of its draws do.
    for (char const* const draw : {"a0", "b1", "b2", "a2"}) Draw(draw[0], draw[1]);
    EXPECT_EQ(FlushRuns(), 3u);
}

TEST_F(DrawListBuilderTest, AShortRunVariesItsIntegersAndALongOneKeepsThem) {
    std::unique_ptr<IParameterBinding> const count(program->GetParameter("count"));
    for (int const equal : {2, 31, 32}) {
        for (int i = 0; i < equal + 2; ++i) {
            int const value = i < equal ? 0 : 1;
            count->Set(&value);
            SetWidth(static_cast<float>(i));
            Draw('a', '?');
        }
        EXPECT_EQ(FlushRuns(), equal < 32 ? 1u : 2u) << equal;
    }
    EXPECT_EQ(Count().runEnds[static_cast<std::size_t>(RunEnd::Values)], 1u);
}

} // namespace
} // namespace Moka::Testing
