// Painter: draws the page's objects onto canvases whose units are the page's pixels.
// Thread: the window's; the drawing itself is posted.
#pragma once

#include "apps/notebook/Images.h"
#include "apps/notebook/Page.h"
#include "moka/base/RefPtr.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/drawable/MKStrokeDrawable.h"
#include "moka/graphics/paint/MKPaint.h"

#include <set>

namespace Moka::Notebook {

MKPaint MakePaint(unsigned argb);

// A stroke without points; those from `from` on are appended to it.
RefPtr<MKStrokeDrawable> MakeInk(IGLMsgQueue& queue);
void AppendInk(MKStrokeDrawable& ink, InkPoints const& points, std::size_t from);

// The page holds the strokes; the GPU has their points only while they are drawn onto tiles.
void DrawInk(IMKCanvas& canvas, InkPoints const& points, unsigned argb);

class Painter {
public:
    static constexpr unsigned kPaper = 0xFFFFFFFF;

    Painter(Page const& page, Images& images) : mPage(page), mImages(images) {}

    // Paper and objects of the area; returns how many objects. Hidden objects are left out.
    std::size_t Paint(IMKCanvas& canvas, RectF const& area) const;
    void Draw(IMKCanvas& canvas, Object const& object) const;

    void Hide(std::set<Object const*> objects) { mHidden = std::move(objects); }

private:
    void DrawImage(IMKCanvas& canvas, Image const& image) const;

    Page const& mPage;
    Images& mImages;
    std::set<Object const*> mHidden;
};

} // namespace Moka::Notebook
