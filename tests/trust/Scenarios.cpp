#include "tests/trust/Scenarios.h"

#include "moka/base/Bitmap.h"
#include "moka/base/BitmapFactory.h"
#include "moka/base/RefPtr.h"
#include "moka/base/String.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/canvas/IMKPenCanvas.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/graphics/factory/MKGraphicsFactory.h"
#include "moka/graphics/paint/MKPaint.h"
#include "tests/support/TestImages.h"

#include <memory>
#include <new>

namespace Moka::Testing {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;
using CanvasPtr = RefPtr<IMKCanvas>;

constexpr int kWidth = 24;
constexpr int kHeight = 100; // several strips, where a texture has 64 rows

TestImage const& GetImage() {
    static TestImage const image = MakeAlphaPattern(kWidth, kHeight);
    return image;
}

BitmapPtr MakeBitmap(Stage const& stage, int height = kHeight) {
    return BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, kWidth, height,
                                                            GetImage().pixels.data(), false, 1, false));
}

CanvasPtr MakeCanvas(Stage const& stage, BitmapPtr const& target) {
    return CanvasPtr::Adopt(MKGraphicsFactory::CreateCanvas(&stage.queue, target.Get(), 1));
}

MKPaint Pen(float width, MKPaint::Style style = MKPaint::Stroke) {
    MKPaint paint;
    paint.SetColor(0.5f, 0.25f, 0.75f, 0.5f);
    paint.SetStyle(style);
    paint.SetLineWidth(width);
    return paint;
}

// A canvas on a bitmap of several strips, for as long as the action draws.
template <class Action>
void OnCanvas(Stage const& stage, Action const& action) {
    BitmapPtr const target = MakeBitmap(stage);
    if (!target) return;
    CanvasPtr const canvas = MakeCanvas(stage, target);
    if (canvas) action(*canvas);
    stage.settle();
}

void CreateAndRead(Stage const& stage) {
    BitmapPtr const bitmap = MakeBitmap(stage);
    if (!bitmap) return;
    bitmap->SetTag("picture");
    bitmap->GetTextureBitmap()->UpdateBitmap(GetImage().pixels.data(), kWidth * 4);
    TestImage copy(kWidth, kHeight);
    bitmap->GetBitmapData(bitmap->GetBitmapRect(), copy.pixels.data());
    bitmap->GetPixel(Point(3, 3));
}

void CreateOfOwnedPixels(Stage const& stage) {
    std::unique_ptr<unsigned char[]> pixels(new (std::nothrow) unsigned char[GetImage().pixels.size()]());
    if (!pixels) return;
    auto const bitmap = BitmapPtr::Adopt(
        MKGraphicsFactory::CreateBitmap(&stage.queue, kWidth, kHeight, pixels.get(), true, 1, false));
    if (bitmap) static_cast<void>(pixels.release());
    stage.settle();
}

void CloneAndShare(Stage const& stage) {
    BitmapPtr bitmap = MakeBitmap(stage);
    if (!bitmap) return;
    auto const clone = BitmapPtr::Adopt(bitmap->Clone());
    auto const shared = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, bitmap.Get(), 1));
    if (IMKSubBitmap* const strip = bitmap->GetTextureBitmap()->GetSubBitmap(0))
        RefPtr<IMKSubBitmap>::Adopt(strip->Clone());
    bitmap = {};
    stage.settle();
    if (clone) clone->GetPixel(Point(1, 1));
}

void DrawLines(Stage const& stage) {
    OnCanvas(stage, [](IMKCanvas& canvas) {
        MKPaint paint = Pen(5);
        paint.SetLineCapType(MKPaint::Round);
        canvas.DrawLine(2, 2, 20, 90, &paint);
        canvas.DrawSimpleLine(2, 90, 20, 2, &paint);
        canvas.DrawSimpleLines({{1, 1}, {9, 80}, {9, 80}, {20, 5}}, &paint);
    });
}

void DrawRectangles(Stage const& stage) {
    OnCanvas(stage, [](IMKCanvas& canvas) {
        MKPaint const both = Pen(3, MKPaint::FillAndStroke);
        canvas.DrawRect(2, 2, 20, 90, &both);
        canvas.DrawRoundRect(4, 4, 18, 80, 5, 6, &both);
        canvas.DrawRoundRect(4, 4, 18, 80, 0, 0, nullptr);
    });
}

void DrawCircles(Stage const& stage) {
    OnCanvas(stage, [](IMKCanvas& canvas) {
        MKPaint const stroke = Pen(3);
        canvas.DrawCircle(12, 60, 10, &stroke);
        canvas.DrawCircle(12, 20, 10, nullptr);
    });
}

void DrawBitmaps(Stage const& stage) {
    BitmapPtr const source = MakeBitmap(stage);
    if (!source) return;
    OnCanvas(stage, [&](IMKCanvas& canvas) {
        MKPaint tiled;
        tiled.SetTileMode(MKPaint::Mirror, MKPaint::Repeat);
        canvas.DrawBitmap(source.Get(), 2, 3, nullptr);
        canvas.DrawBitmap(source.Get(), RectF(0, 0, 40, 40), RectF(1, 1, 20, 90), &tiled);
        std::vector<PointF> points{{1, 1}, {4, 40}};
        canvas.DrawBitmaps(source.Get(), points, nullptr);
        canvas.DrawBitmaps(source.Get(), {RectF(0, 0, 8, 8), RectF(8, 8, 16, 16)}, nullptr);
    });
}

void ClipByScissor(Stage const& stage) {
    OnCanvas(stage, [](IMKCanvas& canvas) {
        canvas.SetClipRect(2, 2, 18, 90, IMKCanvas::Intersect);
        canvas.ClearAll(0x40FF0000);
        canvas.Clear(0x4000FF00);
        canvas.DrawRect(0, 0, 24, 100, nullptr);
    });
}

void ClipByStencil(Stage const& stage) {
    OnCanvas(stage, [](IMKCanvas& canvas) {
        canvas.PreRotate(20);
        canvas.SetClipRect(2, 2, 18, 90, IMKCanvas::Intersect);
        canvas.SetClipRect(4, 8, 8, 20, IMKCanvas::Xor);
        canvas.SetClipRect(6, 10, 2, 5, IMKCanvas::ReverseDifference);
        canvas.DrawRect(0, 0, 24, 100, nullptr);
        canvas.Clear(0x4000FF00);
    });
}

void SaveAndRestore(Stage const& stage) {
    OnCanvas(stage, [](IMKCanvas& canvas) {
        int const level = canvas.Save(IMKCanvas::SaveAll);
        canvas.PreScale(2, 3);
        canvas.SetClipRect(1, 1, 5, 20, IMKCanvas::Intersect);
        canvas.Save(IMKCanvas::SaveMatrix);
        canvas.PostTranslate(1, 1);
        canvas.DrawRect(0, 0, 10, 10, nullptr);
        canvas.Restore(-1);
        canvas.Restore(level);
        canvas.DrawRect(0, 0, 10, 10, nullptr);
    });
}

void DrawOnScreen(Stage const& stage) {
    auto const screen =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateScreenBitmap(&stage.queue, 0, 0, kWidth, kHeight, 1, 1));
    if (!screen) return;
    {
        CanvasPtr const canvas = MakeCanvas(stage, screen);
        if (canvas) {
            canvas->SetClipRect(2, 2, 18, 90, IMKCanvas::Intersect);
            canvas->Clear(0x40FF0000);
            canvas->DrawRect(0, 0, 24, 100, nullptr);
        }
        stage.settle();
    }
    screen->GetPixel(Point(1, 1));
    auto const clone = BitmapPtr::Adopt(screen->Clone());
}

template <class Drawable, class Prepare>
void DrawCustom(Stage const& stage, IMKCanvas& canvas, Prepare const& prepare) {
    auto const drawable = RefPtr<Drawable>::Adopt(new (std::nothrow) Drawable(&stage.queue));
    if (!drawable) return;
    prepare(*drawable);
    canvas.Draw(drawable.Get(), nullptr);
    stage.settle();
}

void DrawCustomDrawables(Stage const& stage) {
    BitmapPtr const source = MakeBitmap(stage, 50);
    if (!source) return;
    OnCanvas(stage, [&](IMKCanvas& canvas) {
        DrawCustom<MKGaussianBlurDrawable>(stage, canvas, [&](auto& d) { d.SetBitmap(source.Get()); });
        DrawCustom<MKTextMaskBitmapDrawable>(stage, canvas, [&](auto& d) { d.SetBitmap(source.Get()); });
        DrawCustom<MKNonPremultipliedColorDrawable>(
            stage, canvas, [&](auto& d) { d.SetBitmap(source.Get(), source.Get()); });
    });
}

void BlendTwoBitmaps(Stage const& stage) {
    BitmapPtr const source = MakeBitmap(stage, 50);
    if (!source) return;
    OnCanvas(stage, [&](IMKCanvas& canvas) {
        RectF const whole(0, 0, 24, 50);
        // The drawable takes over these two references.
        source->Ref();
        source->Ref();
        auto* const made = new (std::nothrow)
            MKBlendedBitmapDrawable(&stage.queue, source.Get(), source.Get(), whole, whole, 0, 0);
        if (!made) {
            source->Unref();
            source->Unref();
            return;
        }
        auto const drawable = RefPtr<MKBlendedBitmapDrawable>::Adopt(made);
        canvas.Draw(drawable.Get(), nullptr);
        stage.settle();
    });
}

void LendToForeignCode(Stage const& stage) {
    BitmapPtr const target = MakeBitmap(stage, 50);
    if (!target) return;
    auto const canvas =
        RefPtr<IMKPenCanvas>::Adopt(MKGraphicsFactory::CreatePenCanvas(&stage.queue, target.Get(), 1));
    if (!canvas) return;
    canvas->SetClipRect(1, 1, 10, 20, IMKCanvasBase::Intersect);
    canvas->Clear(0x40FF0000);
    canvas->GetCanvasMatrix();
    stage.settle();
}

void LoadFromFile(Stage const& stage) {
    String const path(stage.folder + "/picture.png");
    auto const whole = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, &path, 1));
    auto const scaled = BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, &path, 7, 9, 1));
    auto const part =
        BitmapPtr::Adopt(MKGraphicsFactory::CreateBitmap(&stage.queue, Rect(2, 2, 9, 70), &path, 1));
    stage.settle();
}

void SaveToFile(Stage const& stage) {
    BitmapPtr const bitmap = MakeBitmap(stage, 50);
    if (!bitmap) return;
    TestImage copy(kWidth, 50);
    bitmap->GetBitmapData(bitmap->GetBitmapRect(), copy.pixels.data());
    Bitmap pixels;
    if (!pixels.Construct(copy.pixels.data(), kWidth, 50, kWidth * 4, 1, false, false)) return;
    for (char const* const name : {"/saved.png", "/saved.jpg", "/saved.webp", "/saved.mki"}) {
        String const path(stage.folder + name);
        BitmapFactory::SaveBitmap(&pixels, &path, 80);
    }
}

} // namespace

std::vector<Scenario> const& GetScenarios() {
    static std::vector<Scenario> const scenarios = {
        {"CreateAndRead", CreateAndRead},     {"CreateOfOwnedPixels", CreateOfOwnedPixels},
        {"CloneAndShare", CloneAndShare},     {"DrawLines", DrawLines},
        {"DrawRectangles", DrawRectangles},   {"DrawCircles", DrawCircles},
        {"DrawBitmaps", DrawBitmaps},         {"ClipByScissor", ClipByScissor},
        {"ClipByStencil", ClipByStencil},     {"SaveAndRestore", SaveAndRestore},
        {"DrawOnScreen", DrawOnScreen},       {"DrawCustomDrawables", DrawCustomDrawables},
        {"BlendTwoBitmaps", BlendTwoBitmaps}, {"LendToForeignCode", LendToForeignCode},
        {"LoadFromFile", LoadFromFile},       {"SaveToFile", SaveToFile},
    };
    return scenarios;
}

} // namespace Moka::Testing
