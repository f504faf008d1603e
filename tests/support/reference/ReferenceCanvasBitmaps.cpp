#include "tests/support/reference/ReferenceCanvas.h"

#include <cmath>

namespace Moka::Testing {
namespace {

// Bitmaps of other kinds have their pixels where the reference cannot reach them.
ReferenceBitmap* Find(IMKBitmap* bitmap) { return dynamic_cast<ReferenceBitmap*>(bitmap); }

// Right and bottom are the size, wherever the bitmap lies, which callers see.
RectF WholeOf(IMKBitmap const& bitmap) {
    return {static_cast<float>(bitmap.GetX()), static_cast<float>(bitmap.GetY()),
            static_cast<float>(bitmap.GetWidth()), static_cast<float>(bitmap.GetHeight())};
}

RectF PlaceAt(IMKBitmap const& bitmap, PointF const& p) {
    return {p.x, p.y, p.x + static_cast<float>(bitmap.GetWidth()),
            p.y + static_cast<float>(bitmap.GetHeight())};
}

void SetTiling(Wrap& wrap, int mode) {
    if (mode == MKPaint::Default || mode == MKPaint::Clamp) wrap = Wrap::Clamp;
    if (mode == MKPaint::Mirror) wrap = Wrap::Mirror;
    if (mode == MKPaint::Repeat) wrap = Wrap::Repeat;
}

Rgba Colored(Rgba const& texel, double coverage, MKPaint const& paint) {
    if (paint.HasTintColor()) return PaintColor(paint, coverage * texel.a);
    double const a = coverage * double{paint.GetColor().w};
    return {texel.r * a, texel.g * a, texel.b * a, texel.a * a};
}

// The quad of an image whose texture covers bounds.
BitmapQuad MakeQuad(RectF const& bounds, RectF const& src, RectF const& dst, bool antiAliased) {
    auto const width = static_cast<double>(bounds.GetWidth());
    auto const height = static_cast<double>(bounds.GetHeight());
    auto const part = [](float value, double size) { return static_cast<double>(value) / size; };
    // The right edge adds where the left one subtracts, which callers see.
    return {dst,
            part(src.left - bounds.left, width),
            part(src.top - bounds.top, height),
            part(src.right + bounds.left, width),
            part(src.bottom - bounds.top, height),
            antiAliased};
}

// Linear filters cut places and weights off to steps of 1/256, and may keep bytes in between.
constexpr double kStep = 1.0 / 128;
constexpr double kFiltering = 1;

// The image and the paint outlive the brush.
Brush MakeBrush(Picture const& image, Sampler const& sampler, BitmapQuad const& quad, MKPaint const& paint) {
    Shape const shape = quad.GetShape();
    double const columns = (quad.rightU - quad.leftU) * image.width;
    double const rows = (quad.bottomV - quad.topV) * image.height;
    std::array<PointD, 2> const blur{PointD{kStep * static_cast<double>(quad.dst.GetWidth()) / columns, 0},
                                     PointD{0, kStep * static_cast<double>(quad.dst.GetHeight()) / rows}};
    return {shape.bounds,
            [&image, &paint, sampler, quad, shape](PointD const& p) -> std::optional<Ink> {
                Coverage const c = shape.at(p);
                if (!c) return {};
                Coordinates const found = quad.GetCoordinates(p);
                Ink ink{{}, c->vague ? 255.0 : 0.0};
                for (std::size_t i = 0; i < found.count; ++i) {
                    PointD const& at = found.all[i];
                    Rgba const color = Colored(Sample(image, sampler, at.x, at.y), c->coverage, paint);
                    if (i == 0) {
                        ink.color = color;
                        ink.slack += IsBetweenTexels(image, at.x, at.y) ? kFiltering : 0;
                    }
                    ink.slack += Distance(color, ink.color) * 255;
                }
                return ink;
            },
            blur};
}

} // namespace

void ReferenceCanvas::DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) {
    if (bitmap) DrawBitmap(bitmap, PlaceAt(*bitmap, {x, y}), paint);
}

void ReferenceCanvas::DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) {
    if (bitmap) DrawBitmap(bitmap, WholeOf(*bitmap), dst, paint);
}

// Without tiling a bitmap is drawn strip by strip, each as an image of its own; with tiling the first strip
// stands for the whole.
void ReferenceCanvas::DrawBitmap(IMKBitmap* given, RectF const& src, RectF const& dst,
                                 MKPaint const* givenPaint) {
    ReferenceBitmap* const bitmap = Find(given);
    if (!bitmap || dst.left == dst.right || dst.top == dst.bottom) return;
    MKPaint paint = Given(givenPaint);
    bool const tiles = paint.GetTileModeX() != MKPaint::Default || paint.GetTileModeY() != MKPaint::Default;
    if (!tiles) paint.SetTileMode(MKPaint::Clamp);
    SetTiling(bitmap->sampler.x, paint.GetTileModeX());
    SetTiling(bitmap->sampler.y, paint.GetTileModeY());
    Picture const whole = bitmap->image; // the target may be drawn onto itself
    for (int top = 0; top < whole.height; top += mStripHeight) {
        int const rows = std::min(mStripHeight, whole.height - top);
        Picture const strip = whole.Crop(0, top, whole.width, rows);
        RectF bounds(Rect(0, top, whole.width, top + rows));
        RectF from(std::max(bounds.left, src.left), std::max(bounds.top, src.top),
                   std::min(bounds.right, src.right), std::min(bounds.bottom, src.bottom));
        RectF to(dst.left + dst.GetWidth() * (from.left - src.left) / src.GetWidth(),
                 dst.top + dst.GetHeight() * (from.top - src.top) / src.GetHeight(),
                 dst.left + dst.GetWidth() * (from.right - src.left) / src.GetWidth(),
                 dst.top + dst.GetHeight() * (from.bottom - src.top) / src.GetHeight());
        if (tiles) {
            bounds = WholeOf(*bitmap);
            from = src;
            to = dst;
        } else if (from.IsEmpty()) {
            continue;
        }
        DrawQuads(strip, *bitmap, {MakeQuad(bounds, from, to, paint.IsAntiAliasing())}, paint, false);
        if (tiles) break;
    }
}

void ReferenceCanvas::DrawQuads(Picture const& image, ReferenceBitmap const& bitmap,
                                std::vector<BitmapQuad> const& quads, MKPaint const& paint, bool batch) {
    Painting painting;
    painting.matrix = mMatrix;
    painting.mode = paint.GetXFermode();
    painting.composes = painting.mode == MKPaint::Darken || painting.mode == MKPaint::Lighten;
    painting.firstStripOnly = batch;
    if (!batch) painting.extent = quads[0].dst;
    for (BitmapQuad const& quad : quads) {
        painting.brushes.push_back(MakeBrush(image, bitmap.sampler, quad, paint));
    }
    ClipSet const clip = GetClip();
    // A batch draws where there is no stencil.
    mRaster.Draw(painting, batch && clip.IsPointSet() ? ClipSet() : clip);
}

void ReferenceCanvas::DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points, MKPaint const* paint) {
    if (!bitmap) return;
    std::vector<RectF> dsts;
    for (PointF const& p : points) dsts.push_back(PlaceAt(*bitmap, p));
    DrawBitmaps(bitmap, dsts, paint);
}

void ReferenceCanvas::DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts, MKPaint const* paint) {
    if (bitmap) DrawBitmaps(bitmap, WholeOf(*bitmap), dsts, paint);
}

void ReferenceCanvas::DrawBitmaps(IMKBitmap* given, RectF const& src, std::vector<RectF> const& dsts,
                                  MKPaint const* givenPaint) {
    ReferenceBitmap* const bitmap = Find(given);
    if (!bitmap || !src.IsIntersect(RectF(bitmap->GetBitmapRect()))) return;
    MKPaint const paint = Given(givenPaint);
    SetTiling(bitmap->sampler.x, paint.GetTileModeX());
    SetTiling(bitmap->sampler.y, paint.GetTileModeY());
    Picture const first =
        bitmap->image.Crop(0, 0, bitmap->image.width, std::min(mStripHeight, bitmap->image.height));
    std::vector<BitmapQuad> quads;
    for (RectF const& dst : dsts) {
        if (!Meets(RectF(mTarget.GetBitmapRect()), dst, mMatrix)) continue;
        quads.push_back(MakeQuad(WholeOf(*bitmap), src, dst, paint.IsAntiAliasing()));
    }
    if (!quads.empty()) DrawQuads(first, *bitmap, quads, paint, true);
}

} // namespace Moka::Testing
