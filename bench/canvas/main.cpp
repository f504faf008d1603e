// Measures the cost of drawing: on the caller's thread (posting), on the render thread (running the tasks and
// flushing), and waiting for the driver to finish.
// Counters: caller, record, render and finish are medians, in nanoseconds for each primitive or microseconds
// for each
//           scene. record is the part of render before the flush. render_ratio and whole_ratio are the render
//           thread's time, without and with waiting, divided by that of bare GL, which draws the same in
//           alternate frames. The others are the renderer's statistics of the last frame.
#include "bench/canvas/Frame.h"
#include "bench/canvas/Registration.h"
#include "moka/host/RenderThread.h"

#include <benchmark/benchmark.h>

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 2;
    Moka::Bench::RegisterPrimitives();
    Moka::Bench::RegisterScenes();
    Moka::RenderContextInfo const& info = Moka::Bench::GetRenderThread().GetContextInfo();
    benchmark::AddCustomContext("gl_renderer", info.renderer);
    benchmark::AddCustomContext("gl_version", info.version);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    Moka::Bench::StopRenderThread();
    return 0;
}
