#include "moka/graphics/bitmap/MKSubBitmap.h"

#include "moka/base/Trace.h"
#include "moka/graphics/bitmap/BlockingRead.h"
#include "moka/graphics/bitmap/MKDepthStencilBuffer.h"
#include "moka/graphics/bitmap/MKFrameBuffer.h"
#include "moka/graphics/task/WorkerTask.h"
#include "moka/renderer/ITextureObject.h"

namespace Moka {

template <class F, class... Values>
bool MKSubBitmap::PostSelf(F function, Values&&... values) {
    Ref();
    return WorkerTask::PostMember(mMsgQueue, this, function, std::forward<Values>(values)...);
}

MKSubBitmap::MKSubBitmap(IGLMsgQueue* queue, int index, Rect const& rect, int width, int, void const* pixels,
                         bool textureFlag)
    : MKSubBitmapBase(queue, index, rect) {
    PostSelf(&MKSubBitmap::createTextureRT, rect.left, rect.top, width, pixels, textureFlag);
}

MKSubBitmap::MKSubBitmap(IGLMsgQueue* queue, int index, Rect const& rect, IMKSubBitmap* model)
    : MKSubBitmapBase(queue, index, rect) {
    if (model) model->Ref();
    PostSelf(&MKSubBitmap::createSharedTextureRT, model);
}

MKSubBitmap::~MKSubBitmap() {
    // The render thread runs these in order: detach the depth-stencil buffer, delete it, then delete the
    // frame buffer.
    if (MKFrameBuffer* const frameBuffer = mFrameBuffer) {
        if (mDepthStencil) {
            WorkerTask::PostMember(mMsgQueue, frameBuffer, &MKFrameBuffer::DetachDepthStencilBufferRT);
            WorkerTask::PostDelete(mMsgQueue, mDepthStencil.release());
        }
        WorkerTask::PostDelete(mMsgQueue, frameBuffer);
    }
    WorkerTask::PostDelete(mMsgQueue, mTexture.load());
}

void MKSubBitmap::createTextureRT(int x, int y, int rowLength, void const* pixels, bool textureFlag) {
    Trace::NameTask("createTextureRT");
    CreateTexture(x, y, rowLength, pixels, textureFlag);
    Unref();
}

void MKSubBitmap::createSharedTextureRT(IMKSubBitmap* model) {
    Trace::NameTask("createSharedTextureRT");
    if (model) {
        CreateTexture(model->GetTexture());
        model->Unref();
    }
    Unref();
}

void MKSubBitmap::CreateFrameBuffer() { PostSelf(&MKSubBitmap::CreateFrameBufferRT, true); }

void MKSubBitmap::ReleaseFrameBuffer() { PostSelf(&MKSubBitmap::ReleaseFrameBufferRT, true); }

void MKSubBitmap::ActivateFrameBuffer() { PostSelf(&MKSubBitmap::ActivateFrameBufferRT, true); }

void MKSubBitmap::DeactivateFrameBuffer(DiscardFramebufferType discard) {
    PostSelf(&MKSubBitmap::DeactivateFrameBufferRT, true, discard);
}

void MKSubBitmap::AttachDepthBuffer() { PostSelf(&MKSubBitmap::attachDepthBufferRT); }

void MKSubBitmap::attachDepthBufferRT() { AttachStencilBufferRT(true); }

void MKSubBitmap::DetachDepthBuffer() { PostSelf(&MKSubBitmap::detachDepthBufferRT); }

void MKSubBitmap::detachDepthBufferRT() { DetachStencilBufferRT(true); }

void MKSubBitmap::SetTextureFilter(TextureParamFilteringValue value) {
    using Function = void (MKSubBitmapBase::*)(TextureParamFilteringValue, bool);
    PostSelf(static_cast<Function>(&MKSubBitmap::SetTextureFilterRT), value, true);
}

void MKSubBitmap::SetTextureFilter(TextureParamFiltering kind, TextureParamFilteringValue value) {
    using Function = void (MKSubBitmapBase::*)(TextureParamFiltering, TextureParamFilteringValue, bool);
    PostSelf(static_cast<Function>(&MKSubBitmap::SetTextureFilterRT), kind, value, true);
}

void MKSubBitmap::SetTextureWrap(TextureParamWrappingValue value) {
    using Function = void (MKSubBitmapBase::*)(TextureParamWrappingValue, bool);
    PostSelf(static_cast<Function>(&MKSubBitmap::SetTextureWrapRT), value, true);
}

void MKSubBitmap::SetTextureWrap(TextureParamWrapping kind, TextureParamWrappingValue value) {
    using Function = void (MKSubBitmapBase::*)(TextureParamWrapping, TextureParamWrappingValue, bool);
    PostSelf(static_cast<Function>(&MKSubBitmap::SetTextureWrapRT), kind, value, true);
}

void MKSubBitmap::UpdateBitmap(void const* pixels, int stride) {
    PostSelf(&MKSubBitmap::updateBitmapRT, pixels, stride);
}

void MKSubBitmap::updateBitmapRT(void const* pixels, int stride) {
    Trace::NameTask("updateBitmapRT");
    Upload(pixels, stride);
    Unref();
}

void MKSubBitmap::UpdateBitmap(Rect const& r, void const* pixels, int stride) {
    PostSelf(&MKSubBitmap::updateBitmapRectRT, r, pixels, stride);
}

void MKSubBitmap::updateBitmapRectRT(Rect const& r, void const* pixels, int stride) {
    Trace::NameTask("updateBitmapRectRT");
    Upload(r, pixels, stride);
    Unref();
}

unsigned int MKSubBitmap::GetPixel(Point const& p) {
    auto const read = detail::BlockingRead::Make();
    PostSelf(&MKSubBitmap::getPixelRT, p, read);
    mMsgQueue->WaitForTasks();
    return detail::BlockingRead::GetPixel(read);
}

void MKSubBitmap::getPixelRT(Point const& p, RefPtr<detail::BlockingRead> const& read) {
    Trace::NameTask("getPixelRT");
    unsigned int const pixel = ReadPixel(p);
    if (read) read->Finish(pixel);
    Unref();
}

void MKSubBitmap::GetPixelAsync(Point const& p, void* userData, PixelCallback callback) {
    PostSelf(&MKSubBitmap::getPixelAsyncRT, p, userData, callback);
}

void MKSubBitmap::getPixelAsyncRT(Point const& p, void* userData, PixelCallback callback) {
    Trace::NameTask("getPixelAsyncRT");
    auto const self = RefPtr<MKSubBitmap>::Adopt(this);
    unsigned int const pixel = ReadPixel(p);
    if (callback) callback(pixel, userData);
}

void MKSubBitmap::GetBitmapData(Rect const& r, void* destination) {
    auto const read = detail::BlockingRead::Make();
    bool const accepted = PostSelf(&MKSubBitmap::getBitmapDataRT, r, destination, read);
    mMsgQueue->WaitForTasks();
    detail::BlockingRead::CheckFinished(read, accepted);
}

void MKSubBitmap::getBitmapDataRT(Rect const& r, void* destination,
                                  RefPtr<detail::BlockingRead> const& read) {
    Trace::NameTask("getBitmapDataRT");
    ReadBlock(r, destination);
    if (read) read->Finish(0);
    Unref();
}

void MKSubBitmap::GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                                     DataCallback callback) {
    PostSelf(&MKSubBitmap::getBitmapDataAsyncRT, r, destination, userData, callback);
}

void MKSubBitmap::getBitmapDataAsyncRT(Rect const& r, void* destination, void* userData,
                                       DataCallback callback) {
    Trace::NameTask("getBitmapDataAsyncRT");
    auto const self = RefPtr<MKSubBitmap>::Adopt(this);
    ReadBlock(r, destination);
    if (callback) callback(r, destination, userData);
}

void MKSubBitmap::SetTag(char const* tag) {
    if (!tag) return;
    {
        std::lock_guard<std::mutex> lock(mTagLock);
        mTag.Set(tag);
    }
    PostSelf(&MKSubBitmap::setTagRT, mTag.Get());
}

void MKSubBitmap::setTagRT(char const* tag) {
    if (ITextureObject* const texture = mTexture) {
        std::lock_guard<std::mutex> lock(mTagLock);
        texture->SetLabel(tag);
    }
    Unref();
}

Tag MKSubBitmap::CopyTag() {
    std::lock_guard<std::mutex> lock(mTagLock);
    return mTag;
}

IMKSubBitmap* MKSubBitmap::Clone() {
    auto* const clone =
        new (std::nothrow) MKSubBitmap(mMsgQueue, mIndex, mRect, GetWidth(), GetHeight(), nullptr, false);
    if (!clone) return nullptr;
    clone->CreateFrameBuffer();
    PostSelf(&MKSubBitmap::copyTextureRT, clone);
    clone->SetTag(CopyTag().Get());
    // Compat: strip-clone
    if (mFrameBuffer) clone->ReleaseFrameBuffer();
    return clone;
}

void MKSubBitmap::copyTextureRT(MKSubBitmapBase* target) {
    Trace::NameTask("copyTextureRT");
    CopyTextureTo(target);
    Unref();
}

} // namespace Moka
