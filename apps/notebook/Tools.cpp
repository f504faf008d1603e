#include "apps/notebook/Tools.h"

#include <algorithm>
#include <cmath>

namespace Moka::Notebook {
namespace {

constexpr float kHandle = 7;      // of the window's pixels
constexpr float kTap = 4;         // a lasso smaller than this picks what is under it
constexpr float kHighlighter = 6; // times the pen's width
constexpr float kSmallestScale = 0.05f;
constexpr unsigned kMark = 0xFF2F7DD1;

float GetDistance(PointF const& a, PointF const& b) { return std::hypot(a.x - b.x, a.y - b.y); }

bool Contains(RectF const& r, PointF const& p) {
    return p.x >= r.left && p.x < r.right && p.y >= r.top && p.y < r.bottom;
}

} // namespace

unsigned Tools::GetInk() const { return GetColor() | (mTool == Tool::Highlighter ? 0x70000000 : 0xFF000000); }

void Tools::Choose(Tool tool) {
    Cancel();
    mSelected.clear();
    mTool = tool;
}

void Tools::Down(PointF at, std::uint32_t time, float pressure, double zoom) {
    Cancel();
    mIsDown = true;
    mFirst = mLast = at;
    if (mTool == Tool::Pen || mTool == Tool::Highlighter) {
        bool const isPlain = mTool == Tool::Highlighter;
        mPath.emplace(isPlain ? mWidth * kHighlighter : mWidth, isPlain);
        mPath->Add(at.x, at.y, time, pressure);
        mLiveCount = 0;
    } else if (mTool != Tool::Select) {
        mPage.Begin();
        Erase(at, zoom);
    } else if (!BeginDrag(at, zoom)) {
        mSelected.clear();
        mLasso = {at};
    }
}

void Tools::Move(PointF at, std::uint32_t time, float pressure, double zoom) {
    if (!mIsDown) return;
    if (mPath)
        mPath->Add(at.x, at.y, time, pressure);
    else if (mTool != Tool::Select)
        Erase(at, zoom);
    else if (!IsDragging())
        mLasso.push_back(at);
    mLast = at;
}

void Tools::Up() {
    if (!mIsDown) return;
    mIsDown = false;
    if (mPath) {
        Stroke stroke{mPath->Finish(), GetInk()};
        mPath.reset();
        mPage.Append(std::make_shared<Object const>(std::move(stroke)));
    } else if (mTool != Tool::Select) {
        mPage.End();
    } else if (IsDragging()) {
        EndDrag();
    } else {
        SelectInside();
    }
    mLasso.clear();
}

void Tools::Cancel() {
    if (!mIsDown) return;
    mIsDown = false;
    mPath.reset();
    mLasso.clear();
    mLast = mFirst;
    if (mTool == Tool::StrokeEraser || mTool == Tool::PartEraser) mPage.End();
    if (IsDragging()) EndDrag();
}

void Tools::Erase(PointF to, double zoom) {
    Swipe const swipe{mLast, to, kEraserRadius / static_cast<float>(zoom)};
    std::vector<std::size_t> const found = mPage.Find(swipe.GetBounds());
    // From the top, so that the positions below stay.
    std::for_each(found.rbegin(), found.rend(), [&](std::size_t i) { EraseFrom(i, swipe); });
}

void Tools::EraseFrom(std::size_t index, Swipe const& swipe) {
    auto const* const stroke = std::get_if<Stroke>(&mPage.GetObjects()[index]->content);
    if (!stroke || !swipe.Touches(stroke->points)) return;
    if (mTool == Tool::StrokeEraser) return mPage.Replace(index, {});
    std::vector<InkPoints> pieces = swipe.Cut(stroke->points);
    if (pieces.size() == 1 && pieces[0] == stroke->points) return;
    Objects objects;
    for (InkPoints& piece : pieces) {
        for (InkPoint& p : piece) p = {RoundForFile(p.x), RoundForFile(p.y), RoundForFile(p.width)};
        objects.push_back(std::make_shared<Object const>(Stroke{std::move(piece), stroke->argb}));
    }
    mPage.Replace(index, std::move(objects));
}

RectF Tools::GetSelectedBounds() const {
    RectF bounds;
    for (ObjectPtr const& object : mSelected) bounds = Unite(bounds, object->bounds);
    return bounds;
}

bool Tools::BeginDrag(PointF at, double zoom) {
    if (mSelected.empty()) return false;
    RectF const bounds = GetSelectedBounds();
    float const reach = 2 * kHandle / static_cast<float>(zoom);
    bool const isAtCorner = GetDistance(at, {bounds.right, bounds.bottom}) < reach;
    if (!isAtCorner && !Contains(bounds, at)) return false;
    mDrag = isAtCorner ? Drag::Scale : Drag::Move;
    std::set<Object const*> hidden;
    for (ObjectPtr const& object : mSelected) hidden.insert(object.get());
    mPainter.Hide(std::move(hidden));
    return true;
}

Placement Tools::GetPlacement() const {
    if (mDrag == Drag::Move) return {1, mLast.x - mFirst.x, mLast.y - mFirst.y};
    if (mDrag != Drag::Scale) return {};
    // About the top left corner, by what the drag adds along the diagonal.
    RectF const bounds = GetSelectedBounds();
    float const w = std::max(bounds.GetWidth(), 1.0f);
    float const h = std::max(bounds.GetHeight(), 1.0f);
    float const along = ((mLast.x - mFirst.x) * w + (mLast.y - mFirst.y) * h) / (w * w + h * h);
    float const scale = std::max(1 + along, kSmallestScale);
    return {scale, bounds.left * (1 - scale), bounds.top * (1 - scale)};
}

void Tools::EndDrag() {
    Placement const placement = GetPlacement();
    mPainter.Hide({});
    mDrag = Drag::None;
    if (placement.IsIdentity()) return;
    Objects moved;
    mPage.Begin();
    for (std::size_t i = 0; i < mPage.GetObjects().size(); ++i) {
        ObjectPtr const object = mPage.GetObjects()[i];
        if (std::find(mSelected.begin(), mSelected.end(), object) == mSelected.end()) continue;
        moved.push_back(object->Move(placement));
        mPage.Replace(i, {moved.back()});
    }
    mPage.End();
    mSelected = std::move(moved);
}

void Tools::SelectInside() {
    RectF area(mFirst.x, mFirst.y, mFirst.x, mFirst.y);
    for (PointF const& p : mLasso) area.MakeRect(p.x, p.y);
    bool const isTap = area.GetWidth() < kTap && area.GetHeight() < kTap;
    area.IncreaseRect(1, 1);
    for (std::size_t const i : mPage.Find(area)) {
        ObjectPtr const& object = mPage.GetObjects()[i];
        auto const* const stroke = std::get_if<Stroke>(&object->content);
        RectF const& b = object->bounds;
        bool const isIn = stroke && isTap ? Swipe{mFirst, mFirst, kTap}.Touches(stroke->points)
                          : stroke        ? IsMostlyInside(mLasso, stroke->points)
                          : isTap         ? Contains(b, mFirst)
                                          : IsInside(mLasso, (b.left + b.right) / 2, (b.top + b.bottom) / 2);
        if (!isIn) continue;
        if (isTap) mSelected.clear(); // the topmost alone
        mSelected.push_back(object);
    }
}

void Tools::DeleteSelected() {
    Cancel();
    mPage.Begin();
    for (std::size_t i = mPage.GetObjects().size(); i-- > 0;) {
        ObjectPtr const& object = mPage.GetObjects()[i];
        if (std::find(mSelected.begin(), mSelected.end(), object) != mSelected.end()) mPage.Replace(i, {});
    }
    mPage.End();
    mSelected.clear();
}

// Opaque ink may lie over itself, so only what is new goes to the GPU. Translucent ink is one stroke, tail and all.
void Tools::DrawLive(IMKCanvas& canvas, float ahead) {
    for (RefPtr<MKStrokeDrawable>* const ink : {&mLive, &mTail})
        if (!*ink) *ink = RefPtr<MKStrokeDrawable>::Adopt(new MKStrokeDrawable(canvas.GetMsgQueue()));
    MKPaint const paint = MakePaint(GetInk());
    mTail->Clear();
    if (mTool == Tool::Highlighter) {
        InkPoints points = mPath->GetSettled();
        InkPoints const tail = mPath->GetTail(ahead);
        points.insert(points.end(), tail.begin() + 1, tail.end());
        AppendInk(*mTail, points, 0);
    } else {
        if (mLiveCount == 0) mLive->Clear();
        AppendInk(*mLive, mPath->GetSettled(), mLiveCount);
        mLiveCount = mPath->GetSettled().size();
        AppendInk(*mTail, mPath->GetTail(ahead), 0);
        canvas.Draw(mLive.Get(), &paint);
    }
    canvas.Draw(mTail.Get(), &paint);
}

void Tools::Draw(IMKCanvas& canvas, double zoom, float ahead) {
    if (mPath) DrawLive(canvas, ahead);
    MKPaint line = MakePaint(kMark);
    line.SetLineWidth(std::max(1.0f, 1.5f / static_cast<float>(zoom)));
    for (std::size_t i = 1; i < mLasso.size(); ++i) canvas.DrawLine(mLasso[i - 1], mLasso[i], &line);
    if (!mSelected.empty()) DrawSelection(canvas, zoom);
    bool const isEraser = mTool == Tool::StrokeEraser || mTool == Tool::PartEraser;
    if (!isEraser || !mIsDown) return;
    line.SetStyle(MKPaint::Stroke);
    canvas.DrawCircle(mLast.x, mLast.y, kEraserRadius / static_cast<float>(zoom), &line);
}

void Tools::DrawSelection(IMKCanvas& canvas, double zoom) const {
    Placement const placement = GetPlacement();
    if (IsDragging())
        for (ObjectPtr const& object : mSelected) mPainter.Draw(canvas, *object->Move(placement));
    RectF const r = placement.Apply(GetSelectedBounds());
    auto const unit = 1 / static_cast<float>(zoom);
    MKPaint line = MakePaint(kMark);
    line.SetLineWidth(std::max(1.0f, 1.5f * unit));
    line.SetDashedLinePattern(Vector2<float>{6 * unit, 4 * unit});
    canvas.DrawLine(r.left, r.top, r.right, r.top, &line);
    canvas.DrawLine(r.right, r.top, r.right, r.bottom, &line);
    canvas.DrawLine(r.right, r.bottom, r.left, r.bottom, &line);
    canvas.DrawLine(r.left, r.bottom, r.left, r.top, &line);
    MKPaint const knob = MakePaint(kMark);
    canvas.DrawCircle(r.right, r.bottom, kHandle * unit, &knob);
}

} // namespace Moka::Notebook
