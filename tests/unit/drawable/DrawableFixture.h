// DrawableFixture: drawables over the recording renderer, and what their triangles cover, computed by asking
// which triangles contain a point.
#pragma once

#include "moka/graphics/canvas/MKPaint.h"
#include "tests/unit/drawable/ShaderFixture.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <limits>

namespace Moka::Testing {

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr float kInfinity = std::numeric_limits<float>::infinity();

using Vertex = std::vector<float>;

inline std::vector<Vertex> VerticesOf(RecordedDraw const& draw) {
    auto const size = static_cast<std::size_t>(draw.floatsPerVertex);
    std::vector<Vertex> vertices;
    for (std::size_t i = 0; i + size <= draw.vertices.size(); i += size) {
        auto const first = draw.vertices.begin() + static_cast<std::ptrdiff_t>(i);
        vertices.emplace_back(first, first + draw.floatsPerVertex);
    }
    return vertices;
}

// The values of uniforms, one after the other.
inline std::string Values(RecordedDraw const& draw, std::vector<std::string> const& uniforms) {
    std::string values;
    for (std::string const& name : uniforms) {
        auto const found = draw.uniforms.find(name);
        values +=
            (values.empty() ? "" : " | ") + (found == draw.uniforms.end() ? "unset" : found->second.text);
    }
    return values;
}

// Twice the signed area.
inline double Cross(Vertex const& a, Vertex const& b, double x, double y) {
    return (double(b[0]) - a[0]) * (y - a[1]) - (double(b[1]) - a[1]) * (x - a[0]);
}

inline double AreaOf(std::vector<Vertex> const& triangles) {
    double area = 0;
    for (std::size_t i = 0; i + 3 <= triangles.size(); i += 3)
        area += std::abs(Cross(triangles[i], triangles[i + 1], triangles[i + 2][0], triangles[i + 2][1])) / 2;
    return area;
}

struct Coverage {
    int triangles = 0;
    double value = 0; // of the last one
};

// The third float of a vertex, interpolated.
inline Coverage CoverageAt(std::vector<Vertex> const& triangles, double x, double y) {
    Coverage found;
    for (std::size_t i = 0; i + 3 <= triangles.size(); i += 3) {
        Vertex const& a = triangles[i];
        Vertex const& b = triangles[i + 1];
        Vertex const& c = triangles[i + 2];
        double const area = Cross(a, b, c[0], c[1]);
        double const wa = Cross(b, c, x, y) / area;
        double const wb = Cross(c, a, x, y) / area;
        double const wc = Cross(a, b, x, y) / area;
        if (!(wa > 0 && wb > 0 && wc > 0)) continue;
        ++found.triangles;
        found.value = wa * a[2] + wb * b[2] + wc * c[2];
    }
    return found;
}

// Every sample is in exactly one triangle, with the coverage that the formula gives, and in none where that
// is 0. The samples lie on no edge of the shapes used here.
template <class Formula>
void ExpectCoverage(std::vector<Vertex> const& triangles, double from, double to, Formula const& formula) {
    for (double y = from + 0.1234; y < to; y += 0.3718) {
        for (double x = from + 0.0717; x < to; x += 0.2913) {
            double const expected = std::clamp(double(formula(x, y)), 0.0, 1.0);
            Coverage const found = CoverageAt(triangles, x, y);
            ASSERT_EQ(found.triangles, expected > 0 ? 1 : 0) << x << ", " << y;
            ASSERT_NEAR(found.value, expected, 1e-5) << x << ", " << y;
        }
    }
}

inline MKPaint CommonPaint() {
    MKPaint paint;
    paint.SetColor(0.5f, 0.25f, 0.125f, 0.75f);
    paint.SetTintColor(1, 0, 0.5f, 0.25f);
    paint.SetXFermode(MKPaint::DstIn);
    return paint;
}

// A stencil test, as a clip leaves it.
inline void ForceStencil() {
    DepthStencilStateDescriptor descriptor(false, true);
    descriptor.SetStencilFunction(StencilEqual, 1, 0xFF, 0);
    IDepthStencilState* const state = RendererFactory::CreateDepthStencilState(descriptor);
    state->Apply();
    state->Release();
}

class DrawableFixture : public ShaderFixture {
protected:
    // Those since the last call.
    static std::vector<RecordedDraw> TakeDraws() {
        std::vector<RecordedDraw> draws;
        for (RecordedEvent const& event : RecordingRenderer::TakeEvents())
            if (auto const* draw = std::get_if<RecordedDraw>(&event)) draws.push_back(*draw);
        return draws;
    }
    static RecordedDraw TakeDraw() {
        std::vector<RecordedDraw> const draws = TakeDraws();
        EXPECT_EQ(draws.size(), 1u);
        return draws.empty() ? RecordedDraw() : draws.back();
    }

    // What CommonPaint and the projection must have become, whoever draws.
    static void ExpectCommonState(RecordedDraw const& draw) {
        EXPECT_EQ(Values(draw, {"uProjectionMatrix", "uColor", "uTintColor", "uHasTintColor"}),
                  "2 0 0 0 0 3 0 0 0 0 1 0 -1 0.5 0 1 | 0.5 0.25 0.125 0.75 | 1 0 0.5 0.25 | 1");
        EXPECT_TRUE(draw.state.blend.IsBlending());
        EXPECT_EQ(draw.state.blend.GetColorEquation().destination, BlendingFactor::SrcAlpha); // DstIn
    }
    Matrix4<float> const projection{2, 0, 0, 0, 0, 3, 0, 0, 0, 0, 1, 0, -1, 0.5f, 0, 1};
};

} // namespace Moka::Testing
