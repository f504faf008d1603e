/// MKStrokeDrawable: a pen stroke: a disc at each point, and all discs between neighbours, whose places and
/// widths change linearly. So joins and caps are round. The stroke has one coverage: of its segments the one
/// that covers a pixel most counts, and the pixel is blended once. So translucent ink is even where segments
/// meet and where the stroke crosses itself. Colour, alpha, tint and transfer mode come from the paint given
/// to IMKCanvas::Draw; style, line width, anti-aliasing, dashes and cap of the paint have no effect. Pixels
/// that the stroke does not cover stay as they are in every transfer mode. Edges are one device pixel soft at
/// any matrix. Where the stroke is narrower than a device pixel it is drawn one wide, with an alpha that is
/// less in proportion.
/// Units:  the canvas's pixels before its matrix.
/// Thread: Append, Clear and GetBounds on one thread at a time; each posts at most one task, in order with
///         draws.
/// Fails:  appended points are dropped if the queue refuses. Points with NaN or infinite numbers, and points
///         farther than 4,194,304 pixels from the origin, are left out with one log line for each Append. A
///         negative width is 0, one above 4,194,304 is that. A stroke without points draws nothing, one of a
///         single point a disc. If memory runs out, a draw draws nothing.
/// Cost:   appending is constant time for each point. The first draw at a scale prepares the points, a later
///         one only those that are new; two scales are remembered, those of equal powers of two being one.
/// See CustomDrawable.h for ownership.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/Rect.h"
#include "moka/graphics/drawable/CustomDrawable.h"

#include <memory>
#include <vector>

namespace Moka {

class MKStrokeShader;

namespace detail {
class StrokeRT;
}

/// A point of a stroke, in the canvas's pixels before its matrix.
struct MKStrokePoint {
    /// The place.
    float x;
    float y;
    float width; ///< the diameter
};

class MOKA_API MKStrokeDrawable final : public detail::CustomDrawable<MKStrokeShader> {
public:
    /// An empty stroke.
    explicit MKStrokeDrawable(IGLMsgQueue* queue);
    ~MKStrokeDrawable() override;

    /// Continues the stroke; the points are copied. Null or a count below 1 does nothing.
    void Append(MKStrokePoint const* points, int count);
    /// Draws posted before still draw the old points. Keeps the memory for the next ones.
    void Clear();

    /// Encloses all points that were appended and kept, with their widths; empty without any. For the caller:
    /// the canvas does not cull custom drawables. Soft edges reach a device pixel farther.
    RectF GetBounds() const { return mBounds; }

    /// All points that were appended and kept. Waits for the render thread, which has them.
    std::vector<MKStrokePoint> ReadPoints();

    void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) override;

private:
    class AppendTask;

    IGLMsgQueue* mQueue;
    RectF mBounds;
    bool mHasBounds = false;
    std::unique_ptr<detail::StrokeRT> mStroke; // of the render thread
};

} // namespace Moka
