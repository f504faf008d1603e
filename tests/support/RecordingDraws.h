// RecordedDraw, RecordedClear: what would have changed a picture, in order, each with the state in force.
// Values, independent of the objects they tell of: those may be gone when a test looks.
#pragma once

#include "moka/renderer/BlendStateDescriptor.h"
#include "moka/renderer/DepthStencilStateDescriptor.h"
#include "moka/renderer/IGraphicsObject.h"
#include "moka/renderer/IRasterizerState.h"

#include <array>
#include <map>
#include <string>
#include <variant>
#include <vector>

namespace Moka::Testing {

// The fixed-function state, as a context starts with it: nothing is tested, nothing is blended.
struct PipelineState {
    BlendStateDescriptor blend = ReplacingBlend();
    DepthStencilStateDescriptor depthStencil{false, false}; // the tests in force, not what was last applied
    bool scissorOn = false;
    ScissorRect scissor;
    bool stencilClip = false;

private:
    static BlendStateDescriptor ReplacingBlend() {
        BlendStateDescriptor blend(false);
        blend.SetEnabled(false, true);
        return blend;
    }
};

struct RecordedUniform {
    std::string text;           // as in the calls
    std::vector<float> numbers; // a bool, an int and a texture unit are one; matrices are column-major
};

struct RecordedDraw {
    PipelineState state;
    std::string target; // "target 1"; "none" when nothing is active
    std::string buffer; // the depth-stencil buffer attached to it, or "none"

    std::string graphics; // "graphics 1"
    PrimitiveType primitive = PrimitiveType::TriangleList;
    std::vector<float> vertices; // those drawn, first and count applied; empty when nothing was
    int floatsPerVertex = 0;
    int first = 0; // of the vertices handed over
    int count = 0; // that were there and were drawn

    std::string program;                             // "program 1"
    std::string shader;                              // the name its creator gave it
    std::map<std::string, RecordedUniform> uniforms; // those ever set, by name
    std::map<int, std::string> textures;             // "texture 1" by unit
};

struct RecordedClear {
    PipelineState state;
    std::string target; // what is cleared, whichever target is active
    std::string buffer; // attached to it, or "none"

    bool clearsColor = false;
    std::array<float, 4> color{};
    bool clearsDepth = false;
    float depth = 0;
    bool clearsStencil = false;
    int stencil = 0;
};

using RecordedEvent = std::variant<RecordedDraw, RecordedClear>;

} // namespace Moka::Testing
