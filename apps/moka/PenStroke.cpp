#include "apps/moka/PenStroke.h"

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/host/RenderThread.h"
#include "moka/renderer/RendererFactory.h"

#include <algorithm>
#include <cmath>

namespace Moka::Tool {
namespace {

using Scenes::InkPoint;

// The ink's edge is soft over this distance on either side.
constexpr float kFeather = 0.5f;

struct Direction {
    float x, y;
};

// Returns the direction of the line at a point, from the previous point to the next.
Direction DirectionAt(std::vector<InkPoint> const& points, std::size_t i) {
    InkPoint const& from = points[i == 0 ? 0 : i - 1];
    InkPoint const& to = points[std::min(i + 1, points.size() - 1)];
    float const length = std::hypot(to.x - from.x, to.y - from.y);
    if (!(length > 0)) return {1, 0};
    return {(to.x - from.x) / length, (to.y - from.y) / length};
}

std::vector<InkVertex> MakeStrip(std::vector<InkPoint> const& points) {
    std::vector<InkVertex> strip;
    strip.reserve(points.size() * 2);
    for (std::size_t i = 0; i < points.size(); ++i) {
        auto const [x, y, radius] = points[i];
        Direction const along = DirectionAt(points, i);
        for (float const across : {-radius - kFeather, radius + kFeather})
            strip.push_back({x - along.y * across, y + along.x * across, across, radius});
    }
    return strip;
}

} // namespace

PenStroke::PenStroke(RenderThread& thread) : mThread(thread) {}

PenStroke::~PenStroke() {
    mThread.Call([this] {
        // Deleting the objects unbinds them, which the renderer must know.
        RendererFactory::Flush();
        mInk.reset();
        RendererFactory::InvalidateState();
    });
}

void PenStroke::DrawStroke(IMKPenCanvas& canvas, std::vector<InkPoint> const& points,
                           Vector4<float> const& color) {
    IMKBitmap* const bitmap = canvas.GetBitmap();
    if (!bitmap || points.size() < 2) return;
    std::vector<InkVertex> const strip = MakeStrip(points);
    mThread.Call([&] {
        if (!mInk) mInk = GlInk::Create();
        canvas.EnableClipRT(0);
        bitmap->GetBitmapWritable()->ActivateFrameBufferRT(false);
        mInk->Draw(canvas.GetCanvasMatrix(), strip, color);
        canvas.DisableClipRT();
        bitmap->GetBitmapWritable()->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
    });
}

} // namespace Moka::Tool
