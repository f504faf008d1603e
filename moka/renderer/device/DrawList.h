// DrawList: draws, clears and copies in order, as values that a device submits to GL. Plain data: record/
// fills it (DrawListBuilder), Device::Submit reads it.
#pragma once

#include "moka/renderer/device/RunState.h"
#include "moka/renderer/device/VertexBuffer.h"

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

// Draws with one state. A device that can take each record's values from a block of uniforms draws them with
// one call for each full block; else each record is a draw call of its own.
struct Run {
    std::size_t state;       // index into the list's states
    std::size_t firstRecord; // index into the list's records
    std::size_t recordCount;
    bool isContiguous;     // each record's vertices follow the last one's
    std::uint32_t varying; // a bit for each int or bool, in the order of their offsets: set if records differ
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

// The contents are no longer needed.
struct Discard {
    TargetRef target;
    bool color;
    bool depthStencil;
};

// The first rows and columns of from into the texture of to, without a flip: width x height pixels. A source
// without alpha reads as opaque. to.frameBuffer exists where from is a host's frame buffer; elsewhere it is 0.
struct TargetCopy {
    TargetRef from;
    TargetRef to;
    int width;
    int height;
};

// The texels of from into the first rows and columns of to, whatever the scissor and the masks are.
struct TextureDraw {
    TargetRef from;
    TargetRef to;
};

// Makes the levels of a texture from its texels. Changes no state that a draw depends on.
struct MipmapUpdate {
    DeviceName texture;
};

using Command = std::variant<Run, ColorClear, DepthStencilClear, TextureClear, Discard, TargetCopy,
                             TextureDraw, MipmapUpdate>;

struct DrawList {
    std::vector<Command> commands;
    std::vector<RunState> states;
    std::vector<Record> records;
    std::vector<unsigned char> uniforms;
    VertexBuffer vertices;
};

} // namespace Moka::detail
