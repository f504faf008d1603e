// Rectangles, round rectangles, circles and lines: what is drawn at all, and with what. What their vertices
// cover is seen in the pictures.
#include "moka/graphics/drawable/MKCircleDrawable.h"
#include "moka/graphics/drawable/MKLineDrawable.h"
#include "moka/graphics/drawable/MKRectDrawable.h"
#include "moka/graphics/drawable/MKRoundRectDrawable.h"
#include "tests/support/Allocation.h"
#include "tests/unit/drawable/DrawableFixture.h"

#include <memory>

namespace Moka::Testing {
namespace {

using ::testing::IsEmpty;
using ::testing::SizeIs;

class PrimitivesTest : public DrawableFixture {
protected:
    static MKPaint Paint(MKPaint::Style style, float width, bool antiAliased) {
        MKPaint paint;
        paint.SetStyle(style);
        paint.SetLineWidth(width);
        paint.SetAntiAliasing(antiAliased);
        return paint;
    }
};

TEST_F(PrimitivesTest, StylesAndWidthsDecideWhatIsDrawn) {
    constexpr auto kUnknown = static_cast<MKPaint::Style>(3);
    struct {
        MKPaint paint;
        std::vector<int> rect, roundRect, circle; // the vertices of each draw
    } const cases[] = {
        {Paint(MKPaint::Fill, 9, false), {6}, {42, 24}, {6}},
        {Paint(MKPaint::Fill, 9, true), {30}, {42, 24}, {6}},
        {Paint(MKPaint::Stroke, 1, false), {24}, {72, 24}, {6}},
        {Paint(MKPaint::Stroke, 1, true), {72}, {72, 24}, {6}},
        {Paint(MKPaint::FillAndStroke, 2, true), {102}, {42, 24, 72, 24}, {6, 6}},
        {Paint(MKPaint::FillAndStroke, 0.99f, false), {6}, {42, 24}, {6, 6}},
        {Paint(MKPaint::Stroke, 0.99f, true), {0}, {}, {6}},
        {Paint(MKPaint::Stroke, 0, true), {0}, {}, {}},
        {Paint(MKPaint::Stroke, kNaN, true), {0}, {}, {}},
        {Paint(kUnknown, 4, true), {0}, {}, {}},
    };
    auto const takeCounts = [] {
        std::vector<int> counts;
        for (TracedDraw const& draw : TakeDraws()) counts.push_back(draw.count);
        return counts;
    };
    MKRectDrawable rect;
    MKRoundRectDrawable roundRect;
    MKCircleDrawable circle;
    for (auto const& c : cases) {
        SCOPED_TRACE(&c - cases);
        EXPECT_TRUE(rect.DrawRectRT(RectF(2, 2, 12, 12), projection, c.paint));
        EXPECT_EQ(takeCounts(), c.rect);
        EXPECT_TRUE(roundRect.DrawRoundRectRT(RectF(2, 2, 12, 12), 2, 2, projection, c.paint));
        EXPECT_EQ(takeCounts(), c.roundRect);
        circle.DrawCircleRT(PointF(20, 30), 5, projection, c.paint);
        EXPECT_EQ(takeCounts(), c.circle);
    }
    // A stroke wider than its rectangle turns the hole inside out; nothing is clamped.
    rect.DrawRectRT(RectF(2, 2, 12, 12), projection, Paint(MKPaint::Stroke, 24, false));
    EXPECT_THAT(VerticesOf(TakeDraw()),
                ::testing::IsSupersetOf({Vertex{-10, -10, 1}, Vertex{24, 24, 1}, Vertex{14, 14, 1}}));
    // Radii are clamped from above only.
    roundRect.DrawRoundRectRT(RectF(0, 0, 20, 10), 10.5f, -3, projection, MKPaint());
    EXPECT_EQ(Values(TakeDraws().at(1), {"uRxry"}), "10 -3");
    roundRect.DrawRoundRectRT(RectF(0, 0, 20, 10), 3, 5.5f, projection, MKPaint());
    EXPECT_EQ(Values(TakeDraws().at(1), {"uRxry"}), "3 5");
}

TEST_F(PrimitivesTest, DashesAreRunningSumsAndASolidLineLeavesThemAlone) {
    MKLineDrawable drawable;
    MKPaint paint = Paint(MKPaint::Fill, 2, false);
    auto const draw = [&](float first) {
        paint.SetDashedLinePattern(Vector4<float>(first, 2, 8, 1));
        drawable.DrawLineRT(PointF(0, 0), PointF(9, 0), projection, paint);
        return Values(TakeDraw(), {"uIsDashedLine", "uDashedLinePattern", "uDashedLinePatternLength"});
    };
    EXPECT_EQ(draw(-1), "0 | unset | unset");
    EXPECT_EQ(draw(-0.5f), "1 | -0.5 1.5 9.5 10.5 | 10.5");
    EXPECT_EQ(draw(-1), "0 | -0.5 1.5 9.5 10.5 | 10.5");
}

TEST_F(PrimitivesTest, ThePointsAreFreedUnlessTheLineIsTooThin) {
    auto const isFreed = [&](MKLineDrawable& drawable, std::size_t count, float width) {
        auto points = std::make_unique<std::vector<PointF>>(count);
        DeleteWatch const watch(points.get());
        drawable.DrawSimpleLinesRT(points.get(), projection, Paint(MKPaint::Fill, width, true));
        bool const freed = watch.GetPlainDeletes() == 1;
        if (freed) static_cast<void>(points.release());
        return freed;
    };
    MKLineDrawable drawable;
    EXPECT_TRUE(isFreed(drawable, 4, 1));
    EXPECT_TRUE(isFreed(drawable, 1, 1));
    EXPECT_THAT(TakeDraws(), SizeIs(2));
    EXPECT_FALSE(isFreed(drawable, 4, 0.9f));
    drawable.DrawLineRT(PointF(), PointF(5, 5), projection, Paint(MKPaint::Fill, 0.9f, true));
    drawable.DrawSimpleLineRT(PointF(), PointF(5, 5), projection, Paint(MKPaint::Fill, 0.9f, true));
    drawable.DrawSimpleLinesRT(nullptr, projection, MKPaint());
    RendererTrace::FailCreations(ObjectKind::kGraphicsObject);
    MKLineDrawable refused;
    RendererTrace::StopFailing();
    EXPECT_TRUE(isFreed(refused, 4, 1));
    EXPECT_THAT(TakeDraws(), IsEmpty());
}

struct Primitives {
    // Each request on states that another one has left.
    void DrawAll(RectF const& r, float size, Matrix4<float> const& projection, MKPaint const& paint) {
        PointF const from(r.left, r.top);
        PointF const to(r.right, r.bottom);
        ForceOtherStates();
        rect.DrawRectRT(r, projection, paint);
        ForceOtherStates();
        roundRect.DrawRoundRectRT(r, size, size, projection, paint);
        ForceOtherStates();
        circle.DrawCircleRT(from, size, projection, paint);
        ForceOtherStates();
        line.DrawLineRT(from, to, projection, paint);
        ForceOtherStates();
        line.DrawSimpleLineRT(from, to, projection, paint);
        ForceOtherStates();
        if (!(paint.GetLineWidth() < 1)) // else it would stay ours
            line.DrawSimpleLinesRT(new std::vector<PointF>{from, to}, projection, paint);
    }

    MKRectDrawable rect;
    MKRoundRectDrawable roundRect;
    MKCircleDrawable circle;
    MKLineDrawable line;
};

TEST_F(PrimitivesTest, EveryDrawAppliesThePaintAndItsOwnStates) {
    Primitives primitives;
    MKPaint paint = CommonPaint();
    paint.SetStyle(MKPaint::FillAndStroke);
    paint.SetLineWidth(2);
    auto const draw = [&] {
        primitives.DrawAll(RectF(2, 2, 12, 12), 3, projection, paint);
        std::vector<TracedDraw> draws = TakeDraws();
        EXPECT_THAT(draws, SizeIs(1 + 4 + 2 + 3));
        return draws;
    };
    RendererTrace::TakeCalls();
    std::vector<TracedDraw> const draws = draw();
    EXPECT_EQ(RendererTrace::CountCalls("SetDescriptor"), 1 + 1 + 1 + 3) << "equal ones as well";
    for (TracedDraw const& each : draws) {
        ExpectCommonState(each);
        EXPECT_FALSE(each.state.depthStencil.IsStencil() || each.state.depthStencil.IsDepth());
    }
    paint.ClearTintColor();
    for (TracedDraw const& each : draw()) EXPECT_EQ(Values(each, {"uHasTintColor"}), "0");
    for (int mode : {-1, 19, 1000000}) { // any other number is source over
        paint.SetXFermode(static_cast<MKPaint::XFermode>(mode));
        for (TracedDraw const& each : draw()) {
            EXPECT_EQ(each.state.blend.GetColorEquation().destination, BlendingFactor::OneMinusSrcAlpha);
        }
    }
    paint.SetXFermode(MKPaint::BlendingOff);
    primitives.rect.DrawRectRT(RectF(2, 2, 12, 12), projection, paint);
    EXPECT_FALSE(TakeDraw().state.blend.IsBlending());
}

template <class Drawable>
std::string ObjectsOf() {
    RendererTrace::TakeCalls();
    auto drawable = std::make_unique<Drawable>();
    std::vector<std::string> const made = TakeObjects("Create");
    drawable.reset();
    EXPECT_EQ(TakeObjects("Release"), made);
    std::string kinds;
    for (std::string const& object : made) kinds += object.substr(0, object.find(' ') + 1);
    return kinds;
}

TEST_F(PrimitivesTest, GeometriesStatesAndProgramsAreMadeAndReleasedInThatOrder) {
    EXPECT_EQ(ObjectsOf<MKRectDrawable>(), "graphics blend depthstencil program ");
    EXPECT_EQ(ObjectsOf<MKCircleDrawable>(), "graphics blend depthstencil program ");
    EXPECT_EQ(ObjectsOf<MKLineDrawable>(), "graphics graphics blend depthstencil program program ");
    EXPECT_EQ(ObjectsOf<MKRoundRectDrawable>(), "graphics graphics blend depthstencil program program ");
}

TEST_F(PrimitivesTest, NumbersThatAreNoneDoNoHarm) {
    Primitives primitives;
    for (float const number : {kNaN, kInfinity, -kInfinity, 3e38f, 0.0f, -5.0f}) {
        RectF const rect(number, number, 10, number);
        primitives.DrawAll(rect, number, projection, Paint(MKPaint::FillAndStroke, number, true));
        primitives.DrawAll(rect, 3, projection, Paint(MKPaint::FillAndStroke, 2, false));
    }
    EXPECT_FALSE(TakeDraws().empty());
}

} // namespace
} // namespace Moka::Testing
