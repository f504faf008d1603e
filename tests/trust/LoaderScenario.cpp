#include "moka/base/MessageLoop.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/loader/BitmapLoader.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "moka/graphics/loader/MKBitmapSaveManager.h"
#include "tests/trust/Scenarios.h"

#include <atomic>
#include <chrono>
#include <memory>
#include <new>
#include <thread>

namespace Moka::Testing {
namespace {

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

} // namespace

Scenario GetLoaderScenario() { return {"LoadAndSaveInBackground", LoadAndSaveInBackground}; }

} // namespace Moka::Testing
