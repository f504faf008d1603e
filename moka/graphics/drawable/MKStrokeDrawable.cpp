#include "moka/graphics/drawable/MKStrokeDrawable.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/drawable/Drawing.h"
#include "moka/graphics/drawable/FringeGeometry.h"
#include "moka/graphics/drawable/ProjectedBounds.h"
#include "moka/graphics/drawable/StrokeRT.h"
#include "moka/graphics/drawable/StrokeView.h"

#include <algorithm>
#include <cmath>
#include <initializer_list>
#include <iterator>
#include <new>
#include <utility>

namespace Moka {

using namespace detail;

namespace {

constexpr float kFarthest = 4194304.0f;

// A corner of a cell. code is 4 * StrokeCell::segments + the index of the corner.
struct StrokeVertex {
    float x;
    float y;
    float side;
    float code;
    float points[3 * StrokeCell::kPoints];
};
static_assert(sizeof(StrokeVertex) == sizeof(StrokeCell));

// Vertices are set in blocks of this many cells, which take 33 KB of stack.
constexpr int kBlockCells = 64;

bool IsKept(MKStrokePoint const& point) {
    return std::fabs(point.x) <= kFarthest && std::fabs(point.y) <= kFarthest && std::isfinite(point.width);
}

std::vector<MKStrokePoint> CopyKept(MKStrokePoint const* points, int count) {
    std::vector<MKStrokePoint> kept;
    kept.reserve(static_cast<std::size_t>(count));
    for (MKStrokePoint const* point = points; point != points + count; ++point) {
        if (IsKept(*point)) kept.push_back({point->x, point->y, std::clamp(point->width, 0.0f, kFarthest)});
    }
    return kept;
}

StrokeVertex* WriteCell(StrokeVertex* at, StrokeCell const& cell) {
    StrokeVertex vertex{cell.x, cell.y, cell.side, 0, {}};
    std::copy(std::begin(cell.points), std::end(cell.points), vertex.points);
    auto const write = [&](std::initializer_list<int> corners) {
        for (int const corner : corners) {
            vertex.code = cell.segments * 4 + static_cast<float>(corner);
            *at++ = vertex;
        }
    };
    int const parts = static_cast<int>(cell.segments);
    if ((parts & StrokeCell::kUpperLeft) != 0) write({0, 1, 2});
    if ((parts & StrokeCell::kLowerRight) != 0) write({2, 1, 3});
    return at;
}

void DrawCells(IGraphicsObject& graphics, std::vector<StrokeCell> const& cells, DrawBounds const& bounds) {
    StrokeVertex vertices[kBlockCells * kQuadVertices];
    StrokeVertex* end = vertices;
    auto const draw = [&] {
        graphics.SetVertices(0, vertices, static_cast<int>(end - vertices));
        graphics.SetBounds(bounds);
        DrawAll(graphics);
        end = vertices;
    };
    for (StrokeCell const& cell : cells) {
        if (cell.side == 0) continue;
        end = WriteCell(end, cell);
        if (std::end(vertices) - end < kQuadVertices) draw();
    }
    if (end != vertices) draw();
    // Removes the vertices, so that the object need not copy them when the list is flushed.
    graphics.SetVertices(0, nullptr, 0);
}

bool IsInView(DrawBounds const& bounds) {
    return !bounds.IsKnown() ||
           (bounds.left < 1 && bounds.right > -1 && bounds.bottom < 1 && bounds.top > -1);
}

} // namespace

class MKStrokeDrawable::AppendTask final : public ITask {
public:
    // An empty vector clears the stroke.
    AppendTask(MKStrokeDrawable* stroke, std::vector<MKStrokePoint> points)
        : mStroke(RefPtr<MKStrokeDrawable>::Share(stroke)), mPoints(std::move(points)) {}

    void run() override {
        if (!mStroke->mStroke) return;
        if (mPoints.empty()) {
            mStroke->mStroke->Clear();
            return;
        }
        try {
            mStroke->mStroke->Append(mPoints);
        } catch (std::bad_alloc const&) {
            __android_log_print(ANDROID_LOG_ERROR, "mok_log", "no memory for %zu points of a stroke",
                                mPoints.size());
        }
    }

private:
    RefPtr<MKStrokeDrawable> mStroke;
    std::vector<MKStrokePoint> mPoints;
};

MKStrokeDrawable::MKStrokeDrawable(IGLMsgQueue* queue)
    : CustomDrawable(queue, PrimitiveType::TriangleList, FloatVertex({4, 4, 4, 4, 4, 2})),
      mQueue(queue),
      mStroke(new (std::nothrow) StrokeRT) {}

MKStrokeDrawable::~MKStrokeDrawable() = default;

// Safe after waiting: only tasks posted by this thread change the points.
std::vector<MKStrokePoint> MKStrokeDrawable::ReadPoints() {
    if (mQueue) mQueue->WaitForTasks();
    return mStroke ? mStroke->GetPoints() : std::vector<MKStrokePoint>();
}

void MKStrokeDrawable::Append(MKStrokePoint const* points, int count) {
    if (!points || count < 1 || !mQueue) return;
    std::vector<MKStrokePoint> kept = CopyKept(points, count);
    if (kept.size() < static_cast<std::size_t>(count)) {
        __android_log_print(ANDROID_LOG_WARN, "mok_log",
                            "%zu of %d points of a stroke are left out: their numbers are not finite, or "
                            "farther than %.0f from the origin",
                            static_cast<std::size_t>(count) - kept.size(), count,
                            static_cast<double>(kFarthest));
    }
    if (kept.empty()) return;
    for (MKStrokePoint const& point : kept) {
        EncloseStrokePoint(mBounds, !std::exchange(mHasBounds, true), point);
    }
    WorkerTask::PostOrDestroy(mQueue, new (std::nothrow) AppendTask(this, std::move(kept)));
}

void MKStrokeDrawable::Clear() {
    mBounds = {};
    mHasBounds = false;
    if (mQueue) WorkerTask::PostOrDestroy(mQueue, new (std::nothrow) AppendTask(this, {}));
}

void MKStrokeDrawable::DrawRT(Matrix4<float> const& projection, MKPaint const& paint) {
    RenderTargetSize const target = RendererFactory::GetActiveTargetSize();
    if (!mStroke || mStroke->IsEmpty() || target.width < 1 || target.height < 1 || !IsConstructed()) return;
    StrokeView const view(projection, target.width, target.height);
    if (!view.IsValid()) return;
    StrokeScale const scale = view.GetScale(mStroke->GetExtent());
    RectF box = mStroke->GetBounds();
    auto const reach = static_cast<float>(scale.coarse);
    box.IncreaseRect(reach, reach);
    DrawBounds const bounds = Project(box, projection);
    if (!IsInView(bounds)) return;
    try {
        std::vector<StrokeCell> const& cells = mStroke->Find(scale);
        MKStrokeShader& shader = Begin(nullptr, 0, nullptr, paint);
        shader.uProjectionMatrix = projection;
        SetColors(shader, paint);
        shader.uToCanvasX = view.GetRow(0);
        shader.uToCanvasY = view.GetRow(1);
        shader.uToCanvasW = view.GetRow(2);
        // At least an eighth of a device pixel. The GPU's rounding of corners is smaller.
        shader.uMargin = static_cast<float>(scale.coarse) * 0.125f;
        DrawCells(GetGraphics(), cells, bounds);
    } catch (std::bad_alloc const&) {
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "no memory to draw a stroke");
    }
}

} // namespace Moka
