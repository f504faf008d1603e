// Turns bytes into calls on bitmaps and canvases over the tracing renderer: whatever they are, nothing is
// left, nothing is misused and no memory error happens.
#include "fuzz/CanvasWorld.h"
#include "moka/base/log/LogSink.h"

#include <cstddef>
#include <cstdint>

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    Moka::SetLogSink([](Moka::LogLine const&) {});
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    using namespace Moka::Fuzz;
    FuzzInput input(data, size);
    CanvasWorld world(input);
    std::vector<Operation> const* const kinds[] = {&GetBitmapOperations(), &GetCanvasOperations(),
                                                   &GetDrawOperations(), &GetDrawOperations()};
    while (!input.IsEmpty()) {
        int const kind = input.Below(5);
        if (kind == 4) {
            world.queue.RunOne();
            continue;
        }
        std::vector<Operation> const& operations = *kinds[kind];
        operations[static_cast<std::size_t>(input.Below(static_cast<int>(operations.size())))](world);
    }
    return 0;
}
