// DrawList: draws, clears and copies in order, as plain data. DrawListBuilder (record/) fills it, and
// Device::Submit executes it.
#pragma once

#include "moka/renderer/device/AppendBuffer.h"
#include "moka/renderer/device/RunState.h"

#include <cstdint>
#include <variant>
#include <vector>

namespace Moka::detail {

// Vertices that are drawn with one set of uniform values.
struct Record {
    std::size_t values; // offset of the program's values into the list's uniforms, bytes
    int first;          // vertex, counted in vertices of the run's own format
    int count;          // vertices
};

// Draws with one state. A device may draw several records with one call, with their values in a uniform
// block. Otherwise each record is one draw call.
struct Run {
    std::size_t state;       // index into the list's states
    std::size_t firstRecord; // index into the list's records
    std::size_t recordCount;
    bool isContiguous;     // the vertices of each record directly follow those of the one before
    std::uint32_t varying; // one bit for each int or bool, in the order of offsets: set if its values differ
};

// Ignores blending and the colour mask. So does DepthStencilClear with the write masks.
struct ColorClear {
    TargetRef target;
    ScissorState scissor;
    std::array<float, 4> color;
};

// Makes a new texture transparent. Changes no state that a draw depends on.
struct TextureClear {
    TargetRef target;
};

struct DepthStencilClear {
    TargetRef target;
    ScissorState scissor;
    bool clearDepth;
    bool clearStencil;
    float depth;
    int stencil;
};

// Tells GL that the contents are no longer needed.
struct Discard {
    TargetRef target;
    bool color;
    bool depthStencil;
};

// Copies the first `width` x `height` pixels of `from` to the texture of `to`, without a flip. A source
// without alpha counts as opaque. to.frameBuffer is set if `from` is a frame buffer of the host; otherwise it
// is 0.
struct TargetCopy {
    TargetRef from;
    TargetRef to;
    int width;
    int height;
};

// Copies the texels of `from` to the first rows and columns of `to`. Ignores scissor and masks.
struct TextureDraw {
    TargetRef from;
    TargetRef to;
};

// Generates the mipmap levels of a texture. Changes no state that a draw depends on.
struct MipmapUpdate {
    DeviceName texture;
};

using Command = std::variant<Run, ColorClear, DepthStencilClear, TextureClear, Discard, TargetCopy,
                             TextureDraw, MipmapUpdate>;

struct DrawList {
    std::vector<Command> commands;
    std::vector<RunState> states;
    std::vector<Record> records;
    AppendBuffer<unsigned char> uniforms;
    AppendBuffer<float> vertices;
};

} // namespace Moka::detail
