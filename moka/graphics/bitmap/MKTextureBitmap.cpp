#include "moka/graphics/bitmap/MKTextureBitmap.h"

#include "moka/base/RefPtr.h"
#include "moka/graphics/bitmap/BitmapCreation.h"
#include "moka/graphics/bitmap/MKSubBitmap.h"
#include "moka/graphics/bitmap/MKSubBitmapRT.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/renderer/IRendererDeviceCaps.h"
#include "moka/renderer/RendererFactory.h"

#include <algorithm>
#include <cstdint>
#include <new>

namespace Moka {

template <class Action>
void MKTextureBitmap::ForEachStrip(Action const& action) {
    for (IMKSubBitmap* const strip : mSubBitmaps)
        if (strip) action(strip);
}

template <class Action>
void MKTextureBitmap::ForFirstStrip(Action const& action) {
    if (IMKSubBitmap* const strip = GetSubBitmap(0)) action(strip);
}

MKTextureBitmap::MKTextureBitmap(IGLMsgQueue* queue, int width, int height, void const* pixels,
                                 bool deleteBuffer, bool renderThread, bool textureFlag)
    : MKBitmap(queue, 0, 0, width, height) {
    BuildStrips(GetBitmapRect(), pixels, renderThread, textureFlag);
    if (deleteBuffer) FreePixels(pixels, renderThread);
}

MKTextureBitmap::MKTextureBitmap(IGLMsgQueue* queue, Rect const& region, int width, int height,
                                 void const* pixels, bool deleteBuffer, bool renderThread)
    : MKBitmap(queue, 0, 0, width, height) {
    BuildStrips(region, pixels, renderThread, false);
    if (deleteBuffer) FreePixels(pixels, renderThread);
}

MKTextureBitmap::MKTextureBitmap(IGLMsgQueue* queue, TextureObject const*, bool)
    : MKBitmap(queue, 0, 0, 0, 0) {}

MKTextureBitmap::MKTextureBitmap(IGLMsgQueue* queue, IMKTextureBitmap* source, int width, int height,
                                 bool renderThread)
    : MKBitmap(queue, 0, 0, width, height) {
    for (int i = 0; i < source->GetSubBitmapCount(); ++i)
        ShareStrip(i, source->GetSubBitmap(i), renderThread);
}

MKTextureBitmap::~MKTextureBitmap() {
    ForEachStrip([](IMKSubBitmap* strip) { strip->Unref(); });
}

void MKTextureBitmap::BuildStrips(Rect const& region, void const* pixels, bool renderThread,
                                  bool textureFlag) {
    int const width = GetWidth();
    int const height = GetHeight();
    int const band = RendererFactory::GetRendererDeviceCaps()->GetMaxTextureSize();
    int index = 0;
    for (std::int64_t top = 0; top < height; top += band, ++index) {
        int const bottom = static_cast<int>(std::min<std::int64_t>(top + band, height));
        Rect const rect = Rect(0, static_cast<int>(top), width, bottom).Intersect(region);
        if (rect.IsEmpty()) continue;
        IMKSubBitmap* strip = nullptr;
        if (renderThread)
            strip =
                new (std::nothrow) MKSubBitmapRT(mMsgQueue, index, rect, width, height, pixels, textureFlag);
        else
            strip =
                new (std::nothrow) MKSubBitmap(mMsgQueue, index, rect, width, height, pixels, textureFlag);
        AddStrip(strip);
    }
}

// If the model is missing, the list gets a null entry at this place.
void MKTextureBitmap::ShareStrip(int index, IMKSubBitmap* model, bool renderThread) {
    IMKSubBitmap* strip = nullptr;
    if (model && renderThread) {
        strip =
            new (std::nothrow) MKSubBitmapRT(mMsgQueue, index, model->GetBitmapRect(), model->GetTexture());
    } else if (model) {
        // Keeps this bitmap, and so its parent, alive until the strip's texture has been created.
        Ref();
        strip = new (std::nothrow) MKSubBitmap(mMsgQueue, index, model->GetBitmapRect(), model);
        WorkerTask::PostMember(mMsgQueue, static_cast<RefCount*>(this), &RefCount::Unref);
    }
    AddStrip(strip);
}

void MKTextureBitmap::AddStrip(IMKSubBitmap* strip) {
    try {
        mSubBitmaps.push_back(strip);
    } catch (std::bad_alloc const&) {
        if (strip) strip->Unref();
    }
}

// Posted after the strips' own tasks, so that every strip has uploaded before the array is deleted.
void MKTextureBitmap::FreePixels(void const* pixels, bool renderThread) {
    if (!pixels) return;
    auto const* const array = static_cast<unsigned char const*>(pixels);
    if (renderThread)
        delete[] array;
    else
        WorkerTask::PostDeleteArray(mMsgQueue, array);
}

IMKSubBitmap* MKTextureBitmap::FindStrip(Point const& p) {
    for (IMKSubBitmap* const strip : mSubBitmaps)
        if (strip && strip->GetBitmapRect().Contains(p)) return strip;
    return nullptr;
}

unsigned int MKTextureBitmap::GetPixel(Point const& p) {
    IMKSubBitmap* const strip = FindStrip(p);
    return strip ? strip->GetPixel(p) : 0;
}

void MKTextureBitmap::GetPixelAsync(Point const& p, void* userData, PixelCallback callback) {
    if (IMKSubBitmap* const strip = FindStrip(p)) strip->GetPixelAsync(p, userData, callback);
}

void MKTextureBitmap::GetBitmapData(Rect const& r, void* destination) {
    ForEachStrip([&](IMKSubBitmap* strip) {
        if (strip->GetBitmapRect().IsIntersect(r)) strip->GetBitmapData(r, destination);
    });
}

void MKTextureBitmap::GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                                         DataCallback callback) {
    // The callback may drop the last reference during this loop.
    auto const self = RefPtr<MKTextureBitmap>::Share(this);
    IMKSubBitmap* last = nullptr;
    ForEachStrip([&](IMKSubBitmap* strip) { last = strip; });
    ForEachStrip([&](IMKSubBitmap* strip) {
        strip->GetBitmapDataAsync(r, destination, userData, strip == last ? callback : nullptr);
    });
    // Memory ran out for every strip. The callback must run nevertheless, because the caller may wait for it.
    if (!last && callback && GetHeight() > 0) {
        Ref();
        WorkerTask::PostMember(mMsgQueue, this, &MKTextureBitmap::CallBackRT, r, destination, userData,
                               callback);
    }
}

void MKTextureBitmap::CallBackRT(Rect const& r, void* destination, void* userData, DataCallback callback) {
    auto const self = RefPtr<MKTextureBitmap>::Adopt(this);
    callback(r, destination, userData);
}

void MKTextureBitmap::SetTag(char const* tag) {
    MKBitmap::SetTag(tag);
    ForEachStrip([&](IMKSubBitmap* strip) { strip->SetTag(tag); });
}

IMKBitmap* MKTextureBitmap::Clone() {
    IMKBitmap* const clone = detail::CreateSharedBitmap(mMsgQueue, this, 1);
    if (clone) clone->SetTag(GetTag());
    return clone;
}

void MKTextureBitmap::AttachStencilBufferRT(bool release) {
    ForFirstStrip([](IMKSubBitmap* strip) { strip->AttachStencilBufferRT(false); });
    if (release) Unref();
}

void MKTextureBitmap::DetachStencilBufferRT(bool release) {
    ForFirstStrip([](IMKSubBitmap* strip) { strip->DetachStencilBufferRT(false); });
    if (release) Unref();
}

void MKTextureBitmap::AttachDepthBuffer() {
    ForEachStrip([](IMKSubBitmap* strip) { strip->AttachDepthBuffer(); });
}

void MKTextureBitmap::DetachDepthBuffer() {
    ForEachStrip([](IMKSubBitmap* strip) { strip->DetachDepthBuffer(); });
}

void MKTextureBitmap::UpdateBitmap(void const* pixels, int stride) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->UpdateBitmap(pixels, stride); });
}

void MKTextureBitmap::UpdateBitmap(Rect const& r, void const* pixels, int stride) {
    ForEachStrip([&](IMKSubBitmap* strip) {
        if (strip->GetBitmapRect().IsIntersect(r)) strip->UpdateBitmap(r, pixels, stride);
    });
}

Matrix4<float> MKTextureBitmap::GetProjectionMatrix() {
    IMKSubBitmap* const strip = GetSubBitmap(0);
    return strip ? strip->GetProjectionMatrix() : Matrix4<float>();
}

void MKTextureBitmap::ActivateFrameBuffer() {
    ForFirstStrip([](IMKSubBitmap* strip) { strip->ActivateFrameBuffer(); });
}

void MKTextureBitmap::DeactivateFrameBuffer(DiscardFramebufferType discard) {
    ForFirstStrip([&](IMKSubBitmap* strip) { strip->DeactivateFrameBuffer(discard); });
}

void MKTextureBitmap::ActivateFrameBufferRT(bool release) {
    ForFirstStrip([](IMKSubBitmap* strip) { strip->ActivateFrameBufferRT(false); });
    if (release) Unref();
}

void MKTextureBitmap::DeactivateFrameBufferRT(bool release, DiscardFramebufferType discard) {
    ForFirstStrip([&](IMKSubBitmap* strip) { strip->DeactivateFrameBufferRT(false, discard); });
    if (release) Unref();
}

void MKTextureBitmap::ClearColorRT(float r, float g, float b, float a) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->ClearColorRT(r, g, b, a); });
}

void MKTextureBitmap::ClearDepthStencilRT(bool clearDepth, float depth, bool clearStencil, int stencil) {
    ForEachStrip(
        [&](IMKSubBitmap* strip) { strip->ClearDepthStencilRT(clearDepth, depth, clearStencil, stencil); });
}

void MKTextureBitmap::ActivateTextureRT(int unit, bool release) {
    ForFirstStrip([&](IMKSubBitmap* strip) { strip->ActivateTextureRT(unit, false); });
    if (release) Unref();
}

void MKTextureBitmap::SetTextureFilter(TextureParamFilteringValue value) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->SetTextureFilter(value); });
}

void MKTextureBitmap::SetTextureFilter(TextureParamFiltering kind, TextureParamFilteringValue value) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->SetTextureFilter(kind, value); });
}

void MKTextureBitmap::SetTextureWrap(TextureParamWrappingValue value) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->SetTextureWrap(value); });
}

void MKTextureBitmap::SetTextureWrap(TextureParamWrapping kind, TextureParamWrappingValue value) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->SetTextureWrap(kind, value); });
}

void MKTextureBitmap::SetTextureFilterRT(TextureParamFilteringValue value, bool) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->SetTextureFilterRT(value, false); });
}

void MKTextureBitmap::SetTextureFilterRT(TextureParamFiltering kind, TextureParamFilteringValue value, bool) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->SetTextureFilterRT(kind, value, false); });
}

void MKTextureBitmap::SetTextureWrapRT(TextureParamWrappingValue value, bool) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->SetTextureWrapRT(value, false); });
}

void MKTextureBitmap::SetTextureWrapRT(TextureParamWrapping kind, TextureParamWrappingValue value, bool) {
    ForEachStrip([&](IMKSubBitmap* strip) { strip->SetTextureWrapRT(kind, value, false); });
}

void MKTextureBitmap::AttachToCanvas() {
    Ref();
    ForEachStrip([](IMKSubBitmap* strip) { strip->CreateFrameBuffer(); });
}

void MKTextureBitmap::DetachFromCanvas() {
    ForEachStrip([](IMKSubBitmap* strip) { strip->ReleaseFrameBuffer(); });
    Unref();
}

void MKTextureBitmap::AttachToCanvasRT(bool release) {
    Ref();
    ForEachStrip([](IMKSubBitmap* strip) { strip->CreateFrameBufferRT(false); });
    if (release) Unref();
}

void MKTextureBitmap::DetachFromCanvasRT(bool release) {
    ForEachStrip([](IMKSubBitmap* strip) { strip->ReleaseFrameBufferRT(false); });
    Unref();
    if (release) Unref();
}

bool MKTextureBitmap::HasFrameBufferRT(int strip) {
    // The cast is safe: this class created all strips.
    auto* const wanted = static_cast<MKSubBitmapBase*>(GetSubBitmap(strip < 0 ? 0 : strip));
    return wanted && wanted->HasFrameBufferRT();
}

} // namespace Moka
