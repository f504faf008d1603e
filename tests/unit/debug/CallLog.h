// CallLog.h: bitmaps and canvases that do nothing and note every call as a line of text: the operation, the
// numbers it got, and the addresses of what it got by pointer or by reference. Each call returns something
// that no other one does.
// Thread: any, but for onUnref.
#pragma once

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"

#include <functional>
#include <mutex>
#include <sstream>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

namespace Moka::Testing {

// An address, for passing on only.
template <class T>
T* Address() {
    static char storage;
    return reinterpret_cast<T*>(&storage);
}

class CallLog {
public:
    using Lines = std::vector<std::string>;

    std::function<void()> onUnref;

    Lines TakeLines() {
        std::lock_guard<std::mutex> const lock(mMutex);
        return std::exchange(mLines, {});
    }

protected:
    template <class... Arguments>
    void Note(char const* operation, Arguments const&... arguments) {
        std::ostringstream text;
        text << operation;
        ((text << ' ', Write(text, arguments)), ...);
        std::lock_guard<std::mutex> const lock(mMutex);
        mLines.push_back(text.str());
    }

private:
    template <class T>
    static void Write(std::ostream& text, T const& argument) {
        if constexpr (std::is_pointer_v<T>)
            text << reinterpret_cast<void const*>(argument);
        else if constexpr (std::is_class_v<T>)
            text << &argument;
        else
            text << argument;
    }

    std::mutex mMutex;
    Lines mLines;
};

template <class Interface>
class Counted : public Interface, public CallLog {
public:
    void SetTag(char const* tag) override { Note("SetTag", tag); }
    char const* GetTag() override { return Note("GetTag"), "its own"; }
    IGLMsgQueue* GetMsgQueue() override { return Note("GetMsgQueue"), Address<IGLMsgQueue>(); }
    int Ref() override { return Note("Ref"), 31; }
    int Unref() override {
        Note("Unref");
        if (onUnref) onUnref();
        return 32;
    }
};

class BitmapLog final : public Counted<IMKBitmap> {
public:
    unsigned int GetPixel(Point const& p) override { return Note("GetPixel", p), 33u; }
    void GetPixelAsync(Point const& p, void* data, PixelCallback f) override {
        Note("GetPixelAsync", p, data, f);
    }
    void GetBitmapData(Rect const& r, void* out) override { Note("GetBitmapData", r, out); }
    void GetBitmapDataAsync(Rect const& r, void* out, void* data, DataCallback f) override {
        Note("GetBitmapDataAsync", r, out, data, f);
    }
    int GetX() const override { return NoteConst("GetX"), 34; }
    int GetY() const override { return NoteConst("GetY"), 35; }
    int GetWidth() const override { return NoteConst("GetWidth"), 36; }
    int GetHeight() const override { return NoteConst("GetHeight"), 37; }
    Rect GetBitmapRect() override { return Note("GetBitmapRect"), Rect(1, 2, 3, 4); }
    IMKBitmap* Clone() override { return Note("Clone"), Address<IMKBitmap>(); }
    IMKBitmapReadable* GetBitmapReadable() override { return Note("Readable"), Address<IMKBitmapReadable>(); }
    IMKBitmapWritable* GetBitmapWritable() override { return Note("Writable"), Address<IMKBitmapWritable>(); }
    IMKBitmapCanvasAttachable* GetBitmapCanvasAttachable() override {
        return Note("Attachable"), Address<IMKBitmapCanvasAttachable>();
    }
    IMKTextureBitmap* GetTextureBitmap() override { return Note("Texture"), Address<IMKTextureBitmap>(); }

private:
    void NoteConst(char const* operation) const { const_cast<BitmapLog*>(this)->Note(operation); }
};

template <class Interface>
class AnyCanvasLog : public Counted<Interface> {
public:
    using CallLog::Note;
    using ClipOp = IMKCanvasBase::ClipOp;

    void Clear(int argb) override { Note("Clear", argb); }
    void Clear(float r, float g, float b, float a) override { Note("Clear", r, g, b, a); }
    void ClearAll(int argb) override { Note("ClearAll", argb); }
    void ClearAll(float r, float g, float b, float a) override { Note("ClearAll", r, g, b, a); }
    int Save(IMKCanvasBase::SaveFlag flag) override { return Note("Save", flag), 41; }
    void Restore(int level) override { Note("Restore", level); }
    void SetClipRect(int x, int y, int w, int h, ClipOp op) override { Note("SetClipRect", x, y, w, h, op); }
    void SetMatrix(Matrix3<float> const& m) override { Note("SetMatrix", m); }
    Matrix3<float> GetMatrix() override { return Note("GetMatrix"), Matrix3<float>(2); }
    void PreConcat(Matrix3<float> const& m) override { Note("PreConcat", m); }
    void PostConcat(Matrix3<float> const& m) override { Note("PostConcat", m); }
    void PreScale(float x, float y) override { Note("PreScale", x, y); }
    void PostScale(float x, float y) override { Note("PostScale", x, y); }
    void PreRotate(float degrees) override { Note("PreRotate", degrees); }
    void PreRotate(float degrees, float x, float y) override { Note("PreRotate", degrees, x, y); }
    void PostRotate(float degrees) override { Note("PostRotate", degrees); }
    void PostRotate(float degrees, float x, float y) override { Note("PostRotate", degrees, x, y); }
    void PreTranslate(float x, float y) override { Note("PreTranslate", x, y); }
    void PostTranslate(float x, float y) override { Note("PostTranslate", x, y); }
    IMKBitmap* GetBitmap() override { return Note("GetBitmap"), Address<IMKBitmap>(); }
};

class PlainCanvasLog final : public AnyCanvasLog<IMKCanvas> {
public:
    using Paint = MKPaint const*;
    using Points = std::vector<PointF>;
    using Rects = std::vector<RectF>;

    void Draw(IMKCustomDrawable* d, Paint p) override { Note("Draw", d, p); }
    void DrawLine(float x1, float y1, float x2, float y2, Paint p) override {
        Note("Line", x1, y1, x2, y2, p);
    }
    void DrawLine(PointF const& a, PointF const& b, Paint p) override { Note("Line", a, b, p); }
    void DrawSimpleLine(float x1, float y1, float x2, float y2, Paint p) override {
        Note("Simple", x1, y1, x2, y2, p);
    }
    void DrawSimpleLine(PointF const& a, PointF const& b, Paint p) override { Note("Simple", a, b, p); }
    void DrawSimpleLines(Points const& points, Paint p) override { Note("Simples", points, p); }
    void DrawRect(float l, float t, float r, float b, Paint p) override { Note("Rect", l, t, r, b, p); }
    void DrawRect(RectF const& rect, Paint p) override { Note("Rect", rect, p); }
    void DrawRoundRect(float l, float t, float r, float b, float rx, float ry, Paint p) override {
        Note("Round", l, t, r, b, rx, ry, p);
    }
    void DrawRoundRect(RectF const& rect, float rx, float ry, Paint p) override {
        Note("Round", rect, rx, ry, p);
    }
    void DrawCircle(float x, float y, float radius, Paint p) override { Note("Circle", x, y, radius, p); }
    void DrawBitmap(IMKBitmap* b, float x, float y, Paint p) override { Note("Bitmap", b, x, y, p); }
    void DrawBitmap(IMKBitmap* b, RectF const& dst, Paint p) override { Note("Bitmap", b, dst, p); }
    void DrawBitmap(IMKBitmap* b, RectF const& src, RectF const& dst, Paint p) override {
        Note("Bitmap", b, src, dst, p);
    }
    void DrawBitmaps(IMKBitmap* b, Points& points, Paint p) override { Note("Bitmaps", b, points, p); }
    void DrawBitmaps(IMKBitmap* b, Rects const& dsts, Paint p) override { Note("Bitmaps", b, dsts, p); }
    void DrawBitmaps(IMKBitmap* b, RectF const& src, Rects const& dsts, Paint p) override {
        Note("Bitmaps", b, src, dsts, p);
    }
};

class PenCanvasLog final : public AnyCanvasLog<IMKPenCanvas> {
public:
    Matrix3<float> GetModelMatrix() override { return Note("GetModelMatrix"), Matrix3<float>(3); }
    Matrix4<float> GetCanvasMatrix() override { return Note("GetCanvasMatrix"), Matrix4<float>(4); }
    void EnableClipRT(int frameBuffer) override { Note("EnableClipRT", frameBuffer); }
    void DisableClipRT() override { Note("DisableClipRT"); }
};

} // namespace Moka::Testing
