#include "tests/trust/Scenarios.h"

#include "moka/base/MessageLoop.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "moka/graphics/loader/MKBitmapSaveManager.h"
#include "scenes/SceneError.h"
#include "scenes/SceneRenderer.h"
#include "tests/support/TestFiles.h"

#include <algorithm>
#include <atomic>
#include <chrono>
#include <iterator>
#include <thread>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;

constexpr int kWidth = 4;
constexpr int kHeight = 2 * kMaxTexture; // strips
constexpr int kSide = 20;

Picture const& GetImage() {
    static Picture const image = MakeAlphaPattern(kWidth, kHeight);
    return image;
}

BitmapPtr MakeBitmap(Stage const& stage) {
    return NewBitmap(stage.queue, kWidth, kHeight, GetImage().pixels.data());
}

void CreateAndRead(Stage const& stage) {
    BitmapPtr const bitmap = MakeBitmap(stage);
    if (!bitmap) return;
    bitmap->SetTag("picture");
    bitmap->GetTextureBitmap()->UpdateBitmap(GetImage().pixels.data(), kWidth * 4);
    bitmap->GetPixel(Point(3, 3));
    bitmap->GetPixelAsync(Point(1, 1), nullptr, nullptr);
}

void CloneAndShare(Stage const& stage) {
    BitmapPtr bitmap = stage.shared ? BitmapPtr::Share(stage.shared) : MakeBitmap(stage);
    if (!bitmap) return;
    auto const clone = BitmapPtr::Adopt(bitmap->Clone());
    auto const shared = NewSharedBitmap(stage.queue, bitmap);
    auto const canvas = NewCanvas(stage.queue, clone);
    if (IMKSubBitmap* const strip = bitmap->GetTextureBitmap()->GetSubBitmap(0))
        RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
    if (canvas) canvas->DrawBitmap(shared.Get(), 1, 1, nullptr);
    bitmap = {};
    stage.settle();
    if (clone) clone->GetPixel(Point(1, 1));
    auto const screen = NewScreenBitmap(stage.queue, kSide, kSide);
    if (!screen) return;
    screen->GetPixel(Point(1, 1));
    auto const other = BitmapPtr::Adopt(screen->Clone());
}

void LendToForeignCode(Stage const& stage) {
    auto const canvas = NewPenCanvas(stage.queue, MakeBitmap(stage));
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
        static_cast<void>(SaveImage(MakeAlphaPattern(24, 20), stage.folder + name, 80));
}

// Counts the accepted requests that have not called back yet, and waits for them.
class Book {
public:
    void Expect(bool isAccepted) { mOpen += isAccepted ? 1 : 0; }
    void Close() { --mOpen; }

    template <class Loader>
    typename Loader::Callback MakeCallback() {
        typename Loader::Callback callback;
        auto const close = [this](auto&&...) { Close(); };
        callback.onLoad = close;
        callback.onLoadError = close;
        callback.onSave = close;
        callback.onSaveError = close;
        return callback;
    }
    void Await(Stage const& stage) const {
        while (mOpen > 0) {
            stage.settle(); // a save goes on once its pixels were read back
            std::this_thread::sleep_for(std::chrono::microseconds(100));
        }
    }

private:
    std::atomic<int> mOpen{0};
};

// Waits, however the scenario ends, until the loader has nothing in hand: a load that was cancelled on the way out
// may still be decoded.
struct LoaderAtRest {
    ~LoaderAtRest() {
        MKBitmapLoader::WaitForAllSaveRequestsToEnd(&stage.queue);
        stage.settle();
    }
    Stage const& stage;
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
    LoaderAtRest const atRest{stage};
    String const picture(stage.folder + "/picture.png");
    String const saved(stage.folder + "/saved.png");
    BitmapPtr const bitmap = NewBitmap(stage.queue, kSide, kSide);
    auto const canvas =
        stage.shared ? NewCanvas(stage.queue, BitmapPtr::Share(stage.shared)) : RefPtr<IMKCanvas>();
    Book book;
    auto gpuCallback = book.MakeCallback<MKBitmapLoader>();
    // Two references, which need no memory: without it a front end calls nobody back.
    gpuCallback.onLoad = [&canvas, &book](int, String const&, IMKBitmap& loaded) {
        if (canvas) canvas->DrawBitmap(&loaded, 0, 0, nullptr);
        book.Close();
    };
    auto cpuCallback = book.MakeCallback<BitmapLoader>();
    MKBitmapLoader gpu("gpu", &gpuCallback);
    BitmapLoader cpu("cpu", &cpuCallback);
    book.Expect(gpu.RequestLoad(1, picture, &stage.queue));
    book.Expect(cpu.RequestLoad(1, picture, &stage.queue, 7, 9));
    book.Expect(gpu.RequestLoad(2, String(stage.folder + "/missing.png"), &stage.queue));
    if (bitmap) book.Expect(gpu.RequestSave(2, saved, *bitmap, nullptr, 100));
    SavePixels(cpu, book, saved);
    book.Await(stage);
    if (bitmap) SaveManaged(stage, *bitmap, saved);
}

Scenario MakeDrawing(Scenes::Scene const& scene) {
    return {scene.name, [&scene](Stage const& stage) {
                try {
                    RenderScene(scene, stage.queue);
                } catch (Scenes::SceneError const&) {
                }
            }};
}

std::vector<Scenario> MakeScenarios() {
    std::vector<Scenario> scenarios = {{"CreateAndRead", CreateAndRead},
                                       {"CloneAndShare", CloneAndShare},
                                       {"LendToForeignCode", LendToForeignCode},
                                       {"LoadAndSave", LoadAndSave}};
    for (Scenes::Scene const& scene : Scenes::GetScenes())
        if (!scene.needsPen && std::max(scene.width, scene.height / 2) <= kMaxTexture)
            scenarios.push_back(MakeDrawing(scene));
    scenarios.push_back({"LoadAndSaveInBackground", LoadAndSaveInBackground});
    return scenarios;
}

} // namespace

std::vector<Scenario> const& GetScenarios() {
    static std::vector<Scenario> const scenarios = MakeScenarios();
    return scenarios;
}

std::vector<Scenario> FindScenarios(std::vector<std::string> const& names) {
    std::vector<Scenario> found;
    std::copy_if(
        GetScenarios().begin(), GetScenarios().end(), std::back_inserter(found),
        [&](auto& scenario) { return std::find(names.begin(), names.end(), scenario.name) != names.end(); });
    return found;
}

void RunAnyScenario(Stage const& stage, std::mt19937& random) {
    GetScenarios()[random() % (GetScenarios().size() - 1)].run(stage);
}

} // namespace Moka::Testing
