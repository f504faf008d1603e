// The four custom drawables: their life between two threads, and their references.
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/graphics/paint/MKPaint.h"
#include "tests/unit/bitmap/BitmapFixture.h"

#include <cmath>
#include <functional>
#include <gmock/gmock.h>
#include <limits>

namespace Moka::Testing {
namespace {

using ::testing::MatchesRegex;

class CustomDrawablesTest : public BitmapFixture {
protected:
    CustomDrawablesTest() {
        queue.RunAll();
        OnRenderThread const here;
        RendererFactory::SetDeferred(true);
    }

    MKBlendedBitmapDrawable* NewBlended(float width, float height) {
        first->Ref();
        second->Ref();
        return new (std::nothrow) MKBlendedBitmapDrawable(
            &queue, first.Get(), second.Get(), RectF(10, 5, 30, 15), RectF(1, 2, 3, 4), width, height);
    }
    template <class Drawable, class... Bitmaps>
    Drawable* New(Bitmaps... bitmaps) {
        auto* const drawable = new (std::nothrow) Drawable(&queue);
        if constexpr (sizeof...(bitmaps) > 0) drawable->SetBitmap(bitmaps...);
        return drawable;
    }
    template <class Drawable>
    RefPtr<Drawable> Constructed(Drawable* drawable) {
        queue.RunAll();
        return RefPtr<Drawable>::Adopt(drawable);
    }

    // The vertices; without any, nothing at all was done.
    static std::vector<float> Draw(IMKCustomDrawable& drawable) {
        OnRenderThread const here;
        RendererTrace::TakeCalls();
        RendererTrace::TakeEvents();
        drawable.DrawRT(Matrix4<float>(), MKPaint());
        std::vector<TracedDraw> const draws = RendererTrace::GetDraws();
        EXPECT_NE(RendererTrace::TakeCalls().empty(), draws.size() == 1);
        return draws.empty() ? std::vector<float>() : draws[0].vertices;
    }
    static bool Draws(IMKCustomDrawable& drawable) { return !Draw(drawable).empty(); }

    BitmapPtr first = NewBitmap(40, 20);
    BitmapPtr second = NewBitmap(8, 8);
};

TEST_F(CustomDrawablesTest, GpuObjectsAreMadeAndReleasedByTasksInOrder) {
    IMKBitmap* const a = first.Get();
    std::function<IMKCustomDrawable*()> const makers[] = {
        [&] { return NewBlended(8, 8); },
        [&] { return New<MKNonPremultipliedColorDrawable>(a, second.Get()); },
        [&] { return New<MKTextMaskBitmapDrawable>(a); },
        [&] { return New<MKGaussianBlurDrawable>(a); },
    };
    for (auto const& make : makers) {
        int const posted = queue.GetPostedCount();
        IMKCustomDrawable* const drawable = make();
        EXPECT_EQ(queue.GetPostedCount(), posted + 1);
        EXPECT_FALSE(Draws(*drawable)); // too early
        queue.RunAll();
        EXPECT_TRUE(Draws(*drawable));

        EXPECT_EQ(drawable->Unref(), 0);
        EXPECT_EQ(CountOf(first.Get()) + CountOf(second.Get()), 2);
        for (char const* kind : {"graphics", "blend", "depthstencil", "program"}) {
            RendererTrace::TakeCalls();
            EXPECT_TRUE(queue.RunOne());
            EXPECT_THAT(RendererTrace::TakeCalls().at(0),
                        MatchesRegex(kind + std::string(" [0-9]+ Release")));
        }
        EXPECT_EQ(queue.GetPendingCount(), 0);

        // The construction task is the last to let go when the creator does before.
        EXPECT_EQ(make()->Unref(), 1);
        queue.RunAll();
    }
}

TEST_F(CustomDrawablesTest, SettersTakeReferencesAndAConstructorAdoptsThem) {
    auto const drawable = Constructed(NewBlended(8, 8));
    EXPECT_EQ(CountOf(first.Get()), 2);
    drawable->SetBitmapFirst(first.Get()); // the same: nothing changes
    EXPECT_EQ(CountOf(first.Get()), 2);
    drawable->SetBitmapFirst(second.Get());
    EXPECT_EQ(CountOf(first.Get()), 1);
    EXPECT_EQ(CountOf(second.Get()), 3);
    drawable->SetBitmapSecond(nullptr);
    EXPECT_EQ(CountOf(second.Get()), 2);
    EXPECT_FALSE(Draws(*drawable));

    auto const over = Constructed(New<MKNonPremultipliedColorDrawable>(first.Get(), nullptr));
    EXPECT_FALSE(Draws(*over));
    over->SetBitmap(nullptr, first.Get());
    EXPECT_FALSE(Draws(*over));
    EXPECT_EQ(CountOf(first.Get()), 2);
    EXPECT_FALSE(Draws(*Constructed(New<MKTextMaskBitmapDrawable>())));
    EXPECT_FALSE(Draws(*Constructed(New<MKGaussianBlurDrawable>())));
}

TEST_F(CustomDrawablesTest, ABlendKeepsTheSizeOfItsFirstDraw) {
    auto const drawable = Constructed(NewBlended(0, 0));
    std::vector<float> const whole = Draw(*drawable);
    std::swap(first, second);
    drawable->SetBitmapFirst(first.Get());
    EXPECT_EQ(Draw(*drawable), whole);
    drawable->SetSize(80, 0); // taken as it is, also when only one side is 0
    std::vector<float> const sized = Draw(*drawable);
    EXPECT_EQ(sized[3], 0.125f);
    EXPECT_EQ(sized[4], std::numeric_limits<float>::infinity());

    for (RectF const& empty : {RectF(1, 1, 1, 5), RectF(5, 5, 1, 9), RectF(0, 0, std::nanf(""), 5)}) {
        drawable->SetRects(empty, RectF(0, 0, 5, 5));
        EXPECT_FALSE(Draws(*drawable));
        drawable->SetRects(RectF(0, 0, 5, 5), empty);
        EXPECT_FALSE(Draws(*drawable));
    }
}

} // namespace
} // namespace Moka::Testing
