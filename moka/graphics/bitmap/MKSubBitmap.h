// MKSubBitmap: a strip for use from any thread: each operation is posted to the render thread.
// Owner:  each posted operation holds one reference. Refused, the operation is dropped and its reference
//         stays: the strip is then never deleted. // Compat: refused-post
// Thread: any, except that the blocking reads wait for the render thread and so must not be called on it.
// Cost:   one task a call; nothing is copied but the arguments, so pixels and destinations stay valid until
//         run.
#pragma once

#include "moka/base/RefPtr.h"
#include "moka/base/Tag.h"
#include "moka/graphics/bitmap/MKSubBitmapBase.h"

#include <mutex>
#include <utility>

namespace Moka {

namespace detail {
class BlockingRead;
}

class MOKA_API MKSubBitmap : public MKSubBitmapBase {
public:
    // A texture over the strip's rows of pixels, an image `width` pixels wide that stays valid until the task
    // has run; null for a transparent one.
    MKSubBitmap(IGLMsgQueue* queue, int index, Rect const& rect, int width, int height, void const* pixels,
                bool textureFlag);

    // A texture over the storage of model's. The model's texture is looked up when the task runs, because a
    // model made a moment ago has none yet; a reference keeps the model until then.
    MKSubBitmap(IGLMsgQueue* queue, int index, Rect const& rect, IMKSubBitmap* model);

    ~MKSubBitmap() override;

    void CreateFrameBuffer() override;
    void ReleaseFrameBuffer() override;
    void ActivateFrameBuffer() override;
    void DeactivateFrameBuffer(DiscardFramebufferType discard) override;
    void AttachDepthBuffer() override;
    void DetachDepthBuffer() override;
    void SetTextureFilter(TextureParamFilteringValue value) override;
    void SetTextureFilter(TextureParamFiltering kind, TextureParamFilteringValue value) override;
    void SetTextureWrap(TextureParamWrappingValue value) override;
    void SetTextureWrap(TextureParamWrapping kind, TextureParamWrappingValue value) override;
    void UpdateBitmap(void const* pixels, int stride) override;
    void UpdateBitmap(Rect const& r, void const* pixels, int stride) override;
    unsigned int GetPixel(Point const& p) override;
    void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) override;
    void GetBitmapData(Rect const& r, void* destination) override;
    void GetBitmapDataAsync(Rect const& r, void* destination, void* userData, DataCallback callback) override;
    void SetTag(char const* tag) override;
    IMKSubBitmap* Clone() override;

private:
    // Run by tasks; each drops the task's reference at its end, also when a callback throws.
    void createTextureRT(int x, int y, int rowLength, void const* pixels, bool textureFlag);
    void createSharedTextureRT(IMKSubBitmap* model);
    void attachDepthBufferRT();
    void detachDepthBufferRT();
    void updateBitmapRT(void const* pixels, int stride);
    void updateBitmapRectRT(Rect const& r, void const* pixels, int stride);
    void getPixelRT(Point const& p, RefPtr<detail::BlockingRead> const& read);
    void getPixelAsyncRT(Point const& p, void* userData, PixelCallback callback);
    void getBitmapDataRT(Rect const& r, void* destination, RefPtr<detail::BlockingRead> const& read);
    void getBitmapDataAsyncRT(Rect const& r, void* destination, void* userData, DataCallback callback);
    void setTagRT(char const* tag);
    void copyTextureRT(MKSubBitmapBase* target);

    Tag CopyTag();

    // Takes the task's reference and posts. False when the task never runs.
    template <class F, class... Values>
    bool PostSelf(F function, Values&&... values);

    std::mutex mTagLock; // the caller writes the tag, the render thread reads it
    Tag mTag;
};

} // namespace Moka
