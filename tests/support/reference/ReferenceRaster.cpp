#include "tests/support/reference/ReferenceRaster.h"

#include <algorithm>

namespace Moka::Testing {
namespace {

// A brush and the pixels it may reach.
struct Reach {
    Brush const* brush;
    Rect pixels;
};

std::vector<Reach> FindReach(Transform const& transform, std::vector<Brush> const& brushes,
                             Rect const& area) {
    std::vector<Reach> found;
    for (Brush const& brush : brushes) {
        auto const box = transform.MapBox(brush.bounds);
        Rect const pixels = box ? Rect(Grown(*box, 1)).Intersect(area) : area;
        if (!pixels.IsEmpty()) found.push_back({&brush, pixels});
    }
    return found;
}

} // namespace

// In single precision, as where it decides.
bool Meets(RectF const& frame, RectF const& shape, Matrix3f const& m) {
    std::optional<RectF> box;
    PointF const corners[] = {{shape.left, shape.top},
                              {shape.right, shape.top},
                              {shape.right, shape.bottom},
                              {shape.left, shape.bottom}};
    for (PointF const& p : corners) {
        float const w = p.x * m[2] + p.y * m[5] + m[8];
        float const x = (p.x * m[0] + p.y * m[3] + m[6]) / w;
        float const y = (p.x * m[1] + p.y * m[4] + m[7]) / w;
        if (!box) box = RectF(x, y, x, y);
        box->MakeRect(x, y);
    }
    return frame.IsIntersect(*box);
}

ReferenceRaster::ReferenceRaster(Picture& image, int stripHeight, int subpixelBits)
    : mImage(image),
      mStripHeight(stripHeight),
      mSubpixelBits(subpixelBits),
      mSlack(image.width, image.height) {}

void ReferenceRaster::Draw(Painting const& painting, ClipSet const& clip) {
    ReferenceDraw const draw(painting, clip, mSubpixelBits);
    for (int top = 0; top < mImage.height; top += mStripHeight) {
        Rect const strip(0, top, mImage.width, std::min(top + mStripHeight, mImage.height));
        if (!painting.extent || Meets(RectF(strip), *painting.extent, painting.matrix)) {
            DrawStrip(draw, painting.brushes, strip);
        }
        if (painting.firstStripOnly) break;
    }
}

// Row by row only the brushes that reach it: a batch has thousands.
void ReferenceRaster::DrawStrip(ReferenceDraw const& draw, std::vector<Brush> const& brushes,
                                Rect const& strip) {
    std::vector<Reach> const all = FindReach(draw.GetTransform(), brushes, strip);
    std::vector<Reach> row;
    ReferenceDraw::Brushes here;
    for (int y = strip.top; y < strip.bottom; ++y) {
        row.clear();
        Rect span;
        for (Reach const& reach : all) {
            Rect const& r = reach.pixels;
            if (y < r.top || y >= r.bottom) continue;
            span =
                row.empty() ? r : Rect(std::min(span.left, r.left), y, std::max(span.right, r.right), y + 1);
            row.push_back(reach);
        }
        for (int x = span.left; x < span.right && !row.empty(); ++x) {
            here.clear();
            for (Reach const& reach : row) {
                if (x >= reach.pixels.left && x < reach.pixels.right) here.push_back(reach.brush);
            }
            if (!here.empty()) DrawPixel(draw, x, y, here);
        }
    }
}

void ReferenceRaster::DrawPixel(ReferenceDraw const& draw, int x, int y,
                                ReferenceDraw::Brushes const& brushes) {
    ReferencePixel const before{FromBytes(mImage.GetColor(x, y)), mSlack.Get(x, y)};
    ReferencePixel const after = draw.Apply(x, y, before, brushes);
    mImage.SetColor(x, y, ToBytes(after.color));
    mSlack.Set(x, y, after.slack);
}

void ReferenceRaster::Fill(Rgba const& color, ClipSet const& clip) {
    Painting painting;
    RectF const everywhere = Grown(RectF(Rect(0, 0, mImage.width, mImage.height)), 1);
    painting.brushes = {{everywhere, [color](PointD const&) { return Ink{color}; }}};
    painting.mode = MKPaint::Src;
    Draw(painting, clip);
}

void ReferenceRaster::FillAll(Rgba const& color) { Fill(color, ClipSet({}, mImage.height)); }

} // namespace Moka::Testing
