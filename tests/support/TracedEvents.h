// TracedDraw, TracedClear: what would have changed a picture, in order, each with the state in force.
// Values, independent of the objects they tell of: those may be gone when a test looks.
#pragma once

#include "moka/renderer/device/RunState.h"

#include <array>
#include <map>
#include <string>
#include <variant>
#include <vector>

namespace Moka::Testing {

// The fixed-function state that was requested.
struct PipelineState {
    BlendStateDescriptor blend = detail::RunState::WithoutBlending();
    DepthStencilStateDescriptor depthStencil{false, false}; // the tests in force, not what was last applied
    bool scissorOn = false;
    ScissorRect scissor;
    bool stencilClip = false;
};

struct TracedUniform {
    std::string text;           // as in the calls
    std::vector<float> numbers; // a bool, an int and a texture unit are one; matrices are column-major
};

struct TracedDraw {
    PipelineState state;
    std::string target; // "target 1"; "none" when nothing is active
    PrimitiveType primitive = PrimitiveType::TriangleList;
    std::vector<float> vertices; // those drawn, first and count applied; empty when nothing was
    int floatsPerVertex = 0;
    int first = 0; // of the vertices handed over
    int count = 0; // that were there and were drawn

    std::string shader;                            // the name its creator gave it
    std::map<std::string, TracedUniform> uniforms; // those ever set, by name
    std::map<int, std::string> textures;           // "texture 1" by unit
};

struct TracedClear {
    PipelineState state;
    std::string target; // what is cleared, whichever target is active
    std::array<float, 4> color{};
};

using TracedEvent = std::variant<TracedDraw, TracedClear>;

} // namespace Moka::Testing
