// Bitmaps drawn smaller, with the mipmapped filter and with the default one, beside the codecs' area filter; and
// when the levels are made.
#include "tests/pixel/canvas/CanvasDrawing.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/String.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"
#include "tests/support/TestFiles.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <memory>

namespace Moka::Testing {
namespace {

constexpr int kWidth = 120;
constexpr int kHeight = 90;

Picture MakeNamed(char const* name, int width, int height) {
    std::vector<std::string> const& names = Scenes::GetPictureNames();
    auto const found = std::find(names.begin(), names.end(), name);
    return Scenes::MakePicture(static_cast<std::size_t>(found - names.begin()), width, height);
}

Picture ScaleAsCodecs(Picture const& from, int width, int height) {
    TempFolder const folder;
    std::string const path = folder.Path("whole.mki");
    EXPECT_TRUE(SaveImage(from, path));
    String const name = String::FromFileName(path);
    std::unique_ptr<Bitmap> const scaled(BitmapFactory::CreateBitmap(&name, width, height));
    Picture to(width, height);
    std::copy_n(scaled->GetBuffer(), to.CountBytes(), to.pixels.begin());
    return to;
}

// Of 255, over all channels of all pixels.
double GetMeanError(Picture const& a, Picture const& b) {
    double sum = 0;
    for (std::size_t i = 0; i < a.pixels.size(); ++i) sum += std::abs(int{a.pixels[i]} - int{b.pixels[i]});
    return sum / static_cast<double>(a.pixels.size());
}

std::uint64_t CountUpdates(RenderThread& thread) {
    thread.WaitForTasks();
    thread.Call([] { RendererFactory::Flush(); });
    return RendererFactory::GetStatistics().mipmapUpdates;
}

class MipmapTest : public CanvasDrawing {
protected:
    Picture DrawSmall(Picture const& from, TextureParamFilteringValue filter, int width = kWidth,
                      int height = kHeight) {
        return Draw({Picture(width, height), [&](IMKCanvas& canvas, Scenes::SceneStage& stage) {
                         auto const bitmap = MakeBitmap(stage, from);
                         bitmap->GetBitmapReadable()->SetTextureFilter(filter);
                         canvas.DrawBitmap(bitmap.Get(), RectF(canvas.GetBitmap()->GetBitmapRect()), nullptr);
                     }});
    }
};

TEST_F(MipmapTest, IsNearTheCodecsAreaFilterAtEveryScale) {
    struct {
        char const* name;
        float scale;
        double atMost; // mean error of the mipmapped filter
    } const cases[] = {{"photo", 2, 0.5}, {"photo", 3.7f, 1}, {"photo", 10, 1.5},
                       {"grain", 2, 0.5}, {"grain", 3.7f, 9}, {"grain", 10, 7}};
    for (auto const& one : cases) {
        auto const side = [&](int small) {
            return static_cast<int>(std::lround(one.scale * static_cast<float>(small)));
        };
        Picture const from = MakeNamed(one.name, side(kWidth), side(kHeight));
        Picture const area = ScaleAsCodecs(from, kWidth, kHeight);
        double const plain = GetMeanError(area, DrawSmall(from, TextureFilterLinear));
        double const mipmapped = GetMeanError(area, DrawSmall(from, TextureFilterMipmapped));
        std::string const what = one.name + (" at 1/" + std::to_string(one.scale));
        RecordProperty(what, std::to_string(plain) + " linear, " + std::to_string(mipmapped) + " mipmapped");
        EXPECT_LE(mipmapped, one.atMost) << what;
        bool const isSpeckled = plain > 10;
        EXPECT_LE(mipmapped, isSpeckled ? plain / 2 : plain + 0.1) << what;
    }
}

TEST_F(MipmapTest, EnlargedItIsLinear) {
    Picture const small = MakeNamed("letters", 60, 45);
    EXPECT_EQ(DrawSmall(small, TextureFilterMipmapped), DrawSmall(small, TextureFilterLinear));
}

// Strips of 128 rows: a power of two, so that no level mixes rows of two strips and the picture is the same.
TEST_F(MipmapTest, EachStripHasLevelsOfItsOwn) {
    Picture const tall = MakeNamed("grain", 120, 480);
    Picture const whole = DrawSmall(tall, TextureFilterMipmapped, 30, 120);
    UseLargestSide(128);
    std::uint64_t const before = CountUpdates(GetRenderThread());
    ExpectSame(whole, DrawSmall(tall, TextureFilterMipmapped, 30, 120), "in strips");
    EXPECT_EQ(CountUpdates(GetRenderThread()) - before, 4u);
}

// A bitmap of one colour at a time, drawn at a tenth after each change: all in one list, unless a read-back or
// an upload ends it.
class MipmapChangeTest : public MipmapTest {
protected:
    static constexpr int kSide = 160;
    static constexpr int kSmall = 16;

    MipmapChangeTest() { bitmap->GetBitmapReadable()->SetTextureFilter(TextureFilterMipmapped); }

    void DrawNext(IMKBitmap* shown = nullptr) {
        float const x = static_cast<float>(kSmall * next++);
        canvas->DrawBitmap(shown ? shown : bitmap.Get(), RectF(x, 0, x + kSmall, kSmall), nullptr);
    }
    void ExpectColors(std::vector<Color> const& colors) {
        Picture picture(kSmall * 8, kSmall);
        target->GetBitmapData(target->GetBitmapRect(), picture.pixels.data());
        ASSERT_EQ(static_cast<std::size_t>(next), colors.size());
        for (std::size_t i = 0; i < colors.size(); ++i)
            for (int const at : {0, kSmall / 2, kSmall - 1})
                EXPECT_EQ(picture.GetColor(kSmall * static_cast<int>(i) + at, at), colors[i]) << i;
    }
    std::uint64_t CountNewUpdates() { return CountUpdates(GetRenderThread()) - before; }

    RefPtr<IMKBitmap> bitmap = NewBitmap(GetRenderThread(), kSide, kSide);
    RefPtr<IMKCanvas> onto = NewCanvas(GetRenderThread(), bitmap);
    RefPtr<IMKBitmap> target = NewBitmap(GetRenderThread(), kSmall * 8, kSmall);
    RefPtr<IMKCanvas> canvas = NewCanvas(GetRenderThread(), target);
    std::uint64_t const before = CountUpdates(GetRenderThread());
    int next = 0;

    static constexpr Color kRed{255, 0, 0, 255};
    static constexpr Color kGreen{0, 255, 0, 255};
    static constexpr Color kBlue{0, 0, 255, 255};
    static constexpr Color kWhite{255, 255, 255, 255};
};

TEST_F(MipmapChangeTest, LevelsAreMadeAtTheFirstDrawAfterEachChangeAndNotBetween) {
    onto->ClearAll(static_cast<int>(0xFFFF0000)); // red
    onto->ClearAll(static_cast<int>(0xFF00FF00)); // green
    DrawNext();
    DrawNext();
    MKPaint paint;
    paint.SetColor(0, 0, 1);
    onto->DrawRect(0, 0, kSide, kSide, &paint);
    DrawNext();
    onto->DrawRect(0, 0, kSide, kSide, nullptr); // in the state of the draw before
    DrawNext();
    Picture const red = MakeChecker(kSide, kSide, 1, kRed, kRed);
    bitmap->GetTextureBitmap()->UpdateBitmap(red.pixels.data(), red.GetStride());
    DrawNext();
    DrawNext();
    ExpectColors({kGreen, kGreen, kBlue, kWhite, kRed, kRed});
    EXPECT_EQ(CountNewUpdates(), 4u);
}

TEST_F(MipmapChangeTest, AClearThatIsDrawnAndACopyChangeTheLevels) {
    onto->ClearAll(static_cast<int>(0xFFFF0000));
    DrawNext();
    onto->Save(IMKCanvasBase::SaveAll);
    onto->PreRotate(45, kSide / 2.0f, kSide / 2.0f); // a stencil clip, under which clears are drawn
    onto->SetClipRect(-kSide, -kSide, 3 * kSide, 3 * kSide, IMKCanvasBase::Intersect);
    onto->Clear(static_cast<int>(0xFF00FF00));
    DrawNext();
    onto->Restore(-1);
    auto const blue = NewBitmap(GetRenderThread(), kSide, kSide);
    NewCanvas(GetRenderThread(), blue)->ClearAll(static_cast<int>(0xFF0000FF));
    GetRenderThread().Call([&] {
        auto const strip = [](RefPtr<IMKBitmap> const& of) {
            return of->GetTextureBitmap()->GetSubBitmap(0);
        };
        strip(bitmap)->ActivateFrameBufferRT(false);
        strip(blue)->GetTexture()->DrawToCurrent();
        strip(bitmap)->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
    });
    DrawNext();
    ExpectColors({kRed, kGreen, kBlue});
    EXPECT_EQ(CountNewUpdates(), 3u);
}

TEST_F(MipmapChangeTest, SharedBitmapsShareTheLevelsAndHaveFiltersOfTheirOwn) {
    auto const shared =
        RefPtr<IMKBitmap>::Adopt(MKGraphicsFactory::CreateBitmap(&GetRenderThread(), bitmap.Get(), 1));
    onto->ClearAll(static_cast<int>(0xFFFF0000));
    DrawNext(shared.Get());
    EXPECT_EQ(CountNewUpdates(), 0u); // its filter is the default
    shared->GetBitmapReadable()->SetTextureFilter(TextureFilterMipmapped);
    DrawNext(shared.Get());
    DrawNext();
    EXPECT_EQ(CountNewUpdates(), 1u);
    onto->ClearAll(static_cast<int>(0xFF0000FF));
    DrawNext(shared.Get());
    ExpectColors({kRed, kRed, kRed, kBlue});
    EXPECT_EQ(CountNewUpdates(), 2u);
}

TEST_F(MipmapChangeTest, DrawsOfOneMipmappedBitmapAreOneRun) {
    onto->ClearAll(static_cast<int>(0xFFFF0000));
    CountUpdates(GetRenderThread());
    std::uint64_t const runs = RendererFactory::GetStatistics().runs;
    GetRenderThread().Call([&] { // in one list
        for (int i = 0; i < 8; ++i) DrawNext();
    });
    EXPECT_EQ(CountNewUpdates(), 1u);
    EXPECT_EQ(RendererFactory::GetStatistics().runs - runs, 1u);
}

} // namespace
} // namespace Moka::Testing
