// MKSubBitmap: a strip for any thread: each operation is posted to the render thread.
// Owner:  each posted operation holds one reference. If the queue refuses the operation, the reference is not
//         dropped, and the strip is never deleted. // Compat: refused-post
// Thread: any. The blocking reads wait for the render thread and must not be called on it.
// Cost:   each call posts one task. It copies only its arguments, so pixels and destinations must stay valid
//         until the task has run.
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
    // Creates the texture from the strip's rows of pixels, an image `width` pixels wide. pixels must stay
    // valid until the task has run. If it is null, the texture is transparent.
    MKSubBitmap(IGLMsgQueue* queue, int index, Rect const& rect, int width, int height, void const* pixels,
                bool textureFlag);

    // Creates a texture that shares the storage of the model's texture. The task looks that texture up when
    // it runs, because a new model has none yet. A reference keeps the model alive until then.
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
    // Tasks call these. Each drops the task's reference at its end, also if a callback throws.
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

    // Takes the task's reference and posts. Returns false if the task will never run.
    template <class F, class... Values>
    bool PostSelf(F function, Values&&... values);

    std::mutex mTagLock; // the caller writes the tag, the render thread reads it
    Tag mTag;
};

} // namespace Moka
