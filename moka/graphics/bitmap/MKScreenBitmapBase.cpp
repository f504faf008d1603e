#include "moka/graphics/bitmap/MKScreenBitmapBase.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/BitmapCreation.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/RendererFactory.h"

namespace Moka {

MKScreenBitmapBase::MKScreenBitmapBase(IGLMsgQueue* queue, int x, int y, int width, int height,
                                       FramebufferType type)
    : MKBitmap(queue, x, y, width, height), mFramebufferType(type) {}

void MKScreenBitmapBase::CreateRenderTarget(int width, int height, FramebufferType type, char const* caller) {
    if (type == CurrentFramebuffer)
        mRenderTarget = RendererFactory::CreateRenderTargetFromCurrent(width, height);
    else if (type == DefaultFramebuffer)
        mRenderTarget = RendererFactory::CreateRenderTargetFromDefault(width, height);
    else
        __android_log_print(ANDROID_LOG_ERROR, "mok_log", "%s Invalid framebuffer type", caller);
}

IMKBitmap* MKScreenBitmapBase::Clone() {
    return detail::CreateScreenBitmap(mMsgQueue, GetX(), GetY(), GetWidth(), GetHeight(), mFramebufferType,
                                      1);
}

Matrix4<float> MKScreenBitmapBase::GetProjectionMatrix() {
    float const w = static_cast<float>(GetWidth());
    float const h = static_cast<float>(GetHeight());
    Matrix4<float> m(0.0f);
    m[0] = 2.0f / w;
    m[5] = 2.0f / (0.0f - h);
    m[10] = -1.0f / 32767.0f;
    m[12] = -w / w; // NaN if the width is 0
    m[13] = -h / (0.0f - h);
    m[14] = -0.0f;
    m[15] = 1.0f;
    return m;
}

void MKScreenBitmapBase::ActivateFrameBufferRT(bool release) {
    if (mRenderTarget) mRenderTarget->Activate();
    if (release) Unref();
}

void MKScreenBitmapBase::DeactivateFrameBufferRT(bool release, DiscardFramebufferType discard) {
    if (mRenderTarget)
        mRenderTarget->Deactivate((discard & DiscardFramebufferColor) != 0,
                                  (discard & DiscardFramebufferDepthStencil) != 0);
    if (release) Unref();
}

void MKScreenBitmapBase::ClearColorRT(float r, float g, float b, float a) {
    if (mRenderTarget) mRenderTarget->ClearColor(r, g, b, a);
}

void MKScreenBitmapBase::AttachToCanvasRT(bool release) {
    Ref();
    if (release) Unref();
}

void MKScreenBitmapBase::DetachFromCanvasRT(bool release) {
    Unref();
    if (release) Unref();
}

unsigned int MKScreenBitmapBase::ReadPixel(Point const& p) {
    unsigned int pixel = 0;
    int const width = GetWidth();
    int const height = GetHeight();
    if (!mRenderTarget || p.x < 0 || p.x > width || p.y < 0 || p.y > height) return pixel;
    // Compat: screen-pixel-row
    int const x = p.x - (p.x == width ? 1 : 0);
    int const y = height - p.y + (p.y == height ? 1 : 0);
    mRenderTarget->ReadPixels(x, y, 1, 1, {&pixel, 1, 0, 0});
    return pixel;
}

void MKScreenBitmapBase::ReadBlock(Rect const& r, void* destination) {
    Rect const i = r.Intersect(GetBitmapRect());
    if (i.IsEmpty() || !destination || !mRenderTarget) return;
    // Compat: screen-rows
    mRenderTarget->ReadPixels(i.left, i.top, i.GetWidth(), i.GetHeight(),
                              {destination, r.GetWidth(), i.top - r.top, i.left - r.left});
}

} // namespace Moka
