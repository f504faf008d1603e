// MKTextureBitmap: an off-screen GPU image, divided into horizontal strips no taller than the device allows.
// The strips own the GPU objects; the bitmap forwards calls to the first one, or to all of them.
// Owner:   reference counted; the creator holds the first reference. Posted tasks hold references on strips,
//          not on the bitmap.
// Thread:  caller-side bitmaps on any thread (work is posted); render-thread bitmaps on the render thread
//          only. The list of strips does not change after construction.
// Units:   pixels, origin top left, y down; RGBA8, premultiplied.
// Fails:   silently where the interface cannot report it. The factory validates sizes.
// Cost:    construction uploads once per strip; blocking reads wait for the render thread.
// The functions for the frame buffer, the texture and the stencil affect the first strip only. They are for
// callers that know that there is one strip; canvases iterate over the strips.
#pragma once

#include "moka/graphics/bitmap/IMKBitmapCanvasAttachable.h"
#include "moka/graphics/bitmap/IMKBitmapReadable.h"
#include "moka/graphics/bitmap/IMKBitmapWritable.h"
#include "moka/graphics/bitmap/IMKTextureBitmap.h"
#include "moka/graphics/bitmap/MKBitmap.h"

#include <vector>

namespace Moka {

class TextureObject;

class MOKA_API MKTextureBitmap : public MKBitmap,
                                 public IMKTextureBitmap,
                                 public IMKBitmapWritable,
                                 public IMKBitmapReadable,
                                 public IMKBitmapCanvasAttachable {
public:
    // Uploads tightly packed pixels; null makes a transparent image. With deleteBuffer the bitmap deletes the
    // pixels (delete[] of unsigned char) when every strip has uploaded them.
    MKTextureBitmap(IGLMsgQueue* queue, int width, int height, void const* pixels, bool deleteBuffer,
                    bool renderThread, bool textureFlag);

    // Uploads only the region of such an image. Strips outside the region are not created, but still count in
    // GetBitmapIndex().
    MKTextureBitmap(IGLMsgQueue* queue, Rect const& region, int width, int height, void const* pixels,
                    bool deleteBuffer, bool renderThread);

    // Creates an empty bitmap of size zero. texture and renderThread are ignored.
    MKTextureBitmap(IGLMsgQueue* queue, TextureObject const* texture, bool renderThread);

    // Shares the textures of another bitmap's strips.
    MKTextureBitmap(IGLMsgQueue* queue, IMKTextureBitmap* source, int width, int height, bool renderThread);

    ~MKTextureBitmap() override;

    unsigned int GetPixel(Point const& p) override;
    void GetPixelAsync(Point const& p, void* userData, PixelCallback callback) override;
    void GetBitmapData(Rect const& r, void* destination) override;
    void GetBitmapDataAsync(Rect const& r, void* destination, void* userData, DataCallback callback) override;

    void SetTag(char const* tag) override;
    IMKBitmap* Clone() override;

    IMKBitmapReadable* GetBitmapReadable() override { return this; }
    IMKBitmapWritable* GetBitmapWritable() override { return this; }
    IMKBitmapCanvasAttachable* GetBitmapCanvasAttachable() override { return this; }
    IMKTextureBitmap* GetTextureBitmap() override { return this; }

    IMKSubBitmap* GetSubBitmap(int index) override {
        return index >= 0 && index < GetSubBitmapCount() ? mSubBitmaps[static_cast<std::size_t>(index)]
                                                         : nullptr;
    }
    int GetSubBitmapCount() override { return static_cast<int>(mSubBitmaps.size()); }
    IMKBitmapBufferUpdatable* GetBitmapBufferUpdatable() override { return this; }

    void AttachStencilBufferRT(bool release) override;
    void DetachStencilBufferRT(bool release) override;
    void AttachDepthBuffer() override;
    void DetachDepthBuffer() override;
    void UpdateBitmap(void const* pixels, int stride) override;
    void UpdateBitmap(Rect const& r, void const* pixels, int stride) override;

    Matrix4<float> GetProjectionMatrix() override;
    void ActivateFrameBuffer() override;
    void DeactivateFrameBuffer(DiscardFramebufferType discard) override;
    void ActivateFrameBufferRT(bool release) override;
    void DeactivateFrameBufferRT(bool release, DiscardFramebufferType discard) override;
    void ClearColorRT(float r, float g, float b, float a) override;
    void ClearDepthStencilRT(bool clearDepth, float depth, bool clearStencil, int stencil) override;

    void ActivateTextureRT(int unit, bool release) override;
    void SetTextureFilter(TextureParamFilteringValue value) override;
    void SetTextureFilter(TextureParamFiltering kind, TextureParamFilteringValue value) override;
    void SetTextureWrap(TextureParamWrappingValue value) override;
    void SetTextureWrap(TextureParamWrapping kind, TextureParamWrappingValue value) override;
    // These four ignore release and never drop a reference. // Compat: sampling-release
    void SetTextureFilterRT(TextureParamFilteringValue value, bool release) override;
    void SetTextureFilterRT(TextureParamFiltering kind, TextureParamFilteringValue value,
                            bool release) override;
    void SetTextureWrapRT(TextureParamWrappingValue value, bool release) override;
    void SetTextureWrapRT(TextureParamWrapping kind, TextureParamWrappingValue value, bool release) override;

    void AttachToCanvas() override;
    void DetachFromCanvas() override;
    void AttachToCanvasRT(bool release) override;
    void DetachFromCanvasRT(bool release) override;
    bool HasFrameBufferRT(int strip) override;

private:
    void BuildStrips(Rect const& region, void const* pixels, bool renderThread, bool textureFlag);
    void ShareStrip(int index, IMKSubBitmap* model, bool renderThread);
    void FreePixels(void const* pixels, bool renderThread);
    void CallBackRT(Rect const& r, void* destination, void* userData, DataCallback callback);

    // Call action for each strip, or for the first. They skip null entries, for which memory ran out.
    template <class Action>
    void ForEachStrip(Action const& action);
    template <class Action>
    void ForFirstStrip(Action const& action);
    // Takes ownership of the strip's first reference. If memory runs out, the strip is deleted.
    void AddStrip(IMKSubBitmap* strip);
    IMKSubBitmap* FindStrip(Point const& p);

    std::vector<IMKSubBitmap*> mSubBitmaps; // top to bottom; each entry holds its strip's first reference
};

} // namespace Moka
