#include "tests/trust/Scenarios.h"

#include "moka/base/MessageLoop.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "moka/graphics/loader/MKBitmapSaveManager.h"
#include "scenes/SceneError.h"
#include "scenes/SceneFile.h"
#include "scenes/SceneRenderer.h"
#include "tests/support/TestFiles.h"

#include <atomic>
#include <chrono>
#include <memory>
#include <new>
#include <thread>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;

constexpr int kWidth = 24;
constexpr int kHeight = 100; // several strips, where a texture has 64 rows

Picture const& GetImage() {
    static Picture const image = MakeAlphaPattern(kWidth, kHeight);
    return image;
}

BitmapPtr MakeBitmap(Stage const& stage, int height = kHeight) {
    return BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, kWidth, height,
                                                            GetImage().pixels.data(), false, 1, false));
}

void CreateAndRead(Stage const& stage) {
    BitmapPtr const bitmap = MakeBitmap(stage);
    if (!bitmap) return;
    bitmap->SetTag("picture");
    bitmap->GetTextureBitmap()->UpdateBitmap(GetImage().pixels.data(), kWidth * 4);
    bitmap->GetPixel(Point(3, 3));
}

void CloneAndShare(Stage const& stage) {
    BitmapPtr bitmap = MakeBitmap(stage);
    if (!bitmap) return;
    auto const clone = BitmapPtr::Adopt(bitmap->Clone());
    auto const shared = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, bitmap.Get(), 1));
    if (IMKSubBitmap* const strip = bitmap->GetTextureBitmap()->GetSubBitmap(0))
        RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
    bitmap = {};
    stage.settle();
    if (clone) clone->GetPixel(Point(1, 1));
    auto const screen =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(&stage.queue, 0, 0, kWidth, kHeight, 1, 1));
    if (!screen) return;
    screen->GetPixel(Point(1, 1));
    auto const other = BitmapPtr::Adopt(screen->Clone());
}

// The drawable that make creates for a bitmap, drawn on another one.
template <class Make>
void DrawCustom(Stage const& stage, Make const& make) {
    BitmapPtr const source = MakeBitmap(stage, 50);
    BitmapPtr const target = MakeBitmap(stage);
    if (!source || !target) return;
    auto const canvas =
        RefPtr<IMKCanvas>::Adopt(MKGraphicsFactory::CreateCanvas(&stage.queue, target.Get(), 1));
    auto const drawable = RefPtr<IMKCustomDrawable>::Adopt(make(source.Get()));
    if (canvas && drawable) canvas->Draw(drawable.Get(), nullptr);
    stage.settle();
}

template <class Drawable, class... Bitmaps>
void DrawCustomOf(Stage const& stage) {
    DrawCustom(stage, [&](IMKBitmap* source) {
        auto* const drawable = new (std::nothrow) Drawable(&stage.queue);
        if (drawable) drawable->SetBitmap(static_cast<Bitmaps*>(source)...);
        return drawable;
    });
}

void BlendTwoBitmaps(Stage const& stage) {
    DrawCustom(stage, [&](IMKBitmap* source) {
        RectF const whole(0, 0, 24, 50);
        BitmapPtr first = BitmapPtr::Share(source);
        BitmapPtr second = first;
        auto* const blend =
            new (std::nothrow) MKBlendedBitmapDrawable(&stage.queue, source, source, whole, whole, 0, 0);
        // The drawable has taken over these two references.
        if (blend) static_cast<void>(first.Release()), static_cast<void>(second.Release());
        return blend;
    });
}

void LendToForeignCode(Stage const& stage) {
    BitmapPtr const target = MakeBitmap(stage, 50);
    if (!target) return;
    auto const canvas =
        RefPtr<IMKPenCanvas>::Adopt(MKGraphicsFactory::CreatePenCanvas(&stage.queue, target.Get(), 1));
    if (!canvas) return;
    canvas->SetClipRect(1, 1, 10, 20, IMKCanvasBase::Intersect);
    canvas->Clear(0x40FF0000);
    canvas->GetCanvasMatrix();
    stage.settle();
}

void LoadAndSave(Stage const& stage) {
    String const path(stage.folder + "/picture.png");
    auto const whole = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, &path, 1));
    auto const scaled = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, &path, 7, 9, 1));
    auto const part =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, Rect(2, 2, 9, 70), &path, 1));
    stage.settle();
    for (char const* const name : {"/saved.png", "/saved.jpg", "/saved.webp", "/saved.mki"})
        static_cast<void>(SaveImage(GetImage(), stage.folder + name, 80));
}

constexpr int kSide = 20;

// Counts the accepted requests and the callbacks, which it waits for.
class Book {
public:
    void Expect(bool isAccepted) { mExpected += isAccepted ? 1 : 0; }

    template <class Loader>
    typename Loader::Callback MakeCallback() {
        typename Loader::Callback callback;
        callback.onLoad = [this](int, String const&, auto&) { ++mCalled; };
        callback.onLoadError = [this](int, String const&) { ++mCalled; };
        callback.onSave = [this](int, String const&, void*) { ++mCalled; };
        callback.onSaveError = [this](int, String const&, void*) { ++mCalled; };
        return callback;
    }
    void Await(Stage const& stage) const {
        while (mCalled < mExpected) {
            stage.settle(); // a save goes on once its pixels were read back
            std::this_thread::sleep_for(std::chrono::microseconds(100));
        }
    }

private:
    int mExpected = 0;
    std::atomic<int> mCalled{0};
};

// Waits, however the scenario ends, until the loader has nothing in hand: a load that was cancelled on the way out
// may still be decoded.
class LoaderAtRest {
public:
    explicit LoaderAtRest(Stage const& stage) : mStage(stage) {}
    ~LoaderAtRest() {
        MKBitmapLoader::WaitForAllSaveRequestsToEnd(&mStage.queue);
        mStage.settle();
    }
    LoaderAtRest(LoaderAtRest const&) = delete;
    LoaderAtRest& operator=(LoaderAtRest const&) = delete;

private:
    Stage const& mStage;
};

void SavePixels(BitmapLoader& loader, Book& book, String const& path) {
    std::unique_ptr<unsigned char[]> pixels(
        new (std::nothrow) unsigned char[std::size_t{kSide} * kSide * 4]());
    bool const isAccepted = loader.RequestSave(1, path, pixels.get(), kSide, kSide, nullptr, 100);
    if (isAccepted) static_cast<void>(pixels.release());
    book.Expect(isAccepted);
}

// A save that was refused stays counted, and waiting for it would not end.
void SaveManaged(Stage const& stage, IMKBitmap& bitmap, String const& path) {
    MessageLoop loop;
    MKBitmapSaveManager manager;
    if (manager.RequestSave(3, path, bitmap, nullptr, 100)) manager.WaitForSaveCompleting(&stage.queue);
    loop.RunPending();
}

void LoadAndSaveInBackground(Stage const& stage) {
    if (!MKBitmapLoader::startEventLoopBySelf()) return;
    LoaderAtRest const atRest(stage);
    String const picture(stage.folder + "/picture.png");
    String const saved(stage.folder + "/saved.png");
    Book book;
    auto gpuCallback = book.MakeCallback<MKBitmapLoader>();
    auto cpuCallback = book.MakeCallback<BitmapLoader>();
    MKBitmapLoader gpu("gpu", &gpuCallback);
    BitmapLoader cpu("cpu", &cpuCallback);
    auto const bitmap = RefPtr<IMKBitmap>::Adopt(
        MKGraphicsFactory::CreateBitmap(&stage.queue, kSide, kSide, nullptr, false, 1, false));
    book.Expect(gpu.RequestLoad(1, picture, &stage.queue));
    book.Expect(cpu.RequestLoad(1, picture, &stage.queue, 7, 9));
    book.Expect(gpu.RequestLoad(2, String(stage.folder + "/missing.png"), &stage.queue));
    if (bitmap) book.Expect(gpu.RequestSave(2, saved, *bitmap, nullptr, 100));
    SavePixels(cpu, book, saved);
    book.Await(stage);
    if (bitmap) SaveManaged(stage, *bitmap, saved);
}

// Reading it anew is no part of what is swept.
Scenario MakeDrawing(std::string const& name, bool onScreen) {
    Scenes::Scene scene = Scenes::LoadScene(std::string(MOKA_TRUST_SCENES) + "/" + name + ".json");
    scene.onScreen = onScreen;
    return {"Draws_" + name + (onScreen ? "_on_screen" : ""), [scene](Stage const& stage) {
                try {
                    RenderScene(scene, stage.queue);
                } catch (Scenes::SceneError const&) {
                }
            }};
}

} // namespace

std::vector<Scenario> GetScenarios() {
    std::vector<Scenario> scenarios = {
        {"CreateAndRead", CreateAndRead},
        {"CloneAndShare", CloneAndShare},
        {"DrawBlur", DrawCustomOf<MKGaussianBlurDrawable, IMKBitmap>},
        {"DrawMask", DrawCustomOf<MKTextMaskBitmapDrawable, IMKBitmap>},
        {"DrawStraight", DrawCustomOf<MKNonPremultipliedColorDrawable, IMKBitmap, IMKBitmap>},
        {"BlendTwoBitmaps", BlendTwoBitmaps},
        {"LendToForeignCode", LendToForeignCode},
        {"LoadAndSave", LoadAndSave},
        MakeDrawing("clips", true),
    };
    for (char const* const name :
         {"lines", "rectangles", "circles", "bitmaps", "clips", "turned_clips", "levels"})
        scenarios.push_back(MakeDrawing(name, false));
    return scenarios;
}

Scenario GetLoaderScenario() { return {"LoadAndSaveInBackground", LoadAndSaveInBackground}; }

} // namespace Moka::Testing
