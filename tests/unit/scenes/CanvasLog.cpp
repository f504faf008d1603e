#include "tests/unit/scenes/CanvasLog.h"

#include "moka/graphics/bitmap/IMKBitmap.h"
#include "scenes/SceneRenderer.h"
#include "tests/support/Queues.h"
#include "tests/support/RendererTrace.h"

#include <algorithm>

namespace Moka::Testing {
namespace {

std::string ToText(Vector4<float> const& v) {
    std::ostringstream text;
    text << '(' << v.x << ' ' << v.y << ' ' << v.z << ' ' << v.w << ')';
    return text.str();
}

} // namespace

int CanvasLog::Count(std::string const& start) const {
    return static_cast<int>(std::count_if(mLines.begin(), mLines.end(), [&](std::string const& line) {
        return line.compare(0, start.size(), start) == 0;
    }));
}

bool CanvasLog::Contains(std::string const& part) const {
    return std::any_of(mLines.begin(), mLines.end(),
                       [&](std::string const& line) { return line.find(part) != std::string::npos; });
}

void CanvasLog::Restore(int level) {
    Note("Restore", level);
    if (level < mLevel) mLevel = level < 0 ? std::max(0, mLevel - 1) : level;
}

void CanvasLog::Write(Matrix3f const& m) {
    for (int i = 0; i < 9; ++i) mText << (i == 0 ? " {" : " ") << m[i];
    mText << '}';
}

void CanvasLog::Write(IMKBitmap* bitmap) { mText << ' ' << bitmap->GetWidth() << 'x' << bitmap->GetHeight(); }

void CanvasLog::Write(MKPaint const* paint) {
    MKPaint const fresh;
    mText << " color" << ToText(paint->GetColor());
    if (paint->HasTintColor()) mText << " tint" << ToText(paint->GetTintColor());
    if (paint->GetXFermode() != fresh.GetXFermode()) mText << " mode" << paint->GetXFermode();
    if (paint->GetStyle() != fresh.GetStyle()) mText << " style" << paint->GetStyle();
    if (paint->GetLineWidth() != fresh.GetLineWidth()) mText << " width" << paint->GetLineWidth();
    if (paint->IsAntiAliasing()) mText << " soft";
    if (ToText(paint->GetDashedLinePattern()) != ToText(fresh.GetDashedLinePattern()))
        mText << " dashes" << ToText(paint->GetDashedLinePattern());
    if (paint->GetLineCapType() != fresh.GetLineCapType()) mText << " cap" << paint->GetLineCapType();
    if (paint->GetTileModeX() != fresh.GetTileModeX() || paint->GetTileModeY() != fresh.GetTileModeY())
        mText << " tile" << paint->GetTileModeX() << ',' << paint->GetTileModeY();
}

RefPtr<CanvasLog> PlayScene(Scenes::Scene const& scene) {
    RendererTrace::Reset();
    RendererTrace::DeclareNoRenderThread();
    HandPumpedQueue queue;
    queue.SetAroundRun([] { RendererTrace::DeclareRenderThread(); },
                       [] { RendererTrace::DeclareNoRenderThread(); });
    Scenes::QueueStage stage(queue);
    RefPtr<CanvasLog> canvas = RefPtr<CanvasLog>::Adopt(new CanvasLog);
    DrawScene(scene, *canvas, stage);
    queue.RunAll();
    return canvas;
}

} // namespace Moka::Testing
