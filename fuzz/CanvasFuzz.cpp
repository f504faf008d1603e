// Turns bytes into calls on bitmaps and canvases over the tracing renderer: whatever they are, nothing is
// left, nothing is misused and no memory error happens.
#include "fuzz/CanvasWorld.h"

#include <cstddef>
#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    using namespace Moka::Fuzz;
    FuzzInput input(data, size);
    CanvasWorld world(input);
    while (!input.IsEmpty()) DoAny(world);
    return 0;
}
