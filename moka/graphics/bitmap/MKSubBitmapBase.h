// MKSubBitmapBase: the render side of a strip, shared by its two flavours: texture, frame buffer,
// depth-stencil buffer, upload and read-back. MKSubBitmap calls it in tasks, MKSubBitmapRT directly.
// Owner:   the strip owns its GPU objects. Each flavour deletes them in its own destructor.
// Thread:  the getters on any thread. Functions ending in RT and the protected ones on the render thread.
#pragma once

#include "moka/base/Export.h"
#include "moka/base/RefCount.h"
#include "moka/graphics/bitmap/IMKSubBitmap.h"

#include <atomic>
#include <memory>

namespace Moka {

class MKDepthStencilBuffer;
class MKFrameBuffer;
class IRenderTarget;

class MOKA_API MKSubBitmapBase : public IMKSubBitmap, public RefCount {
public:
    ~MKSubBitmapBase() override;

    int GetBitmapIndex() override { return mIndex; }
    int GetX() override { return mRect.left; }
    int GetY() override { return mRect.top; }
    int GetWidth() override { return mRect.GetWidth(); }
    int GetHeight() override { return mRect.GetHeight(); }
    Rect GetBitmapRect() override { return mRect; }
    ITextureObject* GetTexture() override { return mTexture; }
    IGLMsgQueue* GetMsgQueue() override { return mMsgQueue; }
    int Ref() override { return RefCount::Ref(); }
    int Unref() override { return RefCount::Unref(); }

    // Maps the strip's rectangle to clip space; the depth range is -32767 ... 32767. Row `top` maps to -1, so
    // texture row 0 is the first row of the frame buffer.
    Matrix4<float> GetProjectionMatrix() override { return mProjection; }

    // False if there is none, or if the renderer could not create it.
    bool HasFrameBufferRT() const;
    void CreateFrameBufferRT(bool release) override;
    void ReleaseFrameBufferRT(bool release) override;
    void AttachStencilBufferRT(bool release) override;
    void DetachStencilBufferRT(bool release) override;
    void ActivateFrameBufferRT(bool release) override;
    void DeactivateFrameBufferRT(bool release, DiscardFramebufferType discard) override;
    void ClearColorRT(float r, float g, float b, float a) override;
    void ClearDepthStencilRT(bool clearDepth, float depth, bool clearStencil, int stencil) override;
    void ActivateTextureRT(int unit, bool release) override;
    void SetTextureFilterRT(TextureParamFilteringValue value, bool release) override;
    void SetTextureFilterRT(TextureParamFiltering kind, TextureParamFilteringValue value,
                            bool release) override;
    void SetTextureWrapRT(TextureParamWrappingValue value, bool release) override;
    void SetTextureWrapRT(TextureParamWrapping kind, TextureParamWrappingValue value, bool release) override;

protected:
    MKSubBitmapBase(IGLMsgQueue* queue, int index, Rect const& rect);

    // Create the texture, from pixels or as another view of model. If the strip has a texture, or model is
    // null, they do nothing.
    void CreateTexture(int x, int y, int rowLength, void const* pixels, bool textureFlag);
    void CreateTexture(ITextureObject* model);

    void Upload(void const* pixels, int stride);
    void Upload(Rect const& r, void const* pixels, int stride);

    // Returns 0 for a pixel outside the strip.
    unsigned int ReadPixel(Point const& p);
    // Fills this strip's part of a destination laid out for the whole of r.
    void ReadBlock(Rect const& r, void* destination);

    // Draws this texture into another strip of the same size. Does nothing if that strip has no frame buffer,
    // because the draw would go to the current one.
    void CopyTextureTo(MKSubBitmapBase* target);

    IGLMsgQueue* const mMsgQueue; // not owned
    int const mIndex;
    Rect const mRect;
    Matrix4<float> const mProjection; // stored, because every draw needs it
    // Owned, and written by the render thread only. Atomic pointers instead of smart pointers, because caller
    // threads read them.
    std::atomic<ITextureObject*> mTexture{nullptr};
    std::atomic<MKFrameBuffer*> mFrameBuffer{nullptr};

    // Exists from the first attach to the last detach, and only together with a frame buffer. The last
    // release of the frame buffer deletes it but does not reset the count of attach requests. While that
    // count is not 0, a new frame buffer gets no depth-stencil buffer. // Compat: depth-stencil-count
    std::unique_ptr<MKDepthStencilBuffer> mDepthStencil;
    int mDepthStencilCount = 0; // attach requests minus detach requests

private:
    void AttachDepthStencil();
    void DetachDepthStencil();
    void DropLastFrameBuffer();
    void SetParameter(int id, int value);
    IRenderTarget* GetRenderTarget();
};

} // namespace Moka
