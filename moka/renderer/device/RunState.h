// RunState.h: everything a run of draws depends on except its vertices and uniform values, as comparable
// values. GPU objects appear by the names that the device gave them.
#pragma once

#include "moka/renderer/BlendStateDescriptor.h"
#include "moka/renderer/DepthStencilStateDescriptor.h"
#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/IRasterizerState.h"
#include "moka/renderer/TextureParameter.h"

#include <array>
#include <cstdint>

namespace Moka::detail {

// The device's name of an object. 0 means no object, except for frame buffers: the host's may be 0.
using DeviceName = std::uint32_t;

// The target of a command.
struct TargetRef {
    DeviceName frameBuffer = 0;
    DeviceName texture = 0; // the colour attachment; 0: the frame buffer belongs to the host
    int width = 0;          // pixels; 0: the viewport stays as the host set it
    int height = 0;
    DeviceName depthStencil = 0;

    friend bool operator==(TargetRef const& a, TargetRef const& b) {
        return a.frameBuffer == b.frameBuffer && a.texture == b.texture && a.width == b.width &&
               a.height == b.height && a.depthStencil == b.depthStencil;
    }
};

struct ScissorState {
    bool on = false;
    ScissorRect rect; // ignored by a device while off

    friend bool operator==(ScissorState const& a, ScissorState const& b) {
        return a.on == b.on && a.rect == b.rect;
    }
};

struct Sampling {
    TextureParamFilteringValue minFilter = TextureFilterLinear;
    TextureParamFilteringValue magFilter = TextureFilterLinear; // never mipmapped
    TextureParamWrappingValue wrapS = TextureWrapClampToEdge;
    TextureParamWrappingValue wrapT = TextureWrapClampToEdge;

    friend bool operator==(Sampling const& a, Sampling const& b) {
        return a.minFilter == b.minFilter && a.magFilter == b.magFilter && a.wrapS == b.wrapS &&
               a.wrapT == b.wrapT;
    }
};

struct TextureRef {
    DeviceName texture = 0; // 0: the unit keeps its texture
    Sampling sampling;
    int unit = 0;

    friend bool operator==(TextureRef const& a, TextureRef const& b) {
        return a.texture == b.texture && a.unit == b.unit && a.sampling == b.sampling;
    }
};

// The largest number of samplers of one program.
inline constexpr int kMaxSamplers = 4;
// One element for each sampler of the program, in the program's order. The others are empty.
using TextureRefs = std::array<TextureRef, kMaxSamplers>;

struct RunState {
    TargetRef target;
    ScissorState scissor;
    BlendStateDescriptor blend = WithoutBlending();
    DepthStencilStateDescriptor depthStencil{false, false};
    DeviceName program = 0;
    TextureRefs textures;
    int format = 0; // from Device::AddVertexFormat
    PrimitiveType primitive = PrimitiveType::TriangleList;

    // The state that writes the source colour unchanged.
    static BlendStateDescriptor WithoutBlending() {
        BlendStateDescriptor blend(true);
        blend.SetEnabled(false, true);
        return blend;
    }

    friend bool operator==(RunState const& a, RunState const& b) {
        return a.program == b.program && a.target == b.target && a.scissor == b.scissor &&
               a.blend == b.blend && a.depthStencil == b.depthStencil && a.textures == b.textures &&
               a.format == b.format && a.primitive == b.primitive;
    }
};

} // namespace Moka::detail
