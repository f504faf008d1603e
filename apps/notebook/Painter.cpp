#include "apps/notebook/Painter.h"

namespace Moka::Notebook {

MKPaint MakePaint(unsigned argb) {
    MKPaint paint;
    paint.SetColor(static_cast<int>(argb));
    paint.SetAntiAliasing(true);
    return paint;
}

RefPtr<MKStrokeDrawable> MakeInk(IGLMsgQueue& queue) {
    return RefPtr<MKStrokeDrawable>::Adopt(new MKStrokeDrawable(&queue));
}

void AppendInk(MKStrokeDrawable& ink, InkPoints const& points, std::size_t from) {
    std::vector<MKStrokePoint> copy;
    copy.reserve(points.size() - from);
    for (std::size_t i = from; i < points.size(); ++i)
        copy.push_back({points[i].x, points[i].y, points[i].width});
    ink.Append(copy.data(), static_cast<int>(copy.size()));
}

void DrawInk(IMKCanvas& canvas, InkPoints const& points, unsigned argb) {
    auto const ink = MakeInk(*canvas.GetMsgQueue());
    AppendInk(*ink, points, 0);
    MKPaint const paint = MakePaint(argb);
    canvas.Draw(ink.Get(), &paint);
}

std::size_t Painter::Paint(IMKCanvas& canvas, RectF const& area) const {
    canvas.ClearAll(static_cast<int>(kPaper));
    std::vector<std::size_t> const found = mPage.Find(area);
    for (std::size_t const i : found) {
        Object const& object = *mPage.GetObjects()[i];
        if (mHidden.count(&object) == 0) Draw(canvas, object);
    }
    return found.size();
}

void Painter::Draw(IMKCanvas& canvas, Object const& object) const {
    if (auto const* const stroke = std::get_if<Stroke>(&object.content))
        DrawInk(canvas, stroke->points, stroke->argb);
    else
        DrawImage(canvas, std::get<Image>(object.content));
}

// A frame stands for an image that is not there yet, one with a cross for an image that cannot be read.
void Painter::DrawImage(IMKCanvas& canvas, Image const& image) const {
    if (IMKBitmap* const bitmap = mImages.Get(image.file)) {
        MKPaint const paint;
        canvas.DrawBitmap(bitmap, image.place, &paint);
        return;
    }
    MKPaint const fill = MakePaint(0xFFECEFF3);
    canvas.DrawRect(image.place, &fill);
    MKPaint frame = MakePaint(0xFF9AA5B1);
    frame.SetStyle(MKPaint::Stroke);
    frame.SetLineWidth(2);
    canvas.DrawRect(image.place, &frame);
    if (!mImages.HasFailed(image.file)) return;
    RectF const& r = image.place;
    canvas.DrawLine(r.left, r.top, r.right, r.bottom, &frame);
    canvas.DrawLine(r.left, r.bottom, r.right, r.top, &frame);
}

} // namespace Moka::Notebook
