// Draws the scenes of the gallery. Each frame uploads the bitmaps and creates all objects, as the gallery
// does.
#include "bench/canvas/BenchCanvas.h"
#include "bench/canvas/FrameCounters.h"
#include "bench/canvas/Registration.h"
#include "scenes/SceneRenderer.h"

#include <benchmark/benchmark.h>

#include <string>

namespace Moka::Bench {
namespace {

void Draw(benchmark::State& state, Scenes::Scene const& scene) {
    BenchCanvas target(scene.width, scene.height);
    Scenes::QueueStage stage(GetRenderThread());
    auto const drawFrame = [&] {
        target.canvas->SetMatrix(Matrix3<float>()); // scenes do not reset the matrix
        Scenes::DrawScene(scene, *target.canvas, stage);
    };
    for (int i = 0; i < kWarmUpFrames; ++i) MeasureFrame(drawFrame);
    FrameCounters counters(state, 1, 1e-6);
    for (auto _ : state) counters.Add(MeasureFrame(drawFrame));
}

} // namespace

void RegisterScenes() {
    for (Scenes::Scene const& scene : Scenes::GetScenes()) {
        if (scene.needsPen) continue; // external code draws these
        std::string const name = "Scene/" + scene.name;
        benchmark::RegisterBenchmark(name.c_str(), [&scene](benchmark::State& state) { Draw(state, scene); })
            ->UseManualTime()
            ->Iterations(10)
            ->Unit(benchmark::kMicrosecond);
    }
}

} // namespace Moka::Bench
