#include "moka/graphics/canvas/StencilClip.h"

#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/drawable/Shaders.h"
#include "moka/renderer/RendererFactory.h"

#include <cstdint>

namespace Moka::detail {
namespace {

constexpr int kVertices = 6;

// Sets two triangles. The third number of a vertex is the coverage, which has no effect because colour is not
// written.
void SetRectangle(IGraphicsObject& graphics, float left, float top, float right, float bottom) {
    float const vertices[kVertices * 3] = {left,  top, 0, left, bottom, 0, right, top,    0,
                                           right, top, 0, left, bottom, 0, right, bottom, 0};
    graphics.SetVertices(0, vertices, kVertices);
}

RendererPtr<IGraphicsObject> CreateGeometry() {
    VertexDescriptor descriptor;
    descriptor.addAttribute(VertexAttributeType::Float, 3, -1, 0);
    return RendererPtr<IGraphicsObject>(
        RendererFactory::CreateGraphicsObject(1, PrimitiveType::TriangleList, &descriptor, 0, 0));
}

void ClearStencil(IMKBitmapWritable& frameBuffer, int value) {
    frameBuffer.ClearDepthStencilRT(false, 1.0f, true, value);
}

float Sum(int a, int b) { return static_cast<float>(std::int64_t{a} + b); }

} // namespace

StencilClip::StencilClip()
    : mShader(GetShader<MKRectShader>()),
      mClipGeometry(CreateGeometry()),
      mScreenGeometry(CreateGeometry()),
      mDepthStencil(RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(false, true))),
      mBlend(RendererFactory::CreateBlendStateObject(BlendStateDescriptor(false))) {
    if (mScreenGeometry) SetRectangle(*mScreenGeometry, -1, -1, 1, 1);
}

StencilClip::~StencilClip() = default;

void StencilClip::Release() {
    mShader.reset();
    mClipGeometry.reset();
    mScreenGeometry.reset();
    mDepthStencil.reset();
    mBlend.reset();
}

bool StencilClip::IsReady() const {
    return mClipGeometry && mScreenGeometry && mDepthStencil && mBlend && mShader;
}

void StencilClip::Draw(ClipList const& clips, IMKBitmapWritable& frameBuffer) {
    int const initial = HasReplace(clips) ? 0 : 1;
    if (!IsReady()) {
        ClearStencil(frameBuffer, initial);
        return;
    }
    BlendStateDescriptor colorOff(false);
    mBlend->SetDescriptor(colorOff);
    mBlend->Apply();
    mDepthStencil->Apply();
    mShader->program->MakeCurrent();
    // The colour is not written. Setting the same one each time lets the renderer detect that nothing has
    // changed.
    mShader->uColor = Vector4<float>(0, 0, 0, 0);
    mShader->uTintColor = Vector4<float>(0, 0, 0, 0);
    mShader->uHasTintColor = 0;
    ClearStencil(frameBuffer, initial);
    DrawClips(clips, frameBuffer);
    AllowWhereOne();
    // Switches colour writes on again, for draws that set no blend state.
    BlendStateDescriptor colorOn(false);
    colorOn.SetEnabled(false, true);
    mBlend->SetDescriptor(colorOn);
    mBlend->Apply();
}

void StencilClip::DrawClips(ClipList const& clips, IMKBitmapWritable& frameBuffer) {
    for (std::size_t i = FirstRelevant(clips); i < clips.size(); ++i) DrawClip(clips[i], frameBuffer);
}

void StencilClip::DrawClip(ClipInfo const& clip, IMKBitmapWritable& frameBuffer) {
    FillClipGeometry(clip);
    Area const rect{mClipGeometry.get(), frameBuffer.GetProjectionMatrix() * FromMatrix3(clip.matrix)};
    Area const screen{mScreenGeometry.get(), Matrix4<float>()};
    switch (clip.op) {
    case IMKCanvasBase::Intersect:
        Pass(rect, StencilAlways, 1, StencilIncrementSaturate);
        Pass(screen, StencilAlways, 1, StencilDecrementSaturate);
        break;
    case IMKCanvasBase::Replace:
        ClearStencil(frameBuffer, 0);
        Pass(rect, StencilAlways, 1, StencilIncrementSaturate);
        break;
    case IMKCanvasBase::Union:
        Pass(rect, StencilEqual, 0, StencilIncrementSaturate);
        break;
    case IMKCanvasBase::Xor:
        Pass(rect, StencilAlways, 1, StencilIncrementSaturate);
        Pass(rect, StencilEqual, 2, StencilZero);
        break;
    case IMKCanvasBase::Difference:
        Pass(rect, StencilAlways, 1, StencilZero);
        break;
    case IMKCanvasBase::ReverseDifference:
        Pass(screen, StencilEqual, 1, StencilIncrementSaturate);
        Pass(rect, StencilAlways, 1, StencilIncrementSaturate);
        Pass(screen, StencilNotEqual, 1, StencilZero);
        break;
    }
}

void StencilClip::FillClipGeometry(ClipInfo const& clip) {
    SetRectangle(*mClipGeometry, static_cast<float>(clip.x), static_cast<float>(clip.y),
                 Sum(clip.x, clip.width), Sum(clip.y, clip.height));
}

void StencilClip::Pass(Area const& area, StencilComparison comparison, int reference,
                       StencilOperation operation) {
    DepthStencilStateDescriptor descriptor(false, true);
    descriptor.SetStencilFunction(comparison, reference, 255, 255);
    descriptor.SetStencilOperation(StencilKeep, StencilKeep, operation);
    mDepthStencil->SetDescriptor(descriptor);
    mDepthStencil->Apply();
    mShader->uProjectionMatrix = area.matrix;
    area.graphics->Draw(0, -1, 1);
}

void StencilClip::AllowWhereOne() {
    DepthStencilStateDescriptor descriptor(false, true);
    descriptor.SetStencilFunction(StencilEqual, 1, 255, 0);
    mDepthStencil->SetDescriptor(descriptor);
    mDepthStencil->Apply();
}

} // namespace Moka::detail
