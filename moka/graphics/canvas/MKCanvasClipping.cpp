#include "moka/graphics/canvas/MKCanvasClipping.h"

#include "moka/base/log/AndroidLog.h"
#include "moka/graphics/bitmap/IMKBitmap.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/renderer/RendererFactory.h"

#include <algorithm>
#include <new>

namespace Moka {
namespace {

std::size_t CountStrips(IMKBitmap* bitmap) {
    IMKTextureBitmap* const tiled = bitmap->GetTextureBitmap();
    return tiled ? static_cast<std::size_t>(std::max(tiled->GetSubBitmapCount(), 0)) : 0;
}

void LogStencilClip(IMKBitmap* bitmap) {
    __android_log_print(ANDROID_LOG_WARN, "mok_log",
                        "!CLIPPING PERFORMANCE WARNING! MKCanvasClipping::EnableClip Stencil Clip. This "
                        "clipping mode can cause significant performance penalties");
    // Compat: clip-log
    __android_log_print(ANDROID_LOG_WARN, "mok_log", "Stencil clipping was activateted for bitmap: %s",
                        bitmap->GetTag());
}

} // namespace

MKCanvasClipping::MKCanvasClipping(IMKBitmap* bitmap)
    : mBitmap(bitmap),
      mStencilAttached(CountStrips(bitmap), false),
      mPlainState(RendererFactory::CreateDepthStencilState(DepthStencilStateDescriptor(false, false))) {}

MKCanvasClipping::~MKCanvasClipping() {
    mStencil.Release();
    mPlainState.reset();
    for (std::size_t i = 0; i < mStencilAttached.size(); ++i) DetachStencil(static_cast<int>(i));
}

void MKCanvasClipping::AddClipRectRT(ClipInfo const& info) {
    try {
        mClips.push_back(info);
    } catch (std::bad_alloc const&) {
        return; // the clip is dropped, as if the queue had refused the request
    }
    mDirty = true;
}

void MKCanvasClipping::RemoveClipRectRT(int count) {
    // The count exceeds the number of clips only if a queue refused requests. One empty entry already hides
    // everything. So the bound changes no picture; it prevents a wild number from taking all memory. A
    // negative count is 0.
    constexpr std::size_t kMostByCount = 1 << 16;
    std::size_t const wanted = static_cast<std::size_t>(std::max(count, 0));
    ClipInfo empty;
    empty.matrix = Matrix3<float>(0.0f); // maps everything to one point
    try {
        mClips.resize(std::min(wanted, std::max(mClips.size(), kMostByCount)), empty);
    } catch (std::bad_alloc const&) {
        return; // only growing allocates; nothing has changed
    }
    mDirty = true;
}

void MKCanvasClipping::EnableClipRT(int frameBuffer) {
    mActiveFrameBuffer = frameBuffer;
    if (mClips.empty()) {
        mMode = Mode::None;
        ApplyPlainState();
        RendererFactory::GetRasterizerState()->SetScissorEnabled(false);
        return;
    }
    if (IMKBitmapWritable* const writable = FindWritable(frameBuffer)) writable->ActivateFrameBufferRT(false);
    if (detail::IsScissorEnough(mClips))
        EnableScissor();
    else
        EnableStencil();
}

void MKCanvasClipping::EnableScissor() {
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    mSavedScissorEnabled = rasterizer->IsScissorEnabled();
    mSavedScissor = rasterizer->GetScissorRect();
    if (mDirty) {
        DetachStencil(mActiveFrameBuffer);
        mScissor = detail::GetScissorRect(mClips, mBitmap->GetY(), mBitmap->GetHeight());
        mDirty = false;
    }
    rasterizer->SetScissorEnabled(true);
    ApplyPlainState();
    rasterizer->SetScissorRect(InFrameBuffer(mScissor, mActiveFrameBuffer));
    mMode = Mode::Scissor;
}

void MKCanvasClipping::EnableStencil() {
    RendererFactory::GetRasterizerState()->SetScissorEnabled(false);
    LogStencilClip(mBitmap);
    if (mDirty) {
        AttachStencil(mActiveFrameBuffer);
        if (IMKBitmapWritable* const writable = FindWritable(mActiveFrameBuffer))
            mStencil.Draw(mClips, *writable);
        mDirty = false;
    }
    mMode = Mode::Stencil;
    // Keeps the stencil test on, although every drawable applies a state without one before it draws.
    RendererFactory::SetStencilClip(true);
}

void MKCanvasClipping::DisableClipRT() {
    if (mMode == Mode::Scissor)
        DisableScissor();
    else if (mMode == Mode::Stencil)
        DisableStencil();
    mMode = Mode::None;
    mActiveFrameBuffer = -1;
    mDirty = true;
}

void MKCanvasClipping::DisableScissor() {
    IRasterizerState* const rasterizer = RendererFactory::GetRasterizerState();
    rasterizer->SetScissorEnabled(mSavedScissorEnabled);
    if (mSavedScissorEnabled) rasterizer->SetScissorRect(mSavedScissor);
}

void MKCanvasClipping::DisableStencil() {
    RendererFactory::SetStencilClip(false);
    DetachStencil(mActiveFrameBuffer);
    ApplyPlainState();
}

IMKSubBitmap* MKCanvasClipping::FindStrip(int frameBuffer) const {
    IMKTextureBitmap* const tiled = mBitmap->GetTextureBitmap();
    return tiled && frameBuffer >= 0 ? tiled->GetSubBitmap(frameBuffer) : nullptr;
}

IMKBitmapWritable* MKCanvasClipping::FindWritable(int frameBuffer) const {
    if (frameBuffer >= 0 && mBitmap->GetTextureBitmap()) return FindStrip(frameBuffer);
    return mBitmap->GetBitmapWritable();
}

ScissorRect MKCanvasClipping::InFrameBuffer(ScissorRect const& rect, int frameBuffer) const {
    // The first row of a strip is the bottom row of its frame buffer.
    if (!mBitmap->GetTextureBitmap()) return rect;
    IMKSubBitmap* const strip = FindStrip(frameBuffer);
    Rect const frame = strip ? strip->GetBitmapRect() : mBitmap->GetBitmapRect();
    return detail::ToStrip(rect, mBitmap->GetHeight(), frame.left, frame.top);
}

void MKCanvasClipping::ApplyPlainState() {
    if (mPlainState) mPlainState->Apply();
}

bool MKCanvasClipping::CarriesStencil(int frameBuffer) const {
    std::size_t const index = static_cast<std::size_t>(frameBuffer);
    return frameBuffer >= 0 && index < mStencilAttached.size() && mStencilAttached[index];
}

void MKCanvasClipping::AttachStencil(int frameBuffer) {
    IMKSubBitmap* const strip = FindStrip(frameBuffer);
    std::size_t const index = static_cast<std::size_t>(frameBuffer);
    if (!strip || index >= mStencilAttached.size() || mStencilAttached[index]) return;
    strip->AttachStencilBufferRT(false);
    mStencilAttached[index] = true;
}

void MKCanvasClipping::DetachStencil(int frameBuffer) {
    if (!CarriesStencil(frameBuffer)) return;
    if (IMKSubBitmap* const strip = FindStrip(frameBuffer)) strip->DetachStencilBufferRT(false);
    mStencilAttached[static_cast<std::size_t>(frameBuffer)] = false;
}

} // namespace Moka
