#include "moka/graphics/bitmap/MKSubBitmapRT.h"

#include "moka/graphics/bitmap/MKDepthStencilBuffer.h"
#include "moka/graphics/bitmap/MKFrameBuffer.h"
#include "moka/renderer/ITextureObject.h"

#include <new>

namespace Moka {

MKSubBitmapRT::MKSubBitmapRT(IGLMsgQueue* queue, int index, Rect const& rect, int width, int,
                             void const* pixels, bool textureFlag)
    : MKSubBitmapBase(queue, index, rect) {
    CreateTexture(rect.left, rect.top, width, pixels, textureFlag);
}

MKSubBitmapRT::MKSubBitmapRT(IGLMsgQueue* queue, int index, Rect const& rect, ITextureObject* model)
    : MKSubBitmapBase(queue, index, rect) {
    CreateTexture(model);
}

MKSubBitmapRT::~MKSubBitmapRT() {
    if (MKFrameBuffer* const frameBuffer = mFrameBuffer) {
        if (mDepthStencil) {
            frameBuffer->DetachDepthStencilBufferRT();
            mDepthStencil.reset();
        }
        delete frameBuffer;
    }
    delete mTexture.load();
}

void MKSubBitmapRT::GetPixelAsync(Point const& p, void* userData, PixelCallback callback) {
    unsigned int const pixel = ReadPixel(p);
    if (callback) callback(pixel, userData);
}

void MKSubBitmapRT::GetBitmapDataAsync(Rect const& r, void* destination, void* userData,
                                       DataCallback callback) {
    ReadBlock(r, destination);
    if (callback) callback(r, destination, userData);
}

void MKSubBitmapRT::SetTag(char const* tag) {
    ITextureObject* const texture = mTexture;
    if (tag && texture) texture->SetLabel(tag);
}

IMKSubBitmap* MKSubBitmapRT::Clone() {
    auto* const clone =
        new (std::nothrow) MKSubBitmapRT(mMsgQueue, mIndex, mRect, GetWidth(), GetHeight(), nullptr, false);
    if (!clone) return nullptr;
    clone->CreateFrameBuffer();
    CopyTextureTo(clone);
    if (ITextureObject* const texture = mTexture) clone->SetTag(texture->GetLabel());
    // As in MKSubBitmap::Clone, the clone keeps its frame buffer only if this strip has none.
    if (mFrameBuffer) clone->ReleaseFrameBuffer();
    return clone;
}

} // namespace Moka
