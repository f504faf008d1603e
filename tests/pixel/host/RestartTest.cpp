// A render thread that starts after another one has stopped draws everything, also while canvases of the
// stopped one still hold their programs.
#include "moka/base/RefPtr.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/host/RenderThread.h"
#include "tests/support/ImageCompare.h"
#include "tests/support/LogCapture.h"
#include "tests/support/TestImages.h"

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
using CanvasPtr = RefPtr<IMKCanvas>;
using DrawablePtr = RefPtr<IMKCustomDrawable>;
constexpr int kCell = 24;
constexpr int kColumns = 4;

// What draws with the programs, and keeps them for as long as it lives.
struct Holders {
    BitmapPtr target;
    CanvasPtr canvas;
    std::vector<DrawablePtr> customs;
};

// Every primitive, with every program that this driver gets, each in a cell of its own.
class EveryPrimitive {
public:
    EveryPrimitive(IGLMsgQueue* queue, Holders& holders) : mQueue(queue), mHolders(holders) {
        Picture const picture = MakeGradient(16, 16);
        mPicture = NewBitmap(16, 16, picture.pixels.data());
        mQueue->WaitForTasks(); // the image may go
        AddShapes();
        AddBitmaps();
        AddCustoms();
        AddClip();
    }

    Picture Draw() {
        int const rows = (static_cast<int>(mCells.size()) + kColumns - 1) / kColumns;
        Picture image(kColumns * kCell, rows * kCell);
        mHolders.target = NewBitmap(image.width, image.height, nullptr);
        mHolders.canvas = Moka::NewCanvas(*mQueue, mHolders.target);
        for (std::size_t i = 0; i < mCells.size(); ++i) {
            auto const [x, y] = Place(static_cast<int>(i));
            mHolders.canvas->Save(IMKCanvasBase::SaveAll);
            mHolders.canvas->PreTranslate(static_cast<float>(x), static_cast<float>(y));
            mCells[i].draw(*mHolders.canvas);
            mHolders.canvas->Restore(-1);
        }
        mHolders.target->GetBitmapData(mHolders.target->GetBitmapRect(), image.pixels.data());
        return image;
    }

    void ExpectSame(Picture const& expected, Picture const& actual, int round) const {
        Picture const empty(kCell, kCell);
        for (std::size_t i = 0; i < mCells.size(); ++i) {
            auto const [x, y] = Place(static_cast<int>(i));
            Picture const wanted = expected.Crop(x, y, kCell, kCell);
            EXPECT_GT(CompareImages(empty, wanted).differingPixels, 0) << mCells[i].name;
            EXPECT_EQ(CompareImages(wanted, actual.Crop(x, y, kCell, kCell)).differingPixels, 0)
                << mCells[i].name << " of start " << round;
        }
    }

private:
    struct Cell {
        char const* name;
        std::function<void(IMKCanvas&)> draw;
    };

    static std::pair<int, int> Place(int cell) { return {cell % kColumns * kCell, cell / kColumns * kCell}; }

    BitmapPtr NewBitmap(int width, int height, void const* pixels) {
        return Moka::NewBitmap(*mQueue, width, height, pixels);
    }

    void AddShapes() {
        MKPaint paint;
        paint.SetColor(0.8f, 0.2f, 0.4f);
        paint.SetLineWidth(3);
        paint.SetStyle(MKPaint::FillAndStroke);
        mCells.push_back({"rectangle", [=](IMKCanvas& c) { c.DrawRect(4, 4, 20, 18, &paint); }});
        mCells.push_back({"round", [=](IMKCanvas& c) { c.DrawRoundRect(4, 4, 20, 18, 5, 4, &paint); }});
        mCells.push_back({"circle", [=](IMKCanvas& c) { c.DrawCircle(12, 12, 8, &paint); }});
        mCells.push_back({"line", [=](IMKCanvas& c) { c.DrawLine(4, 4, 20, 18, &paint); }});
        mCells.push_back({"simple line", [=](IMKCanvas& c) { c.DrawSimpleLine(4, 18, 20, 4, &paint); }});
    }

    void AddBitmaps() {
        BitmapPtr const picture = mPicture;
        MKPaint darken;
        darken.SetXFermode(MKPaint::Darken);
        mCells.push_back({"bitmap", [=](IMKCanvas& c) { c.DrawBitmap(picture.Get(), 4, 4, nullptr); }});
        mCells.push_back({"darken", [=](IMKCanvas& c) {
                              c.DrawRect(2, 2, 14, 14, nullptr);
                              c.DrawBitmap(picture.Get(), 4, 4, &darken);
                          }});
    }

    void AddCustoms() {
        auto* const mask = new MKTextMaskBitmapDrawable(mQueue);
        mask->SetBitmap(mPicture.Get());
        AddCustom("mask", mask);
        auto* const blur = new MKGaussianBlurDrawable(mQueue);
        blur->SetBitmap(mPicture.Get());
        AddCustom("blur", blur);
        auto* const straight = new MKNonPremultipliedColorDrawable(mQueue);
        straight->SetBitmap(mPicture.Get(), mPicture.Get());
        AddCustom("straight colour", straight);
        mPicture->Ref();
        mPicture->Ref(); // it takes both over
        AddCustom("blend", new MKBlendedBitmapDrawable(mQueue, mPicture.Get(), mPicture.Get(),
                                                       RectF(0, 0, 16, 16), RectF(2, 2, 18, 18), 0, 0));
    }

    void AddCustom(char const* name, IMKCustomDrawable* drawable) {
        auto const held = DrawablePtr::Adopt(drawable);
        mHolders.customs.push_back(held);
        mCells.push_back({name, [=](IMKCanvas& c) { c.Draw(held.Get(), nullptr); }});
    }

    void AddClip() {
        mCells.push_back({"clip by stencil", [](IMKCanvas& c) {
                              c.PreRotate(20, 12, 12);
                              c.SetClipRect(6, 6, 9, 9, IMKCanvasBase::Intersect);
                              c.DrawRect(0, 0, 24, 24, nullptr);
                          }});
    }

    IGLMsgQueue* const mQueue;
    Holders& mHolders;
    BitmapPtr mPicture;
    std::vector<Cell> mCells;
};

TEST(Restart, EveryPrimitiveIsDrawnWhileCanvasesOfStoppedThreadsHoldTheirPrograms) {
    // Reachable for good: never released, like what an application has forgotten.
    static auto& leaked = *new std::vector<Holders>;
    LogCapture const log;
    Picture first(0, 0);
    for (int round = 0; round <= 5; ++round) {
        std::string error;
        auto const thread = RenderThread::Start({{}, true, 1, 1}, &error);
        ASSERT_TRUE(thread) << error;
        leaked.emplace_back();
        EveryPrimitive everything(thread.get(), leaked.back());
        Picture const picture = everything.Draw();
        if (round == 0) first = picture;
        everything.ExpectSame(first, picture, round);
    }
    EXPECT_EQ(log.GetTexts(ANDROID_LOG_ERROR), std::vector<std::string>{});
}

} // namespace
} // namespace Moka::Testing
