// CanvasLog: a canvas that draws nothing and notes every call as a line of text: the operation, its
// arguments, and of the paint what differs from a new one.
#pragma once

#include "moka/base/RefCount.h"
#include "moka/base/RefPtr.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/paint/MKPaint.h"
#include "scenes/Scene.h"

#include <sstream>
#include <string>
#include <vector>

namespace Moka::Testing {

class CanvasLog final : public IMKCanvas, public RefCount {
public:
    std::vector<std::string> const& GetLines() const { return mLines; }
    // Lines that begin with this.
    int Count(std::string const& start) const;
    bool Contains(std::string const& part) const;

    void Clear(int argb) override { Note("Clear", argb); }
    void Clear(float r, float g, float b, float a) override { Note("Clear", r, g, b, a); }
    void ClearAll(int argb) override { Note("ClearAll", argb); }
    void ClearAll(float r, float g, float b, float a) override { Note("ClearAll", r, g, b, a); }
    int Save(SaveFlag flag) override { return Note("Save", int(flag)), mLevel++; }
    void Restore(int level) override;
    void SetClipRect(int x, int y, int width, int height, ClipOp op) override {
        Note("SetClipRect", x, y, width, height, int(op));
    }
    void SetMatrix(Matrix3f const& m) override { Note("SetMatrix", m); }
    Matrix3f GetMatrix() override { return {}; }
    void PreConcat(Matrix3f const& m) override { Note("PreConcat", m); }
    void PostConcat(Matrix3f const& m) override { Note("PostConcat", m); }
    void PreScale(float sx, float sy) override { Note("PreScale", sx, sy); }
    void PostScale(float sx, float sy) override { Note("PostScale", sx, sy); }
    void PreRotate(float degrees) override { Note("PreRotate", degrees); }
    void PreRotate(float degrees, float px, float py) override { Note("PreRotate", degrees, px, py); }
    void PostRotate(float degrees) override { Note("PostRotate", degrees); }
    void PostRotate(float degrees, float px, float py) override { Note("PostRotate", degrees, px, py); }
    void PreTranslate(float tx, float ty) override { Note("PreTranslate", tx, ty); }
    void PostTranslate(float tx, float ty) override { Note("PostTranslate", tx, ty); }
    void SetTag(char const*) override {}
    char const* GetTag() override { return ""; }
    IGLMsgQueue* GetMsgQueue() override { return nullptr; }
    IMKBitmap* GetBitmap() override { return nullptr; }
    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }

    void Draw(IMKCustomDrawable*, MKPaint const* p) override { Note("Draw", p); }
    void DrawLine(float x1, float y1, float x2, float y2, MKPaint const* p) override {
        Note("DrawLine", x1, y1, x2, y2, p);
    }
    void DrawLine(PointF const& a, PointF const& b, MKPaint const* p) override { Note("DrawLine", a, b, p); }
    void DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* p) override {
        Note("DrawSimpleLine", x1, y1, x2, y2, p);
    }
    void DrawSimpleLine(PointF const& a, PointF const& b, MKPaint const* p) override {
        Note("DrawSimpleLine", a, b, p);
    }
    void DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* p) override {
        Note("DrawSimpleLines", points, p);
    }
    void DrawRect(float l, float t, float r, float b, MKPaint const* p) override {
        Note("DrawRect", l, t, r, b, p);
    }
    void DrawRect(RectF const& rect, MKPaint const* p) override { Note("DrawRect", rect, p); }
    void DrawRoundRect(float l, float t, float r, float b, float rx, float ry, MKPaint const* p) override {
        Note("DrawRoundRect", l, t, r, b, rx, ry, p);
    }
    void DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* p) override {
        Note("DrawRoundRect", rect, rx, ry, p);
    }
    void DrawCircle(float cx, float cy, float radius, MKPaint const* p) override {
        Note("DrawCircle", cx, cy, radius, p);
    }
    void DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* p) override {
        Note("DrawBitmap", bitmap, x, y, p);
    }
    void DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* p) override {
        Note("DrawBitmap", bitmap, dst, p);
    }
    void DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst, MKPaint const* p) override {
        Note("DrawBitmap", bitmap, src, dst, p);
    }
    void DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points, MKPaint const* p) override {
        Note("DrawBitmaps", bitmap, points, p);
    }
    void DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts, MKPaint const* p) override {
        Note("DrawBitmaps", bitmap, dsts, p);
    }
    void DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                     MKPaint const* p) override {
        Note("DrawBitmaps", bitmap, src, dsts, p);
    }

private:
    template <class... Arguments>
    void Note(char const* operation, Arguments const&... arguments) {
        mText.str(operation);
        mText.seekp(0, std::ios::end);
        (Write(arguments), ...);
        mLines.push_back(mText.str());
    }

    void Write(int value) { mText << ' ' << value; }
    void Write(float value) { mText << ' ' << value; }
    void Write(PointF const& p) { mText << " (" << p.x << ' ' << p.y << ')'; }
    void Write(RectF const& r) {
        mText << " [" << r.left << ' ' << r.top << ' ' << r.right << ' ' << r.bottom << ']';
    }
    void Write(Matrix3f const& m);
    void Write(IMKBitmap* bitmap);
    void Write(MKPaint const* paint);
    // How many, the first and the last.
    template <class Place>
    void Write(std::vector<Place> const& places) {
        mText << ' ' << places.size() << ':';
        if (places.empty()) return;
        Write(places.front());
        Write(places.back());
    }

    std::vector<std::string> mLines;
    std::ostringstream mText;
    int mLevel = 0;
};

// A stage with no room for bitmaps, and no GPU.
class EmptyStage final : public Scenes::SceneStage {
public:
    IMKBitmap* MakeBitmap(Scenes::Picture const&) override { return nullptr; }
    IGLMsgQueue* GetQueue() override { return nullptr; }
};

// Draws the scene on one, with bitmaps of the library's own.
RefPtr<CanvasLog> PlayScene(Scenes::Scene const& scene);

} // namespace Moka::Testing
