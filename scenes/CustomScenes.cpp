#include "scenes/CustomScenes.h"

#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/canvas/IMKCanvas.h"
#include "moka/graphics/drawable/MKBlendedBitmapDrawable.h"
#include "moka/graphics/drawable/MKGaussianBlurDrawable.h"
#include "moka/graphics/drawable/MKNonPremultipliedColorDrawable.h"
#include "moka/graphics/drawable/MKTextMaskBitmapDrawable.h"
#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/paint/MKPaint.h"
#include "scenes/Picture.h"
#include "scenes/SceneError.h"

#include <algorithm>
#include <new>
#include <utility>

namespace Moka::Scenes {
namespace {

using BitmapPtr = RefPtr<IMKBitmap>;

constexpr Vector4<float> kPaper{247 / 255.0f, 245 / 255.0f, 240 / 255.0f, 1};
constexpr int kInk = static_cast<int>(0xFF2A4A6A);

BitmapPtr MakeBitmap(SceneStage& stage, char const* picture, int width, int height) {
    std::vector<std::string> const& names = GetPictureNames();
    auto const index =
        static_cast<std::size_t>(std::find(names.begin(), names.end(), picture) - names.begin());
    BitmapPtr bitmap = BitmapPtr::Adopt(stage.MakeBitmap(MakePicture(index, width, height)));
    if (!bitmap) throw SceneError("there is no room for the scene's bitmaps");
    return bitmap;
}

template <class Drawable, class... Arguments>
RefPtr<Drawable> MakeDrawable(Arguments&&... arguments) {
    auto drawable =
        RefPtr<Drawable>::Adopt(new (std::nothrow) Drawable(std::forward<Arguments>(arguments)...));
    if (!drawable) throw SceneError("there is no room for the scene's drawables");
    return drawable;
}

// Creates a bitmap of this size and calls draw with a canvas on it.
template <class Draw>
BitmapPtr DrawAside(SceneStage& stage, int width, int height, Draw const& draw) {
    BitmapPtr target = NewBitmap(*stage.GetQueue(), width, height);
    auto const canvas = NewCanvas(*stage.GetQueue(), target);
    if (!canvas) throw SceneError("there is no room for the scene's bitmaps");
    draw(*canvas);
    return target;
}

void DrawAt(IMKCanvas& canvas, float x, float y, IMKCustomDrawable& drawable, MKPaint const& paint) {
    int const level = canvas.Save(IMKCanvasBase::SaveMatrix);
    canvas.PreTranslate(x, y);
    canvas.Draw(&drawable, &paint);
    canvas.Restore(level);
}

void DrawCrossFade(IMKCanvas& canvas, SceneStage& stage) {
    BitmapPtr const day = MakeBitmap(stage, "photo", 96, 110);
    BitmapPtr const night = MakeBitmap(stage, "gradient", 96, 110);
    for (int i = 0; i < 5; ++i) {
        float const x = 14 + 106 * static_cast<float>(i);
        BitmapPtr first = day;
        BitmapPtr second = night;
        auto const fade = MakeDrawable<MKBlendedBitmapDrawable>(stage.GetQueue(), first.Get(), second.Get(),
                                                                RectF(0, 0, 96, 110),
                                                                RectF(x, 14, x + 96, 124), 0.0f, 0.0f);
        // The drawable owns these references now.
        static_cast<void>(first.Release());
        static_cast<void>(second.Release());
        MKPaint paint;
        paint.SetAlpha(static_cast<float>(i) / 4);
        canvas.Draw(fade.Get(), &paint);
    }
}

void DrawTextMask(IMKCanvas& canvas, SceneStage& stage) {
    MKPaint paint;
    BitmapPtr const letters = MakeBitmap(stage, "letters", 130, 108);
    BitmapPtr const small = MakeBitmap(stage, "letters", 26, 27);
    BitmapPtr const soft = DrawAside(stage, 130, 108, [&](IMKCanvas& other) {
        other.DrawBitmap(small.Get(), RectF(0, 0, 130, 108), &paint);
    });
    BitmapPtr const disc = MakeBitmap(stage, "disc", 108, 108);
    IMKBitmap* const masks[] = {letters.Get(), soft.Get(), disc.Get()};
    BitmapPtr const photo = MakeBitmap(stage, "photo", 420, 140);
    canvas.DrawBitmap(photo.Get(), 10, 10, &paint);
    constexpr unsigned kColors[] = {0xFFFFFFFF, 0xFFD9A441, 0xFF2A1A3A};
    for (int i = 0; i < 3; ++i) {
        auto const mask = MakeDrawable<MKTextMaskBitmapDrawable>(stage.GetQueue());
        mask->SetBitmap(masks[i]);
        mask->SetDstPosition(20 + 135 * static_cast<float>(i), 26);
        paint.SetColor(static_cast<int>(kColors[i]));
        canvas.Draw(mask.Get(), &paint);
    }
}

enum class Direction { Across, Down };

RefPtr<MKGaussianBlurDrawable> MakeBlur(SceneStage& stage, BitmapPtr const& bitmap, Direction direction) {
    auto blur = MakeDrawable<MKGaussianBlurDrawable>(stage.GetQueue());
    blur->SetBitmap(bitmap.Get());
    blur->SetHorizotalDirection(direction == Direction::Across);
    // Samples lie between texels, where the filter mixes two of them. At whole texels stripes would be
    // visible.
    blur->SetBlurAmount(1.5f);
    return blur;
}

constexpr int kBlurWidth = 117;
constexpr int kBlurHeight = 99;

// The first pass of a blur in both directions.
BitmapPtr BlurAcross(SceneStage& stage, BitmapPtr const& bitmap) {
    return DrawAside(stage, kBlurWidth, kBlurHeight, [&](IMKCanvas& canvas) {
        MKPaint paint;
        canvas.Draw(MakeBlur(stage, bitmap, Direction::Across).Get(), &paint);
    });
}

void DrawGaussianBlur(IMKCanvas& canvas, SceneStage& stage) {
    BitmapPtr const small = MakeBitmap(stage, "letters", 91, 72);
    // Leaves room around the letters for the blur and the offset of the shadow.
    BitmapPtr const letters = DrawAside(stage, kBlurWidth, kBlurHeight, [&](IMKCanvas& other) {
        MKPaint plain;
        other.DrawBitmap(small.Get(), 8, 8, &plain);
    });
    BitmapPtr const across = BlurAcross(stage, letters);
    MKPaint paint;
    canvas.DrawBitmap(letters.Get(), 14, 14, &paint);
    DrawAt(canvas, 144, 14, *MakeBlur(stage, letters, Direction::Across), paint);
    DrawAt(canvas, 274, 14, *MakeBlur(stage, letters, Direction::Down), paint);
    DrawAt(canvas, 14, 124, *MakeBlur(stage, across, Direction::Down), paint);

    auto const shadow = MakeBlur(stage, across, Direction::Down);
    shadow->SetOffset(7, 7);
    MKPaint tinted;
    tinted.SetTintColor(static_cast<int>(0xB0302050));
    DrawAt(canvas, 144, 124, *shadow, tinted);
    DrawAt(canvas, 274, 124, *shadow, tinted);
    canvas.DrawBitmap(letters.Get(), 274, 124, &paint);
}

void DrawNonPremultiplied(IMKCanvas& canvas, SceneStage& stage) {
    BitmapPtr const veil = MakeBitmap(stage, "veil", 130, 120);
    BitmapPtr const gradient = MakeBitmap(stage, "gradient", 130, 120);
    MKPaint paint;
    // No pixel is fully transparent, because the result of dividing by an alpha of 0 depends on the driver.
    BitmapPtr const pale = DrawAside(stage, 130, 120, [&](IMKCanvas& other) {
        MKPaint faint;
        faint.SetAlpha(0.3f);
        other.DrawBitmap(gradient.Get(), 0, 0, &faint);
    });
    canvas.DrawBitmap(pale.Get(), 14, 14, &paint);
    canvas.DrawBitmap(veil.Get(), 14, 14, &paint);

    auto const drawable = MakeDrawable<MKNonPremultipliedColorDrawable>(stage.GetQueue());
    drawable->SetBitmap(veil.Get(), pale.Get());
    MKPaint replacing;
    replacing.SetXFermode(MKPaint::Src);
    BitmapPtr const aside =
        DrawAside(stage, 130, 120, [&](IMKCanvas& other) { other.Draw(drawable.Get(), &replacing); });
    DrawAt(canvas, 158, 14, *drawable, replacing);
    paint.SetXFermode(MKPaint::SrcOverNonPremultiplied);
    canvas.DrawBitmap(aside.Get(), 302, 14, &paint);
}

using Draw = void (*)(IMKCanvas&, SceneStage&);

Scene MakeScene(char const* name, char const* about, int width, int height, Draw draw) {
    Scene scene;
    scene.group = SceneGroup::CustomDrawables;
    scene.name = name;
    scene.about = about;
    scene.width = width;
    scene.height = height;
    scene.background = kPaper;
    scene.needsGpu = true;
    scene.draw = [name = scene.name, draw](IMKCanvas& canvas, SceneStage& stage) {
        if (!stage.GetQueue()) throw SceneError(name + " needs a GPU");
        draw(canvas, stage);
    };
    return scene;
}

} // namespace

std::vector<Scene> MakeCustomScenes() {
    return {
        MakeScene("cross-fade", "From one picture to another in five steps.", 542, 138, DrawCrossFade),
        MakeScene("text-mask",
                  "The alpha of sharp letters, of soft ones and of a disc that fades, in three colours.", 440,
                  160, DrawTextMask),
        MakeScene(
            "gaussian-blur",
            "Sharp, blurred across, blurred downwards; both, both tinted and offset, and that as a shadow.",
            405, 237, DrawGaussianBlur),
        MakeScene(
            "non-premultiplied",
            "Bars over a faint picture; as colour that is not premultiplied; and that drawn as what it is.",
            446, 148, DrawNonPremultiplied),
    };
}

} // namespace Moka::Scenes
