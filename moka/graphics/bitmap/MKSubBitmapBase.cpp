#include "moka/graphics/bitmap/MKSubBitmapBase.h"

#include "moka/base/Likely.h"
#include "moka/graphics/bitmap/MKDepthStencilBuffer.h"
#include "moka/graphics/bitmap/MKFrameBuffer.h"
#include "moka/renderer/IRenderTarget.h"
#include "moka/renderer/ITextureObject.h"
#include "moka/renderer/RendererFactory.h"

#include <iterator>
#include <new>

namespace Moka {
namespace {

constexpr TextureParameter kInitialParameters[] = {{TextureParamFilteringMin, TextureFilterLinear},
                                                   {TextureParamFilteringMag, TextureFilterLinear}};

ITextureObject* MakeTexture(TextureDescriptor const& descriptor, PixelSource const& source) {
    return RendererFactory::CreateTextureObject(descriptor, kInitialParameters,
                                                static_cast<int>(std::size(kInitialParameters)), source);
}

Matrix4<float> Project(Rect const& rect) {
    float const l = static_cast<float>(rect.left);
    float const r = static_cast<float>(rect.right);
    float const t = static_cast<float>(rect.top);
    float const b = static_cast<float>(rect.bottom);
    Matrix4<float> m(0.0f);
    m[0] = 2.0f / (r - l);
    m[5] = 2.0f / (b - t);
    m[10] = -1.0f / 32767.0f;
    m[12] = -(l + r) / (r - l);
    m[13] = -(t + b) / (b - t);
    m[14] = -0.0f;
    m[15] = 1.0f;
    return m;
}

} // namespace

MKSubBitmapBase::MKSubBitmapBase(IGLMsgQueue* queue, int index, Rect const& rect)
    : mMsgQueue(queue), mIndex(index), mRect(rect), mProjection(Project(rect)) {}

MKSubBitmapBase::~MKSubBitmapBase() = default;

void MKSubBitmapBase::CreateTexture(int x, int y, int rowLength, void const* pixels, bool textureFlag) {
    if (mTexture) return;
    TextureDescriptor const descriptor(GetWidth(), GetHeight(), 0, 2, 6, 1, textureFlag, nullptr);
    mTexture = MakeTexture(descriptor, {pixels, x, y, rowLength});
}

void MKSubBitmapBase::CreateTexture(ITextureObject* model) {
    if (mTexture || !model) return;
    mTexture = MakeTexture(TextureDescriptor(model), {});
}

bool MKSubBitmapBase::HasFrameBufferRT() const {
    MKFrameBuffer const* const frameBuffer = mFrameBuffer;
    return frameBuffer && frameBuffer->GetOffscreenRenderTarget();
}

void MKSubBitmapBase::CreateFrameBufferRT(bool release) {
    if (MKFrameBuffer* const frameBuffer = mFrameBuffer)
        frameBuffer->Ref();
    else if (mTexture)
        mFrameBuffer = new (std::nothrow) MKFrameBuffer(GetWidth(), GetHeight(), mTexture);
    if (release) Unref();
}

void MKSubBitmapBase::ReleaseFrameBufferRT(bool release) {
    if (MKFrameBuffer* const frameBuffer = mFrameBuffer) {
        if (frameBuffer->GetRefCount() == 1)
            DropLastFrameBuffer();
        else
            frameBuffer->Unref();
    }
    if (release) Unref();
}

void MKSubBitmapBase::DropLastFrameBuffer() {
    MKFrameBuffer* const frameBuffer = mFrameBuffer;
    if (mDepthStencil) {
        frameBuffer->DetachDepthStencilBufferRT();
        mDepthStencil.reset(); // the count stays
    }
    frameBuffer->Unref();
    mFrameBuffer = nullptr;
}

void MKSubBitmapBase::AttachDepthStencil() {
    MKFrameBuffer* const frameBuffer = mFrameBuffer;
    if (!frameBuffer) return;
    if (mDepthStencilCount == 0) {
        mDepthStencil.reset(new (std::nothrow) MKDepthStencilBuffer(GetWidth(), GetHeight()));
        if (!mDepthStencil) return;
        frameBuffer->AttachDepthStencilBufferRT(mDepthStencil.get());
    }
    ++mDepthStencilCount;
}

void MKSubBitmapBase::DetachDepthStencil() {
    MKFrameBuffer* const frameBuffer = mFrameBuffer;
    if (!frameBuffer || mDepthStencilCount < 1) return;
    if (--mDepthStencilCount > 0 || !mDepthStencil) return;
    frameBuffer->DetachDepthStencilBufferRT();
    mDepthStencil.reset();
}

void MKSubBitmapBase::AttachStencilBufferRT(bool release) {
    AttachDepthStencil();
    if (release) Unref();
}

void MKSubBitmapBase::DetachStencilBufferRT(bool release) {
    DetachDepthStencil();
    if (release) Unref();
}

void MKSubBitmapBase::ActivateFrameBufferRT(bool release) {
    MKFrameBuffer* const frameBuffer = mFrameBuffer;
    if (MOKA_LIKELY(frameBuffer)) frameBuffer->ActivateFrameBufferRT();
    if (MOKA_UNLIKELY(release)) Unref();
}

void MKSubBitmapBase::DeactivateFrameBufferRT(bool release, DiscardFramebufferType discard) {
    MKFrameBuffer* const frameBuffer = mFrameBuffer;
    if (MOKA_LIKELY(frameBuffer))
        frameBuffer->DeactivateFrameBufferRT((discard & DiscardFramebufferColor) != 0,
                                             (discard & DiscardFramebufferDepthStencil) != 0);
    if (MOKA_UNLIKELY(release)) Unref();
}

void MKSubBitmapBase::ClearColorRT(float r, float g, float b, float a) {
    if (MKFrameBuffer* const frameBuffer = mFrameBuffer) frameBuffer->ClearColorRT(r, g, b, a);
}

void MKSubBitmapBase::ClearDepthStencilRT(bool clearDepth, float depth, bool clearStencil, int stencil) {
    if (MKFrameBuffer* const frameBuffer = mFrameBuffer)
        frameBuffer->ClearDepthStencilRT(clearDepth, depth, clearStencil, stencil);
}

void MKSubBitmapBase::ActivateTextureRT(int unit, bool release) {
    if (ITextureObject* const texture = mTexture) texture->Bind(unit);
    if (release) Unref();
}

void MKSubBitmapBase::SetParameter(int id, int value) {
    if (ITextureObject* const texture = mTexture) texture->SetParameter(id, value);
}

void MKSubBitmapBase::SetTextureFilterRT(TextureParamFilteringValue value, bool release) {
    SetParameter(TextureParamFilteringMin, value);
    SetParameter(TextureParamFilteringMag, value);
    if (release) Unref();
}

void MKSubBitmapBase::SetTextureFilterRT(TextureParamFiltering kind, TextureParamFilteringValue value,
                                         bool release) {
    SetParameter(kind, value);
    if (release) Unref();
}

void MKSubBitmapBase::SetTextureWrapRT(TextureParamWrappingValue value, bool release) {
    SetParameter(TextureParamWrappingS, value);
    SetParameter(TextureParamWrappingT, value);
    if (release) Unref();
}

void MKSubBitmapBase::SetTextureWrapRT(TextureParamWrapping kind, TextureParamWrappingValue value,
                                       bool release) {
    SetParameter(kind, value);
    if (release) Unref();
}

void MKSubBitmapBase::Upload(void const* pixels, int stride) {
    if (ITextureObject* const texture = mTexture) texture->Replace(pixels, stride);
}

void MKSubBitmapBase::Upload(Rect const& r, void const* pixels, int stride) {
    if (ITextureObject* const texture = mTexture) texture->Replace(r, pixels, stride);
}

IRenderTarget* MKSubBitmapBase::GetRenderTarget() {
    MKFrameBuffer* const frameBuffer = mFrameBuffer;
    return frameBuffer ? frameBuffer->GetOffscreenRenderTarget() : nullptr;
}

unsigned int MKSubBitmapBase::ReadPixel(Point const& p) {
    unsigned int pixel = 0;
    int const width = GetWidth();
    int const height = GetHeight();
    // Compat: pixel-bounds
    if (p.x < 0 || p.x > width || p.y < 0 || p.y > height) return pixel;
    CreateFrameBufferRT(false);
    int const x = p.x - (p.x == width ? 1 : 0) - mRect.left;
    int const y = p.y - (p.y == height ? 1 : 0) - mRect.top;
    if (IRenderTarget* const target = GetRenderTarget()) target->ReadPixels(x, y, 1, 1, {&pixel, 1, 0, 0});
    ReleaseFrameBufferRT(false);
    return pixel;
}

void MKSubBitmapBase::ReadBlock(Rect const& r, void* destination) {
    Rect const i = r.Intersect(mRect);
    if (i.IsEmpty() || !destination) return;
    CreateFrameBufferRT(false);
    if (IRenderTarget* const target = GetRenderTarget())
        target->ReadPixels(i.left - mRect.left, i.top - mRect.top, i.GetWidth(), i.GetHeight(),
                           {destination, r.GetWidth(), i.top - r.top, i.left - r.left});
    ReleaseFrameBufferRT(false);
}

void MKSubBitmapBase::CopyTextureTo(MKSubBitmapBase* target) {
    ITextureObject* const texture = mTexture;
    if (!texture || !target->GetRenderTarget()) return;
    target->ActivateFrameBufferRT(false);
    texture->DrawToCurrent();
    target->DeactivateFrameBufferRT(false, DiscardFramebufferNone);
}

} // namespace Moka
