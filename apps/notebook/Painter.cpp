#include "apps/notebook/Painter.h"

namespace Moka::Notebook {

MKPaint MakePaint(unsigned argb) {
    MKPaint paint;
    paint.SetColor(static_cast<int>(argb));
    paint.SetAntiAliasing(true);
    return paint;
}

void AppendInk(MKStrokeDrawable& ink, InkPoints const& points, std::size_t from) {
    std::vector<MKStrokePoint> copy;
    copy.reserve(points.size() - from);
    for (std::size_t i = from; i < points.size(); ++i)
        copy.push_back({points[i].x, points[i].y, points[i].width});
    ink.Append(copy.data(), static_cast<int>(copy.size()));
}

Painter::Painter(Page const& page, Images& images, IGLMsgQueue& queue)
    : mPage(page), mImages(images), mInk(RefPtr<MKStrokeDrawable>::Adopt(new MKStrokeDrawable(&queue))) {}

Objects Painter::Find(RectF const& area) const {
    Objects found;
    for (std::size_t const i : mPage.Find(area)) {
        ObjectPtr const& object = mPage.GetObjects()[i];
        if (mHidden.count(object.get()) == 0) found.push_back(object);
    }
    return found;
}

void Painter::Draw(IMKCanvas& canvas, Object const& object) const {
    auto const* const stroke = std::get_if<Stroke>(&object.content);
    if (!stroke) return DrawImage(canvas, std::get<Image>(object.content));
    mInk->Clear();
    AppendInk(*mInk, stroke->points, 0);
    MKPaint const paint = MakePaint(stroke->argb);
    canvas.Draw(mInk.Get(), &paint);
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
