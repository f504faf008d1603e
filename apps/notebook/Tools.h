// Tools: what the pen does to the page: writing, erasing, selecting, moving and scaling.
// Thread: the window's.
// Units:  page pixels; `zoom` is how many of the window's pixels one has, for what is aimed at by hand.
#pragma once

#include "apps/notebook/Painter.h"
#include "apps/notebook/PenPath.h"

#include <cstdint>
#include <optional>

namespace Moka::Notebook {

enum class Tool { Pen, Highlighter, StrokeEraser, PartEraser, Select };

class Tools {
public:
    static constexpr float kEraserRadius = 10; // of the window's pixels

    Tools(Page& page, Painter& painter) : mPage(page), mPainter(painter) {}

    void Choose(Tool tool);
    Tool GetTool() const { return mTool; }
    // Of the tool that is chosen: the highlighter has a colour of its own.
    void SetColor(unsigned rgb) { (mTool == Tool::Highlighter ? mHighlight : mColor) = rgb; }
    unsigned GetColor() const { return mTool == Tool::Highlighter ? mHighlight : mColor; }
    void SetWidth(float width) { mWidth = width; }
    float GetWidth() const { return mWidth; }

    // Pressure as PenPath takes it.
    void Down(PointF at, std::uint32_t time, float pressure, double zoom);
    void Move(PointF at, std::uint32_t time, float pressure, double zoom);
    void Up();
    void Cancel(); // as if the pen had not come down
    bool IsDown() const { return mIsDown; }

    void Select(Objects objects) { mSelected = std::move(objects); }
    bool HasSelection() const { return !mSelected.empty(); }
    RectF GetSelectedBounds() const;
    void DeleteSelected();
    // The selection while it is dragged, which the tiles do not show; where it was when the drag began.
    bool IsDragging() const { return mDrag != Drag::None; }

    // What is not on the tiles: the live stroke, on to `ahead` milliseconds from now, the lasso, the selection.
    void Draw(IMKCanvas& canvas, double zoom, float ahead);

private:
    enum class Drag { None, Move, Scale };

    void Erase(PointF to, double zoom);
    void EraseFrom(std::size_t index, Swipe const& swipe);
    bool BeginDrag(PointF at, double zoom);
    void SelectInside();
    void EndDrag();
    Placement GetPlacement() const;
    unsigned GetInk() const;
    void DrawLive(IMKCanvas& canvas, float ahead);
    void DrawSelection(IMKCanvas& canvas, double zoom) const;

    Page& mPage;
    Painter& mPainter;
    Tool mTool = Tool::Pen;
    unsigned mColor = 0x1B2A41; // red, green, blue
    unsigned mHighlight = 0xF5D020;
    float mWidth = 3;

    bool mIsDown = false;
    PointF mFirst;
    PointF mLast;
    std::optional<PenPath> mPath;
    RefPtr<MKStrokeDrawable> mLive; // what is settled of it
    RefPtr<MKStrokeDrawable> mTail; // and the rest, anew in each frame
    std::size_t mLiveCount = 0;     // points
    std::vector<PointF> mLasso;
    Objects mSelected;
    Drag mDrag = Drag::None;
};

} // namespace Moka::Notebook
