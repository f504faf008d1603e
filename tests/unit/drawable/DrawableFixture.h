// DrawableFixture: shaders and drawables over the tracing renderer, and what reached it of them.
#pragma once

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/drawable/ShaderManager.h"
#include "moka/graphics/drawable/Shaders.h"
#include "moka/graphics/paint/MKPaint.h"
#include "moka/renderer/IBlendStateObject.h"
#include "moka/renderer/IDepthStencilState.h"
#include "tests/support/LogCapture.h"
#include "tests/support/RendererTrace.h"

#include <gmock/gmock.h>

#include <cstddef>
#include <limits>

namespace Moka::Testing {

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr float kInfinity = std::numeric_limits<float>::infinity();

using Vertex = std::vector<float>;

inline std::vector<Vertex> VerticesOf(TracedDraw const& draw) {
    auto const size = static_cast<std::size_t>(draw.floatsPerVertex);
    std::vector<Vertex> vertices;
    for (std::size_t i = 0; i + size <= draw.vertices.size(); i += size) {
        auto const first = draw.vertices.begin() + static_cast<std::ptrdiff_t>(i);
        vertices.emplace_back(first, first + draw.floatsPerVertex);
    }
    return vertices;
}

// The values of uniforms, one after the other.
inline std::string Values(TracedDraw const& draw, std::vector<std::string> const& uniforms) {
    std::string values;
    for (std::string const& name : uniforms) {
        auto const found = draw.uniforms.find(name);
        values +=
            (values.empty() ? "" : " | ") + (found == draw.uniforms.end() ? "unset" : found->second.text);
    }
    return values;
}

inline MKPaint CommonPaint() {
    MKPaint paint;
    paint.SetColor(0.5f, 0.25f, 0.125f, 0.75f);
    paint.SetTintColor(1, 0, 0.5f, 0.25f);
    paint.SetXFermode(MKPaint::DstIn);
    return paint;
}

// A stencil test, as a clip leaves it, and no blending.
inline void ForceOtherStates() {
    IBlendStateObject* const blend = RendererFactory::CreateBlendStateObject(BlendStateDescriptor(false));
    blend->Apply();
    blend->Release();
    DepthStencilStateDescriptor descriptor(false, true);
    descriptor.SetStencilFunction(StencilEqual, 1, 0xFF, 0);
    IDepthStencilState* const state = RendererFactory::CreateDepthStencilState(descriptor);
    state->Apply();
    state->Release();
}

// Shaders on the render thread. Every test ends with nothing alive that was not before, and nothing misused.
class ShaderFixture : public ::testing::Test {
protected:
    ShaderFixture() {
        RendererTrace::Reset();
        RendererFactory::AttachContext();
        expectedAlive = RendererTrace::CountLiveObjects();
    }
    // When the members of the fixtures that derive from it are gone.
    ~ShaderFixture() override {
        EXPECT_EQ(RendererTrace::CountLiveObjects(), expectedAlive);
        EXPECT_THAT(RendererTrace::GetViolations(), ::testing::IsEmpty());
        RendererTrace::Reset();
    }

    ShaderManager& manager = *ShaderManager::GetInstance();
    LogCapture log;
    int expectedAlive = 0; // for the tests that leak on purpose
};

class DrawableFixture : public ShaderFixture {
protected:
    // Without a target, the state of an immediate renderer is the host's.
    DrawableFixture() { RendererFactory::SetDeferred(true); }

    // Those since the last call.
    static std::vector<TracedDraw> TakeDraws() {
        std::vector<TracedDraw> draws;
        for (TracedEvent const& event : RendererTrace::TakeEvents())
            if (auto const* draw = std::get_if<TracedDraw>(&event)) draws.push_back(*draw);
        return draws;
    }

    // What CommonPaint and the projection must have become, whoever draws.
    static void ExpectCommonState(TracedDraw const& draw) {
        EXPECT_EQ(Values(draw, {"uProjectionMatrix", "uColor", "uTintColor", "uHasTintColor"}),
                  "2 0 0 0 0 3 0 0 0 0 1 0 -1 0.5 0 1 | 0.5 0.25 0.125 0.75 | 1 0 0.5 0.25 | 1");
        EXPECT_TRUE(draw.state.blend.IsBlending());
        EXPECT_EQ(draw.state.blend.GetColorEquation().destination, BlendingFactor::SrcAlpha); // DstIn
    }
    Matrix4<float> const projection{2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 1, 0, -1, 0.5f, 0, 1};
};

} // namespace Moka::Testing
