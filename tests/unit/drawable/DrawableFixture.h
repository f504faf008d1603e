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

namespace Moka::Testing {

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

    Matrix4<float> const projection{2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 1, 0, -1, 0.5f, 0, 1};
};

} // namespace Moka::Testing
