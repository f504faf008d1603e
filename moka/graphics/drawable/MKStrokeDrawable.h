/// MKStrokeDrawable: a pen stroke. It consists of a disc at each point, and of all discs between neighbouring
/// points, with linearly interpolated centre and width. So joins and caps are round. Each pixel is blended
/// once, with the coverage of the segment that covers it most. So translucent ink is even where segments meet
/// and where the stroke crosses itself. Colour, alpha, tint and transfer mode come from the paint of
/// IMKCanvas::Draw. The paint's style, line width, anti-aliasing, dashes and cap have no effect. In every
/// transfer mode, pixels that the stroke does not cover stay unchanged. Edges are one device pixel soft at
/// any matrix. A stroke narrower than a device pixel is drawn one device pixel wide, with proportionally less
/// alpha.
/// Units:  the canvas's pixels before its matrix.
/// Thread: Append, Clear and GetBounds on one thread at a time. Each posts at most one task, in order with
///         draws.
/// Fails:  appended points are dropped if the queue refuses the task. Points with NaN or infinite numbers,
///         and points farther than 4,194,304 pixels from the origin, are left out; each Append logs at most
///         one warning. Widths are clamped to 0 ... 4,194,304. A stroke without points draws nothing, one
///         with a single point a disc. If memory runs out, a draw draws nothing.
/// Cost:   appending is constant time for each point. The first draw at a scale prepares all points, later
///         draws only new ones. Two scales are kept; scales between the same powers of two count as one.
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
    /// The centre.
    float x;
    float y;
    float width; ///< the diameter
};

class MOKA_API MKStrokeDrawable final : public detail::CustomDrawable<MKStrokeShader> {
public:
    /// An empty stroke.
    explicit MKStrokeDrawable(IGLMsgQueue* queue);
    ~MKStrokeDrawable() override;

    /// Appends copies of the points. Null or a count below 1 does nothing.
    void Append(MKStrokePoint const* points, int count);
    /// Removes all points and keeps their memory. Draws posted before still draw the old points.
    void Clear();

    /// The rectangle that encloses all valid points with their widths; empty without points. Soft edges
    /// extend one device pixel beyond it. Use it to skip strokes outside the view: the canvas does not cull
    /// custom drawables.
    RectF GetBounds() const { return mBounds; }

    /// Returns all valid points. Waits for the render thread, which holds them.
    std::vector<MKStrokePoint> ReadPoints();

    void DrawRT(Matrix4<float> const& projection, MKPaint const& paint) override;

private:
    class AppendTask;

    IGLMsgQueue* mQueue;
    RectF mBounds;
    bool mHasBounds = false;
    std::unique_ptr<detail::StrokeRT> mStroke; // used on the render thread
};

} // namespace Moka
