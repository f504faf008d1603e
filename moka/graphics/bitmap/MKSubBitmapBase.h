// MKSubBitmapBase: the render side of a strip, shared by its two flavours: texture, frame buffer,
// depth-stencil buffer, upload and read-back. MKSubBitmap reaches it through tasks, MKSubBitmapRT calls it at
// once.
// Owner:   the strip owns its GPU objects; how they die is the flavour's business.
// Thread:  the getters anywhere; everything ending in RT, and the protected bodies, on the render thread.
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

    // From the strip's own rectangle; the depth range is -32767 ... 32767. Row `top` maps to -1, which keeps
    // texture row 0 at the first row of the frame buffer.
    Matrix4<float> GetProjectionMatrix() override { return mProjection; }

    // False also when the renderer refused it.
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

    // The first texture wins; later calls, and a null model, do nothing.
    void CreateTexture(int x, int y, int rowLength, void const* pixels, bool textureFlag);
    void CreateTexture(ITextureObject* model);

    void Upload(void const* pixels, int stride);
    void Upload(Rect const& r, void const* pixels, int stride);

    // 0 for what is not on the strip.
    unsigned int ReadPixel(Point const& p);
    // Fills this strip's part of a destination laid out for the whole of r.
    void ReadBlock(Rect const& r, void* destination);

    // Draws this texture into another strip of the same size; nothing without a frame buffer there, since
    // what is current would then be somebody else's.
    void CopyTextureTo(MKSubBitmapBase* target);

    IGLMsgQueue* const mMsgQueue; // not owned
    int const mIndex;
    Rect const mRect;
    Matrix4<float> const mProjection; // asked for by every draw
    // Owned, and changed on the render thread alone. Atomic, and so no smart pointers, because caller threads
    // read them, and may see them a moment late.
    std::atomic<ITextureObject*> mTexture{nullptr};
    std::atomic<MKFrameBuffer*> mFrameBuffer{nullptr};

    // Present from the first request to the last detach, and never without a frame buffer: the frame buffer's
    // last release deletes it but leaves the count, so that requests still open stay counted. While they are,
    // a new frame buffer gets none. // Compat: depth-stencil-count
    std::unique_ptr<MKDepthStencilBuffer> mDepthStencil;
    int mDepthStencilCount = 0; // requests still open

private:
    void AttachDepthStencil();
    void DetachDepthStencil();
    void DropLastFrameBuffer();
    void SetParameter(int id, int value);
    IRenderTarget* GetRenderTarget();
};

} // namespace Moka
