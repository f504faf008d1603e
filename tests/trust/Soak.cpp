// Works with the library until as many tasks were posted as the argument says, and fails when memory or renderer
// objects grow after the first fifth.
#include "moka/base/log/LogSink.h"
#include "moka/graphics/bitmap/ImageDecoding.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/host/RenderThread.h"
#include "moka/renderer/RendererFactory.h"
#include "scenes/SceneRenderer.h"
#include "tests/support/TestFiles.h"
#include "tests/trust/Scenarios.h"

#include <algorithm>
#include <atomic>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <malloc.h>
#include <string>
#include <vector>

namespace Moka::Testing {
namespace {

constexpr std::int64_t kSamples = 100;
constexpr std::size_t kWarmUp = kSamples / 5;
constexpr double kMostGrowth = 1024; // bytes for ten thousand operations
// Pages here and there are the allocator's business. A short run has no time to even out what a driver keeps,
// which comes and goes by more.
constexpr double kSlack = 128 * 1024;
constexpr double kShortSlack = 4096 * 1024;
constexpr std::int64_t kShort = 500000; // operations

struct Sample {
    double tasks;
    double bytes; // resident
    double inUse; // of the heap
    int objects;
};

// Without the pages of mapped files, the driver's code among them, which come in as they are first used.
// What the allocator only keeps for the next time goes back before.
double GetResidentBytes() {
    malloc_trim(0);
    std::ifstream file("/proc/self/status");
    std::string word;
    double kilobytes = 0;
    while (file >> word)
        if (word == "RssAnon:") file >> kilobytes;
    return kilobytes * 1024;
}

// What the driver reported counts too: none of it may come.
int CountRendererObjects() {
    RendererStatistics const s = RendererFactory::GetStatistics();
    return s.textures + s.samplers + s.frameBuffers + s.renderBuffers + s.pooledRenderBuffers +
           s.renderTargets + s.textureObjects + s.depthStencilBuffers + s.programs + s.graphicsObjects +
           s.stateObjects + s.buffers + static_cast<int>(s.errors);
}

// Counts what is posted.
class CountingQueue final : public IGLMsgQueue {
public:
    explicit CountingQueue(IGLMsgQueue& queue) : mQueue(queue) {}
    ~CountingQueue() override { AwaitIdle(); }

    bool Post(ITask* task) override {
        ++posted;
        return mQueue.Post(task);
    }
    void WaitForTasks() override { mQueue.WaitForTasks(); }
    // What a task drops for good is deleted by a task that it posts, which may drop more.
    void AwaitIdle() {
        for (int depth = 0; depth < 8; ++depth) WaitForTasks();
    }

    std::atomic<std::int64_t> posted{0};

private:
    IGLMsgQueue& mQueue;
};

// Bytes for each task: the median of the slopes between any two samples. A leak raises them all; a pool of the
// driver's that grows once, at whatever time, does not move it.
double GetSlope(std::vector<Sample> const& samples, double Sample::*value) {
    std::vector<double> slopes;
    for (std::size_t i = kWarmUp; i < samples.size(); ++i)
        for (std::size_t j = i + 1; j < samples.size(); ++j)
            slopes.push_back((samples[j].*value - samples[i].*value) / (samples[j].tasks - samples[i].tasks));
    auto const middle = slopes.begin() + static_cast<std::ptrdiff_t>(slopes.size() / 2);
    std::nth_element(slopes.begin(), middle, slopes.end());
    return *middle;
}

// Uses every program for as long as it lives. Without it they are compiled anew again and again, and what
// grows is the driver's caches of them.
class ProgramsInUse {
public:
    explicit ProgramsInUse(IGLMsgQueue& queue)
        : mTarget(NewBitmap(queue, kMaxTexture, kMaxTexture)),
          mCanvas(NewCanvas(queue, mTarget)),
          mDrawables{Adopt(new MKGaussianBlurDrawable(&queue)), Adopt(new MKTextMaskBitmapDrawable(&queue)),
                     Adopt(new MKStrokeDrawable(&queue)), Adopt(new MKNonPremultipliedColorDrawable(&queue)),
                     Adopt(new MKBlendedBitmapDrawable(&queue, nullptr, nullptr, {}, {}, 0, 0))} {
        Scenes::QueueStage stage(queue);
        for (Scenes::Scene const& scene : Scenes::GetScenes())
            if (!scene.needsPen) DrawScene(scene, *mCanvas, stage);
    }

private:
    static constexpr auto Adopt = RefPtr<IMKCustomDrawable>::Adopt;

    RefPtr<IMKBitmap> const mTarget;
    RefPtr<IMKCanvas> const mCanvas;
    std::vector<RefPtr<IMKCustomDrawable>> const mDrawables;
};

int Soak(std::int64_t operations) {
    mallopt(M_ARENA_MAX, 1); // so that the heap's count has every thread's blocks
    SetLogSink([](LogLine const&) {});
    RenderThreadOptions options;
    options.limits.maxTextureSize = kMaxTexture;
    options.debugContext = true;
    options.surfaceWidth = options.surfaceHeight = kMaxTexture; // screen bitmaps need a default frame buffer
    std::string error;
    auto const thread = RenderThread::Start(options, &error);
    if (!thread) std::fprintf(stderr, "no render thread: %s\n", error.c_str());
    TempFolder const folder;
    if (!thread || !SaveImage(MakeGradient(20, 90), folder.Path("picture.png"))) return 1;
    MKBitmapFactory_UseNativeDecoder();
    CountingQueue queue(*thread);
    ProgramsInUse const programs(queue);
    Stage const stage{queue, [&] { queue.WaitForTasks(); }, folder.GetPath()};
    std::mt19937 random(1);
    std::vector<Sample> samples;
    samples.reserve(kSamples);
    for (std::int64_t i = 1; i <= kSamples; ++i) {
        while (queue.posted < operations * i / kSamples) RunAnyScenario(stage, random);
        queue.AwaitIdle();
        samples.push_back({static_cast<double>(queue.posted), GetResidentBytes(),
                           static_cast<double>(mallinfo2().uordblks), CountRendererObjects()});
    }
    double const slope = GetSlope(samples, &Sample::bytes) * 10000;
    double const heapSlope = GetSlope(samples, &Sample::inUse) * 10000;
    // The renderer may keep a copy of a target for the next time, or not.
    int objects = 0;
    for (std::size_t i = 0; i < kWarmUp; ++i) objects = std::max(objects, samples[i].objects);
    std::printf("operations %lld\nresident %.0f KB after warm-up, %.0f KB at the end\n"
                "growth for 10,000 operations: resident %.1f bytes, heap in use %.1f bytes\n"
                "renderer objects at most %d in the warm-up, %d at the end\n",
                static_cast<long long>(queue.posted), samples[kWarmUp].bytes / 1024,
                samples.back().bytes / 1024, slope, heapSlope, objects, samples.back().objects);
    double const slack = operations < kShort ? kShortSlack : kSlack;
    bool const isFlat = slope < kMostGrowth || samples.back().bytes - samples[kWarmUp].bytes < slack;
    return isFlat && samples.back().objects <= objects ? 0 : 1;
}

} // namespace
} // namespace Moka::Testing

int main(int argc, char** argv) {
    long long const operations = argc > 1 ? std::atoll(argv[1]) : 0;
    if (operations < 1000) {
        std::fprintf(stderr, "usage: %s OPERATIONS (1000 or more)\n", argv[0]);
        return 2;
    }
    return Moka::Testing::Soak(operations);
}
