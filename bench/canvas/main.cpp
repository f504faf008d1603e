// What drawing costs: the caller's side (posting), the render thread's (running the tasks and flushing), and
// waiting for the driver to finish, with the renderer's counters for a frame.
// Counters: caller, record, render, finish are medians; nanoseconds for each primitive, microseconds for each
//           scene. record is the part of render before the flush. render_ratio and whole_ratio hold the
//           render thread's time, and its time with the finish, against bare GL programs' that draw the same
//           in the same run, in turn. The others are counts of the last frame.
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
