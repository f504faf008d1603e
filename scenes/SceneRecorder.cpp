#include "scenes/SceneRecorder.h"

#include "moka/base/Log.h"
#include "moka/base/String.h"
#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/MKCanvas.h"
#include "moka/graphics/paint/UnpackColor.h"
#include "scenes/RecordedDrawables.h"
#include "scenes/SceneFile.h"
#include "scenes/ScenePaint.h"
#include "scenes/SceneSteps.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <utility>

namespace Moka::Scenes {
namespace {

namespace fs = std::filesystem;

// Limits bytes and values: each value takes at least two characters.
constexpr std::size_t kMostText = 7u << 20;
// Leaves room for operations that are added after the last one.
constexpr long long kMostOperations = kMaxOperations - 8;

// Writes a file. On failure returns false and sets *reason.
bool WriteText(std::string const& path, std::string const& text, std::string* reason) {
    std::FILE* const file = std::fopen(path.c_str(), "wb");
    bool isWritten = file && std::fwrite(text.data(), 1, text.size(), file) == text.size();
    if (file && std::fflush(file) != 0) isWritten = false;
    if (!isWritten) *reason = std::strerror(errno);
    if (file) std::fclose(file);
    return isWritten;
}

} // namespace

RefPtr<SceneRecorder> SceneRecorder::Start(std::string const& path, IMKCanvas& canvas) {
    IMKBitmap* const target = canvas.GetBitmap();
    auto recorder = RefPtr<SceneRecorder>::Adopt(new SceneRecorder(path, RefPtr<IMKCanvas>::Share(&canvas),
                                                                   target ? target->GetWidth() : 1,
                                                                   target ? target->GetHeight() : 1));
    recorder->RecordBeginning();
    return recorder;
}

RefPtr<SceneRecorder> SceneRecorder::Start(std::string const& path, int width, int height) {
    // A canvas without a target keeps its matrix and saves, and draws nothing.
    auto nowhere = RefPtr<IMKCanvas>::Adopt(new MKCanvas(nullptr, nullptr));
    return RefPtr<SceneRecorder>::Adopt(new SceneRecorder(path, std::move(nowhere), width, height));
}

SceneRecorder::SceneRecorder(std::string const& path, RefPtr<IMKCanvas> canvas, int width, int height)
    : mPath(path), mCanvas(std::move(canvas)), mWidth(width), mHeight(height) {
    fs::path const file(path);
    mBitmaps =
        std::make_unique<RecordedBitmaps>(file.parent_path().string(), file.stem().string() + ".bitmaps");
    // Writes an empty scene first, so that an unwritable path is reported now and not after drawing.
    std::string reason;
    if (!WriteText(path, GetText(), &reason)) Fail(reason);
}

SceneRecorder::~SceneRecorder() { Close(); }

void SceneRecorder::RecordBeginning() {
    static Matrix3f const kIdentity;
    IMKBitmap* const target = GetBitmap();
    if (!IsRecording() || !target) return;
    MKPaint paint;
    paint.SetXFermode(MKPaint::Src);
    // A screen cannot be sampled.
    if (target->GetBitmapReadable())
        RecordBitmap(SceneLine("DrawBitmap").Add("x", 0.0f).Add("y", 0.0f), target, &paint);
    else
        LeaveOut("what the screen shows at the beginning");
    Matrix3f const matrix = GetMatrix();
    for (int i = 0; i < 9; ++i) {
        if (matrix[i] != kIdentity[i]) return Record(SceneLine("SetMatrix").Add("matrix", matrix));
    }
}

bool SceneRecorder::Close(std::string* error) {
    if (mIsOpen) {
        mIsOpen = false;
        std::string reason;
        if (!WriteText(mPath, GetText(), &reason) && mFailure.empty()) Fail(reason);
    }
    if (!mFailure.empty() && error) *error = "cannot record the scene " + mPath + ": " + mFailure;
    return mFailure.empty();
}

void SceneRecorder::Fail(std::string const& reason) {
    ++mLeftOut;
    Append(SceneLine("LeftOut").AddText("what", "all that follows: " + reason).GetText());
    mFailure = reason;
    std::string const name = Log::ConvertSecureLog(String::FromFileName(mPath));
    __android_log_print(ANDROID_LOG_ERROR, "mok_log",
                        "cannot record the scene %s: %s; drawing continues without it", name.c_str(),
                        reason.c_str());
}

void SceneRecorder::LeaveOut(std::string const& what) {
    if (!IsRecording()) return;
    ++mLeftOut;
    Record(SceneLine("LeftOut").AddText("what", what));
}

void SceneRecorder::Append(std::string const& text) {
    mOperations += (mOperations.empty() ? "\n    " : ",\n    ") + text;
}

void SceneRecorder::Record(SceneLine const& line) {
    if (!IsRecording()) return;
    if (!line.IsFinite()) return LeaveOut(line.GetOperation() + " with a number that is not finite");
    std::string const text = line.GetText();
    mCount += line.GetCount();
    if (mCount > kMostOperations || mOperations.size() + mPaintText.size() + text.size() > kMostText)
        return Fail("a scene has no room for more operations");
    Append(text);
}

void SceneRecorder::Record(SceneLine line, MKPaint const* paint) {
    if (!IsRecording()) return;
    if (paint) {
        bool isFinite = true;
        std::string const name = NamePaint(*paint, &isFinite);
        if (!isFinite) return LeaveOut(line.GetOperation() + " with a number that is not finite");
        line.AddText("paint", name);
    }
    Record(line);
}

std::string SceneRecorder::NamePaint(MKPaint const& paint, bool* isFinite) {
    SceneLine const described = DescribePaint(paint);
    *isFinite = described.IsFinite();
    if (!*isFinite) return {};
    auto const [entry, isNew] = mPaints.try_emplace(described.GetFields());
    if (isNew) {
        entry->second = 'p' + std::to_string(mPaints.size());
        mPaintText +=
            (mPaintText.empty() ? "\n    " : ",\n    ") + Quote(entry->second) + ": " + entry->first;
    }
    return entry->second;
}

void SceneRecorder::RecordBitmap(SceneLine line, IMKBitmap* bitmap, MKPaint const* paint) {
    if (!IsRecording()) return;
    RecordedBitmaps::Result const recorded = mBitmaps->Record(bitmap);
    if (!recorded.reason.empty()) return Fail(recorded.reason);
    if (!recorded.name.empty()) Record(line.AddText("bitmap", recorded.name), paint);
}

std::string SceneRecorder::GetText() const {
    std::string about = "A recording.";
    if (mLeftOut > 0)
        about = "A recording. Left out: " + std::to_string(mLeftOut) + "; see the operations named LeftOut.";
    return "{\n  \"about\": " + Quote(about) + ",\n  \"size\": [" + std::to_string(mWidth) + ", " +
           std::to_string(mHeight) + "],\n  \"bitmaps\": " + mBitmaps->GetText() + ",\n  \"paints\": {" +
           mPaintText + "},\n  \"operations\": [" + mOperations + "]\n}\n";
}

void SceneRecorder::Clear(int argb) {
    Vector4<float> const c = detail::UnpackColor(argb);
    Clear(c.x, c.y, c.z, c.w);
}

void SceneRecorder::Clear(float r, float g, float b, float a) {
    Record(SceneLine("Clear").Add("color", Vector4<float>(r, g, b, a)));
    mCanvas->Clear(r, g, b, a);
}

void SceneRecorder::ClearAll(int argb) {
    Vector4<float> const c = detail::UnpackColor(argb);
    ClearAll(c.x, c.y, c.z, c.w);
}

void SceneRecorder::ClearAll(float r, float g, float b, float a) {
    Record(SceneLine("ClearAll").Add("color", Vector4<float>(r, g, b, a)));
    mCanvas->ClearAll(r, g, b, a);
}

int SceneRecorder::Save(SaveFlag flag) {
    Record(SceneLine("Save").Add("flag", static_cast<int>(flag)));
    return mCanvas->Save(flag);
}

void SceneRecorder::Restore(int level) {
    Record(SceneLine("Restore").Add("level", level));
    mCanvas->Restore(level);
}

void SceneRecorder::SetClipRect(int x, int y, int width, int height, ClipOp op) {
    SceneLine line("SetClipRect");
    line.Add("x", x).Add("y", y).Add("width", width).Add("height", height);
    Record(line.Add("op", static_cast<int>(op)));
    mCanvas->SetClipRect(x, y, width, height, op);
}

void SceneRecorder::SetMatrix(Matrix3f const& matrix) {
    Record(SceneLine("SetMatrix").Add("matrix", matrix));
    mCanvas->SetMatrix(matrix);
}

void SceneRecorder::PreConcat(Matrix3f const& matrix) {
    Record(SceneLine("PreConcat").Add("matrix", matrix));
    mCanvas->PreConcat(matrix);
}

void SceneRecorder::PostConcat(Matrix3f const& matrix) {
    Record(SceneLine("PostConcat").Add("matrix", matrix));
    mCanvas->PostConcat(matrix);
}

void SceneRecorder::PreScale(float sx, float sy) {
    Record(SceneLine("PreScale").Add("sx", sx).Add("sy", sy));
    mCanvas->PreScale(sx, sy);
}

void SceneRecorder::PostScale(float sx, float sy) {
    Record(SceneLine("PostScale").Add("sx", sx).Add("sy", sy));
    mCanvas->PostScale(sx, sy);
}

void SceneRecorder::PreRotate(float degrees) {
    Record(SceneLine("PreRotate").Add("degrees", degrees));
    mCanvas->PreRotate(degrees);
}

void SceneRecorder::PreRotate(float degrees, float px, float py) {
    Record(SceneLine("PreRotate").Add("degrees", degrees).Add("px", px).Add("py", py));
    mCanvas->PreRotate(degrees, px, py);
}

void SceneRecorder::PostRotate(float degrees) {
    Record(SceneLine("PostRotate").Add("degrees", degrees));
    mCanvas->PostRotate(degrees);
}

void SceneRecorder::PostRotate(float degrees, float px, float py) {
    Record(SceneLine("PostRotate").Add("degrees", degrees).Add("px", px).Add("py", py));
    mCanvas->PostRotate(degrees, px, py);
}

void SceneRecorder::PreTranslate(float tx, float ty) {
    Record(SceneLine("PreTranslate").Add("tx", tx).Add("ty", ty));
    mCanvas->PreTranslate(tx, ty);
}

void SceneRecorder::PostTranslate(float tx, float ty) {
    Record(SceneLine("PostTranslate").Add("tx", tx).Add("ty", ty));
    mCanvas->PostTranslate(tx, ty);
}

void SceneRecorder::Draw(IMKCustomDrawable* drawable, MKPaint const* paint) {
    if (drawable && IsRecording()) {
        DrawableLine describing(*mBitmaps);
        std::optional<SceneLine> const line = describing.Describe(*drawable);
        if (!line)
            LeaveOut("a custom drawable of the caller's own");
        else if (!describing.GetReason().empty())
            Fail(describing.GetReason());
        else if (!describing.DrawsNothing())
            Record(*line, paint);
    }
    mCanvas->Draw(drawable, paint);
}

void SceneRecorder::DrawLine(float x1, float y1, float x2, float y2, MKPaint const* paint) {
    DrawLine(PointF(x1, y1), PointF(x2, y2), paint);
}

void SceneRecorder::DrawLine(PointF const& from, PointF const& to, MKPaint const* paint) {
    Record(SceneLine("DrawLine").Add("from", from).Add("to", to), paint);
    mCanvas->DrawLine(from, to, paint);
}

void SceneRecorder::DrawSimpleLine(float x1, float y1, float x2, float y2, MKPaint const* paint) {
    DrawSimpleLine(PointF(x1, y1), PointF(x2, y2), paint);
}

void SceneRecorder::DrawSimpleLine(PointF const& from, PointF const& to, MKPaint const* paint) {
    Record(SceneLine("DrawSimpleLine").Add("from", from).Add("to", to), paint);
    mCanvas->DrawSimpleLine(from, to, paint);
}

// Drops an odd last point.
void SceneRecorder::DrawSimpleLines(std::vector<PointF> const& points, MKPaint const* paint) {
    std::vector<PointF> const pairs(points.begin(), points.end() - static_cast<int>(points.size() % 2));
    Record(SceneLine("DrawSimpleLines").Add("points", pairs), paint);
    mCanvas->DrawSimpleLines(points, paint);
}

void SceneRecorder::DrawRect(float left, float top, float right, float bottom, MKPaint const* paint) {
    DrawRect(RectF(left, top, right, bottom), paint);
}

void SceneRecorder::DrawRect(RectF const& rect, MKPaint const* paint) {
    Record(SceneLine("DrawRect").Add("rect", rect), paint);
    mCanvas->DrawRect(rect, paint);
}

void SceneRecorder::DrawRoundRect(float left, float top, float right, float bottom, float rx, float ry,
                                  MKPaint const* paint) {
    DrawRoundRect(RectF(left, top, right, bottom), rx, ry, paint);
}

void SceneRecorder::DrawRoundRect(RectF const& rect, float rx, float ry, MKPaint const* paint) {
    Record(SceneLine("DrawRoundRect").Add("rect", rect).Add("rx", rx).Add("ry", ry), paint);
    mCanvas->DrawRoundRect(rect, rx, ry, paint);
}

void SceneRecorder::DrawCircle(float cx, float cy, float radius, MKPaint const* paint) {
    Record(SceneLine("DrawCircle").Add("cx", cx).Add("cy", cy).Add("radius", radius), paint);
    mCanvas->DrawCircle(cx, cy, radius, paint);
}

void SceneRecorder::DrawBitmap(IMKBitmap* bitmap, float x, float y, MKPaint const* paint) {
    RecordBitmap(SceneLine("DrawBitmap").Add("x", x).Add("y", y), bitmap, paint);
    mCanvas->DrawBitmap(bitmap, x, y, paint);
}

void SceneRecorder::DrawBitmap(IMKBitmap* bitmap, RectF const& dst, MKPaint const* paint) {
    RecordBitmap(SceneLine("DrawBitmap").Add("dst", dst), bitmap, paint);
    mCanvas->DrawBitmap(bitmap, dst, paint);
}

void SceneRecorder::DrawBitmap(IMKBitmap* bitmap, RectF const& src, RectF const& dst, MKPaint const* paint) {
    RecordBitmap(SceneLine("DrawBitmap").Add("src", src).Add("dst", dst), bitmap, paint);
    mCanvas->DrawBitmap(bitmap, src, dst, paint);
}

void SceneRecorder::DrawBitmaps(IMKBitmap* bitmap, std::vector<PointF>& points, MKPaint const* paint) {
    RecordBitmap(SceneLine("DrawBitmaps").Add("points", std::as_const(points)), bitmap, paint);
    mCanvas->DrawBitmaps(bitmap, points, paint);
}

void SceneRecorder::DrawBitmaps(IMKBitmap* bitmap, std::vector<RectF> const& dsts, MKPaint const* paint) {
    RecordBitmap(SceneLine("DrawBitmaps").Add("dsts", dsts), bitmap, paint);
    mCanvas->DrawBitmaps(bitmap, dsts, paint);
}

void SceneRecorder::DrawBitmaps(IMKBitmap* bitmap, RectF const& src, std::vector<RectF> const& dsts,
                                MKPaint const* paint) {
    RecordBitmap(SceneLine("DrawBitmaps").Add("src", src).Add("dsts", dsts), bitmap, paint);
    mCanvas->DrawBitmaps(bitmap, src, dsts, paint);
}

} // namespace Moka::Scenes
