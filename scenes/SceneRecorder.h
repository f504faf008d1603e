// SceneRecorder: a canvas that records its calls as a scene, and forwards them to another canvas, or to none.
// `moka draw` draws the same pixels from the scene:
//     auto recorder = SceneRecorder::Start("fault.json", *canvas);
//     DrawPage(*recorder);   // instead of *canvas
//     recorder->Close();     // fault.json, and its bitmaps in fault.bitmaps
// Owner:  reference counted; holds a reference on the canvas. The destructor calls Close().
// Thread: a thread that may use the canvas and read the drawn bitmaps back: for caller-side bitmaps any
//         thread except the render thread.
// Not recorded, but marked in the scene by an operation "LeftOut": custom drawables of the application,
// numbers that are
//         not finite, and calls of LeaveOut(), for instance for external GL or other canvases on the same
//         target.
// Fails:  if the scene cannot be written (no such folder, a full disk, beyond the limits of a scene), logs an
//         error. The recording ends, the calls are still forwarded, and Close() returns false.
// Cost:   the text stays in memory until Close(); each draw of a bitmap reads it back.
#pragma once

#include "moka/base/RefCount.h"
#include "moka/base/RefPtr.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "scenes/RecordedBitmaps.h"
#include "scenes/SceneLine.h"

#include <map>
#include <memory>
#include <string>
#include <vector>

namespace Moka::Scenes {

class SceneRecorder final : public IMKCanvas, public RefCount {
public:
    // Starts a recording. The scene begins with the contents of the canvas's bitmap and with its matrix.
    // Start it before the canvas has clips and saves, which cannot be queried. canvas must not be a checker,
    // whose GetMatrix fails.
    static RefPtr<SceneRecorder> Start(std::string const& path, IMKCanvas& canvas);
    // Starts a recording without a canvas. The scene begins transparent.
    static RefPtr<SceneRecorder> Start(std::string const& path, int width, int height);
    ~SceneRecorder() override;

    // Writes the scene. Later calls are only forwarded. Returns false and sets *error if the recording
    // failed; operations that were left out are no failure.
    bool Close(std::string* error = nullptr);
    // Adds an operation "LeftOut" to the scene: something was drawn here that is not recorded.
    void LeaveOut(std::string const& what);

    void Clear(int argb) override;
    void Clear(float r, float g, float b, float a) override;
    void ClearAll(int argb) override;
    void ClearAll(float r, float g, float b, float a) override;
    int Save(SaveFlag flag) override;
    void Restore(int level) override;
    void SetClipRect(int x, int y, int width, int height, ClipOp op) override;
    void SetMatrix(Matrix3f const& matrix) override;
    Matrix3f GetMatrix() override { return mCanvas->GetMatrix(); }
    void PreConcat(Matrix3f const& matrix) override;
    void PostConcat(Matrix3f const& matrix) override;
    void PreScale(float sx, float sy) override;
    void PostScale(float sx, float sy) override;
    void PreRotate(float degrees) override;
    void PreRotate(float degrees, float px, float py) override;
    void PostRotate(float degrees) override;
    void PostRotate(float degrees, float px, float py) override;
    void PreTranslate(float tx, float ty) override;
    void PostTranslate(float tx, float ty) override;
    void SetTag(char const* tag) override { mCanvas->SetTag(tag); }
    char const* GetTag() override { return mCanvas->GetTag(); }
    IGLMsgQueue* GetMsgQueue() override { return mCanvas->GetMsgQueue(); }
    IMKBitmap* GetBitmap() override { return mCanvas->GetBitmap(); }
    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }

    void Draw(IMKCustomDrawable* drawable, MKPaint const* paint) override;
    void DrawLine(float x1, float y1, float x2, float y2, MKPaint const* paint) override;
    void DrawLine(PointF const& from, PointF const& to, MKPaint const* paint) override;
    void DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* paint) override;
    void DrawSimpleLine(PointF const& from, PointF const& to, MKPaint const* paint) override;
    void DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* paint) override;
    void DrawRect(float left, float top, float right, float bottom, MKPaint const* paint) override;
    void DrawRect(RectF const& rect, MKPaint const* paint) override;
    void DrawRoundRect(float left, float top, float right, float bottom, float rx, float ry,
                       MKPaint const* paint) override;
    void DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* paint) override;
    void DrawCircle(float cx, float cy, float radius, MKPaint const* paint) override;
    void DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) override;
    void DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) override;
    void DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst, MKPaint const* paint) override;
    void DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points, MKPaint const* paint) override;
    void DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts, MKPaint const* paint) override;
    void DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                     MKPaint const* paint) override;

private:
    SceneRecorder(std::string const& path, RefPtr<IMKCanvas> canvas, int width, int height);

    bool IsRecording() const { return mIsOpen && mFailure.empty(); }
    // Records nothing for a bitmap that canvases do not draw.
    void RecordBitmap(SceneLine line, IMKBitmap* bitmap, MKPaint const* paint);
    void Record(SceneLine line, MKPaint const* paint);
    void Record(SceneLine const& line);
    void RecordBeginning();
    void Append(std::string const& text);
    void Fail(std::string const& reason);
    std::string NamePaint(MKPaint const& paint, bool* isFinite);
    std::string GetText() const;

    std::string const mPath;
    RefPtr<IMKCanvas> const mCanvas;
    int const mWidth;
    int const mHeight;
    std::unique_ptr<RecordedBitmaps> mBitmaps;
    std::map<std::string, std::string> mPaints; // from the fields of a paint to its name
    std::string mPaintText;
    std::string mOperations;
    long long mCount = 0;
    int mLeftOut = 0;
    bool mIsOpen = true;
    std::string mFailure; // why the recording ended early
};

} // namespace Moka::Scenes
