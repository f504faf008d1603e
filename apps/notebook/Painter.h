// Painter: draws the page's objects onto canvases whose units are the page's pixels.
// Thread: the window's; the drawing itself is posted.
// Memory: the page holds the strokes; the GPU has one's points only while it is written or drawn onto a canvas. One
//         drawable takes all of them in turn, so that the render thread allocates nothing for a stroke once warm.
#pragma once

#include "apps/notebook/Images.h"
#include "apps/notebook/Page.h"
#include "moka/base/RefPtr.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/graphics/paint/MKPaint.h"

#include <set>

namespace Moka::Notebook {

constexpr unsigned kPaper = 0xFFFFFFFF;

MKPaint MakePaint(unsigned argb);

// Appends the points from `from` on.
void AppendInk(MKStrokeDrawable& ink, InkPoints const& points, std::size_t from);

class Painter {
public:
    Painter(Page const& page, Images& images, IGLMsgQueue& queue);

    // Objects of the area, the lowest first, without those that are hidden.
    Objects Find(RectF const& area) const;
    void Draw(IMKCanvas& canvas, Object const& object) const;

    void Hide(std::set<Object const*> objects) { mHidden = std::move(objects); }

private:
    void DrawImage(IMKCanvas& canvas, Image const& image) const;

    Page const& mPage;
    Images& mImages;
    RefPtr<MKStrokeDrawable> const mInk;
    std::set<Object const*> mHidden;
};

} // namespace Moka::Notebook
