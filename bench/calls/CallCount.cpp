// Counts the calls of the libraries' functions by one warm DrawRect on the render thread, up to the draw
// list. bench/calls/run builds it with every function instrumented. It prints "calls N" and, for each entered
// function, its module, offset and number of calls. The script converts these to source files.
#include "moka/graphics/MokaGraphics.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/host/RenderThread.h"

#include <dlfcn.h>

#include <cstdint>
#include <cstdio>
#include <future>
#include <set>
#include <string>

#define UNCOUNTED __attribute__((no_instrument_function))

namespace {

bool isCounting = false;
long calls = 0;
constexpr int kMaxFunctions = 4096;
struct Function {
    void* address;
    long calls;
};
Function functions[kMaxFunctions];
int functionCount = 0;

UNCOUNTED void Remember(void* function) {
    for (int i = 0; i < functionCount; ++i) {
        if (functions[i].address != function) continue;
        ++functions[i].calls;
        return;
    }
    if (functionCount < kMaxFunctions) functions[functionCount++] = {function, 1};
}

} // namespace

extern "C" {
UNCOUNTED void __cyg_profile_func_enter(void* function, void*) {
    if (!isCounting) return;
    ++calls;
    Remember(function);
}
UNCOUNTED void __cyg_profile_func_exit(void*, void*) {}
}

namespace {

using namespace Moka;

// Draws with a render-thread canvas.
class Drawing {
public:
    UNCOUNTED explicit Drawing(IGLMsgQueue* queue) : mQueue(queue) {}

    UNCOUNTED void Run() {
        auto const bitmap = NewBitmap(*mQueue, 256, 256, UseFrom::RenderThread);
        auto const canvas = NewCanvas(*mQueue, bitmap, UseFrom::RenderThread);
        MKPaint paint;
        for (int i = 0; i < 10; ++i) canvas->DrawRect(RectF(1, 2, 30, 40), &paint);
        RectF const rect(3, 4, 50, 60);
        canvas->DrawRect(rect, &paint);
        isCounting = true;
        canvas->DrawRect(rect, &paint);
        isCounting = false;
        done.set_value();
    }

    std::promise<void> done;

private:
    IGLMsgQueue* const mQueue;
};

} // namespace

UNCOUNTED int main() {
    std::string error;
    auto const queue = RenderThread::Start({}, &error);
    if (!queue) return std::fprintf(stderr, "call count: %s\n", error.c_str()), 1;
    Drawing drawing(queue.get());
    WorkerTask::PostMember(queue.get(), &drawing, &Drawing::Run);
    drawing.done.get_future().wait();
    std::printf("calls %ld\n", calls);
    for (int i = 0; i < functionCount; ++i) {
        Dl_info info{};
        if (dladdr(functions[i].address, &info) == 0) continue;
        auto const offset = reinterpret_cast<std::uintptr_t>(functions[i].address) -
                            reinterpret_cast<std::uintptr_t>(info.dli_fbase);
        std::printf("%s 0x%lx %ld\n", info.dli_fname, static_cast<unsigned long>(offset), functions[i].calls);
    }
}
