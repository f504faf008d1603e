#include "scenes/PenScenes.h"

#include "moka/graphics/factory/BitmapsAndCanvases.h"
#include "moka/graphics/paint/MKPaint.h"
#include "scenes/SceneError.h"
#include "scenes/ScenePen.h"

#include <algorithm>
#include <cmath>

namespace Moka::Scenes {
namespace {

constexpr Vector4<float> kPaper{247 / 255.0f, 245 / 255.0f, 240 / 255.0f, 1};
constexpr Vector4<float> kInk{42 / 255.0f, 74 / 255.0f, 106 / 255.0f, 1};
constexpr int kClipColor = static_cast<int>(0xFFF0D9A8);
constexpr int kFrameColor = static_cast<int>(0xFFB07A2A);

// Returns four handwritten loops: thick downwards, thin upwards, with thin ends.
std::vector<InkPoint> MakeLoops() {
    constexpr int kPoints = 320;
    constexpr float kTurns = 4;
    constexpr float kTwoPi = 6.2831853f;
    std::vector<InkPoint> points;
    for (int i = 0; i <= kPoints; ++i) {
        float const t = static_cast<float>(i) / kPoints;
        float const turn = kTwoPi * kTurns * t;
        float const tip = std::min(1.0f, 12 * std::min(t, 1 - t));
        points.push_back({15 + 110 * t + 19 * std::sin(turn), 70 + 42 * std::cos(turn),
                          tip * (2.6f - 1.8f * std::sin(turn))});
    }
    return points;
}

// Shows the clip of the ink: a colour below it and a frame above it.
struct Panel {
    IMKCanvas& canvas;
    RectF clip;

    void DrawBelow() const {
        MKPaint paint;
        paint.SetColor(kClipColor);
        canvas.DrawRect(clip, &paint);
    }
    void DrawAbove() const {
        MKPaint paint;
        paint.SetColor(kFrameColor);
        paint.SetStyle(MKPaint::Stroke);
        paint.SetLineWidth(2);
        canvas.DrawRect(clip, &paint);
    }
};

template <class SetClips>
void DrawPanel(Panel const& panel, SceneStage& stage, IMKPenCanvas& pen, SetClips const& setClips) {
    panel.DrawBelow();
    int const level = pen.Save(IMKCanvasBase::SaveAll);
    setClips();
    stage.GetPen()->DrawStroke(pen, MakeLoops(), kInk);
    pen.Restore(level);
    panel.DrawAbove();
}

void DrawPenStroke(IMKCanvas& canvas, SceneStage& stage) {
    auto const pen = NewPenCanvas(*stage.GetQueue(), canvas.GetBitmap());
    if (!pen) throw SceneError("there is no room for a pen canvas");
    DrawPanel({canvas, RectF(10, 10, 150, 130)}, stage, *pen, [&] { pen->PreTranslate(10, 0); });
    DrawPanel({canvas, RectF(190, 40, 290, 90)}, stage, *pen, [&] {
        pen->PreTranslate(170, 0);
        pen->SetClipRect(20, 10, 120, 80, IMKCanvasBase::Intersect);
        pen->SetClipRect(0, 40, 120, 90, IMKCanvasBase::Intersect);
    });
    DrawPanel({canvas, RectF(360, 25, 440, 115)}, stage, *pen, [&] {
        pen->PreTranslate(330, 0);
        pen->SetClipRect(0, 0, 10, 10, IMKCanvasBase::Intersect);
        pen->SetClipRect(30, 25, 80, 90, IMKCanvasBase::Replace);
        pen->PreRotate(-25, 70, 70);
    });
}

} // namespace

std::vector<Scene> MakePenScenes() {
    Scene scene;
    scene.group = SceneGroup::PenCanvas;
    scene.name = "pen-stroke";
    scene.about =
        "Ink drawn by external GL code: whole, cut by two clips, and rotated under a clip that replaced "
        "another.";
    scene.width = 480;
    scene.height = 140;
    scene.background = kPaper;
    scene.needsGpu = true;
    scene.needsPen = true;
    scene.draw = [](IMKCanvas& canvas, SceneStage& stage) {
        if (!stage.GetQueue() || !stage.GetPen()) throw SceneError("pen-stroke needs a GPU and a pen");
        DrawPenStroke(canvas, stage);
    };
    return {scene};
}

} // namespace Moka::Scenes
