// Runs the fragments of the documentation, in its order, each with a new bitmap and canvas, and fails if a line of the
// log has the priority of an error. Writes the pictures that the documentation's programs read.
#include "moka/base/Trace.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/base/log/LogSink.h"
#include "moka/graphics/MokaGraphics.h"
#include "moka/host/RenderThread.h"

#include <atomic>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <memory>
#include <new>
#include <string>
#include <thread>
#include <vector>

using namespace Moka;

namespace {

std::atomic<int> errors{0};

// The names that fragments use without declaring them.
#define MOKA_LISTING_STAGE                                                                                   \
    [[maybe_unused]] RefPtr<IMKBitmap> const bitmap = NewBitmap(queue, 400, 400);                            \
    [[maybe_unused]] RefPtr<IMKCanvas> const canvas = NewCanvas(queue, bitmap);                              \
    [[maybe_unused]] MKPaint paint;                                                                          \
    [[maybe_unused]] std::vector<unsigned char> pixels(400 * 400 * 4);                                       \
    [[maybe_unused]] std::string error;

void RunFragments(RenderThread& queue) {
#include "Fragments.inc"
}

} // namespace

int main() {
    SetLogSink([](LogLine const& line) {
        std::fprintf(stderr, "%s: %s\n", line.tag.c_str(), line.text.c_str());
        if (line.priority >= ANDROID_LOG_ERROR) ++errors;
    });
    std::string reason;
    {
        auto const queue = RenderThread::Start({}, &reason);
        if (!queue) return std::fprintf(stderr, "%s\n", reason.c_str()), 1;
        auto const page = NewBitmap(*queue, 40, 30);
        NewCanvas(*queue, page)->ClearAll(1, 0.5f, 0, 1);
        for (char const* const name : {"a.png", "b.jpg", "c.webp"})
            if (!SaveBitmap(*page, name)) ++errors;
        RunFragments(*queue);
    }
    SetLogSink({});
    return errors == 0 ? 0 : 1;
}
