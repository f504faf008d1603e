// Loads a hundred pictures to the GPU and saves them again, with the loader and the save manager. For
// comparison, two loops on one thread: the codecs alone, and the codecs with upload and read-back between
// them. "ratio" is the loader's time divided by that of the codecs, "ratio_pipeline" divided by that of the
// second loop; both are medians.
#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/base/log/LogSink.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/loader/MKBitmapLoader.h"
#include "moka/graphics/loader/MKBitmapSaveManager.h"
#include "moka/host/RenderThread.h"
#include "tests/support/TestImages.h"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <future>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include <unistd.h>

namespace Moka::Bench {
namespace {

constexpr int kPictures = 100;
constexpr int kSide = 1024;
constexpr int kInFlight = 4;
constexpr int kQuality = 90;

RenderThread& Queue() {
    static std::unique_ptr<RenderThread> const queue = [] {
        SetLogSink([](LogLine const&) {});
        std::string error;
        std::unique_ptr<RenderThread> started = RenderThread::Start({}, &error);
        if (!started) {
            std::fprintf(stderr, "%s\n", error.c_str());
            std::exit(1);
        }
        MKBitmapFactory_UseNativeDecoder();
        MKBitmapLoader::startEventLoopBySelf();
        return started;
    }();
    return *queue;
}

// A gradient with noise, which compresses like a photograph.
Testing::Picture MakePhoto(unsigned seed) {
    Testing::Picture image(kSide, kSide);
    std::mt19937 random(seed);
    for (int y = 0; y < kSide; ++y) {
        for (int x = 0; x < kSide; ++x) {
            int const grain = static_cast<int>(random() % 9);
            auto const shade = [&](int value) { return static_cast<unsigned char>(value / 9 + grain); };
            image.SetColor(x, y, {shade(x + y), shade(2 * y), shade(kSide - x + y / 2), 255});
        }
    }
    return image;
}

// The files, in memory if the system supports it, so that the disk is not measured.
class Pictures {
public:
    explicit Pictures(std::string const& extension) {
        std::filesystem::path const memory("/dev/shm");
        mFolder = (std::filesystem::is_directory(memory) ? memory : std::filesystem::temp_directory_path()) /
                  ("moka_loader_bench_" + std::to_string(getpid()));
        std::filesystem::create_directories(mFolder);
        Testing::Picture photo = MakePhoto(1);
        Testing::Picture page = Testing::MakeInkPage(kSide, kSide);
        for (int i = 0; i < kPictures; ++i) {
            bool const isPhoto = i % 2 == 0;
            Testing::Picture& image = isPhoto ? photo : page;
            mInputs.emplace_back((mFolder / (std::to_string(i) + (isPhoto ? ".jpg" : ".png"))).string());
            mOutputs.emplace_back((mFolder / ("out" + std::to_string(i) + "." + extension)).string());
            Bitmap bitmap;
            bitmap.Construct(image.pixels.data(), kSide, kSide, image.GetStride(), 1, false, false);
            if (!BitmapFactory::SaveBitmap(&bitmap, &mInputs.back(), kQuality)) std::abort();
        }
    }
    ~Pictures() { std::filesystem::remove_all(mFolder); }
    Pictures(Pictures const&) = delete;
    Pictures& operator=(Pictures const&) = delete;

    String const& GetInput(int i) const { return mInputs[static_cast<std::size_t>(i)]; }
    String const& GetOutput(int i) const { return mOutputs[static_cast<std::size_t>(i)]; }

private:
    std::filesystem::path mFolder;
    std::vector<String> mInputs;
    std::vector<String> mOutputs;
};

void RunCodecs(Pictures const& pictures) {
    for (int i = 0; i < kPictures; ++i) {
        std::unique_ptr<Bitmap> const bitmap(BitmapFactory::CreateBitmapForGraphics(&pictures.GetInput(i)));
        if (!bitmap || !BitmapFactory::SaveBitmap(bitmap.get(), &pictures.GetOutput(i), kQuality))
            std::abort();
    }
}

void RunPipeline(Pictures const& pictures) {
    for (int i = 0; i < kPictures; ++i) {
        auto const bitmap = LoadBitmap(Queue(), pictures.GetInput(i).ToFileName());
        if (!SaveBitmap(*bitmap, pictures.GetOutput(i).ToFileName(), kQuality)) std::abort();
    }
}

// Each loaded picture requests its save and the next load.
void RunLoader(Pictures const& pictures) {
    MKBitmapSaveManager saves;
    MKBitmapLoader* loader = nullptr;
    int next = 0; // changed on the loader's thread only, after the start
    std::promise<void> allRequested;
    MKBitmapLoader::Callback callback;
    auto const requestNext = [&] {
        if (next < kPictures) loader->RequestLoad(next, pictures.GetInput(next), &Queue());
        ++next;
        if (next == kPictures + kInFlight) allRequested.set_value();
    };
    callback.onLoad = [&](int id, String const&, IMKBitmap& bitmap) {
        saves.RequestSave(id, pictures.GetOutput(id), bitmap, nullptr, kQuality);
        requestNext();
    };
    callback.onLoadError = [](int, String const&) { std::abort(); };
    MKBitmapLoader front("bench", &callback);
    loader = &front;
    MKBitmapLoader::Callback first;
    first.onLoadError = [&](int, String const&) {
        for (int i = 0; i < kInFlight; ++i) requestNext();
    };
    MKBitmapLoader starter("bench start", &first);
    starter.RequestLoad(0, String(".mki"), &Queue());
    allRequested.get_future().wait();
    saves.WaitForSaveCompleting(&Queue());
}

template <class Function>
double Seconds(Function const& function) {
    auto const start = std::chrono::steady_clock::now();
    function();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

double Median(std::vector<double> values) {
    auto const middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

void LoadAndSave(benchmark::State& state, char const* extension) {
    Queue();
    Pictures const pictures(extension);
    RunLoader(pictures); // warms up allocators and driver
    std::vector<double> ours;
    std::vector<double> ratios;
    std::vector<double> pipelineRatios;
    for (auto _ : state) {
        double const codecs = Seconds([&] { RunCodecs(pictures); });
        ours.push_back(Seconds([&] { RunLoader(pictures); }));
        double const pipeline = Seconds([&] { RunPipeline(pictures); });
        ratios.push_back(ours.back() / codecs);
        pipelineRatios.push_back(ours.back() / pipeline);
        state.SetIterationTime(ours.back());
    }
    state.counters["ms_each"] = Median(ours) * 1e3 / kPictures;
    state.counters["ratio"] = Median(ratios);
    state.counters["ratio_pipeline"] = Median(pipelineRatios);
}
BENCHMARK_CAPTURE(LoadAndSave, ToMki, "mki")->Iterations(5)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(LoadAndSave, ToJpeg, "jpg")->Iterations(5)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(LoadAndSave, ToPng, "png")->Iterations(3)->UseManualTime()->Unit(benchmark::kMillisecond);

} // namespace
} // namespace Moka::Bench
